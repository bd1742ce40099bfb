#include "programs/reelview/window/main_window_win32.h"

#include <commctrl.h>
#include <shellapi.h>

#include <algorithm>
#include <chrono>
#include <utility>

#include "programs/reelview/library/guarded_call_win32.h"
#include "programs/reelview/base/com_win32.h"
#include "programs/reelview/window/commands.h"
#include "programs/reelview/base/texts.h"
#include "programs/reelview/base/window_class_win32.h"

namespace velmora::reelview {
namespace {

constexpr double kPatience = 5.0;  // seconds to wait for an unfinished frame when the window closes

std::vector<std::vector<Values>> PresetsOf(const hosts::EffectLibrary& library) {
    std::vector<std::vector<Values>> presets;
    for (std::uint32_t i = 0; i < library.Effects().size(); ++i) {
        const hosts::EffectInfo& info = library.Effects()[i];
        presets.emplace_back();
        auto read = [&] {
            const auto effect = library.CreateEffect(i);
            for (std::uint32_t preset = 0; preset < info.presets.size(); ++preset) {
                presets.back().push_back(Engine::PresetValues(*effect, info, preset));
            }
        };
        // If reading fails, what was read so far stays.
        static_cast<void>(RunGuarded(read));
    }
    return presets;
}

}  // namespace

MainWindow::MainWindow(const hosts::EffectLibrary& library, const ViewOptions& options)
    : m_library(library),
      m_texts(&library.Object(), SystemLanguage()),
      m_history(library.Effects()),
      m_presets(PresetsOf(library)),
      m_theme(96),
      m_recent(StoredRecentFiles()),
      m_thumbnailRound(std::make_shared<std::atomic<std::uint32_t>>(0)) {
    for (std::uint32_t i = 0; i < library.Effects().size(); ++i) {
        const std::wstring name = WideOf(library.Effects()[i].name);
        const std::wstring wanted(options.effect.begin(), options.effect.end());
        if (lstrcmpiW(name.c_str(), wanted.c_str()) == 0) m_history.ChooseEffect(i);
    }
    RegisterObjectClass<MainWindow>(kMainClass, CS_HREDRAW | CS_VREDRAW);
    CreateWindowExW(WS_EX_ACCEPTFILES | WS_EX_CONTROLPARENT, kMainClass, kProgramName,
                    WS_OVERLAPPEDWINDOW | WS_CLIPCHILDREN, CW_USEDEFAULT, 0, 100, 100, nullptr, nullptr,
                    GetModuleHandleW(nullptr), this);
    m_theme.Set(SystemScheme(), DpiOf(m_window));
    const int size = m_theme.Px(1240), height = m_theme.Px(860);
    RECT work = {};
    SystemParametersInfoW(SPI_GETWORKAREA, 0, &work, 0);
    SetWindowPos(m_window, nullptr, work.left, work.top, std::min<int>(size, work.right - work.left),
                 std::min<int>(height, work.bottom - work.top), SWP_NOZORDER | SWP_NOACTIVATE);
    MakeParts();
    m_worker = std::make_unique<Worker>(
        [this] {
            CoInitializeEx(nullptr, COINIT_MULTITHREADED);
            m_engine = std::make_unique<Engine>(m_library);
        },
        [this] {
            m_engine.reset();
            CoUninitialize();
        });
    if (!options.file.empty()) {
        Open({{std::wstring(options.file.begin(), options.file.end())}, options.isSequence});
    }
}

MainWindow::~MainWindow() {
    m_worker.reset();
    if (m_window != nullptr) DestroyWindow(m_window);
    // Tasks that the worker posted while the window was closing.
    MSG message;
    while (PeekMessageW(&message, nullptr, kMessageRun, kMessageRun, PM_REMOVE)) {
        delete reinterpret_cast<std::function<void()>*>(message.lParam);
    }
}

void MainWindow::MakeParts() {
    const HINSTANCE instance = GetModuleHandleW(nullptr);
    for (const int size : {ICON_BIG, ICON_SMALL}) {
        const int pixels = GetSystemMetrics(size == ICON_BIG ? SM_CXICON : SM_CXSMICON);
        const HANDLE icon =
            LoadImageW(instance, MAKEINTRESOURCEW(VM_ICON_REELVIEW), IMAGE_ICON, pixels, pixels, LR_SHARED);
        SendMessageW(m_window, WM_SETICON, static_cast<WPARAM>(size), reinterpret_cast<LPARAM>(icon));
    }
    m_menu = std::make_unique<MenuBar>(m_window, m_texts, m_theme);
    m_menu->ShowRecent(m_recent.Files());
    m_picture = std::make_unique<PictureWindow>(
        m_window, kControlPicture, m_theme,
        PictureWindow::Labels{m_texts(text::kPicture), m_texts(text::kBefore), m_texts(text::kAfter),
                              m_texts(text::kInvitation)});
    m_bar = std::make_unique<TransportBar>(
        m_window, m_theme,
        TransportBar::Labels{m_texts(text::kPreviousFrame), m_texts(text::kPlay), m_texts(text::kPause),
                             m_texts(text::kNextFrame), m_texts(text::kLoop), m_texts(text::kPosition)});
    m_effectLabel =
        CreateWindowExW(0, WC_STATICW, m_texts(text::kEffect).c_str(), WS_CHILD | WS_VISIBLE | SS_CENTERIMAGE,
                        0, 0, 0, 0, m_window, nullptr, instance, nullptr);
    m_effectBox = CreateWindowExW(
        0, WC_COMBOBOXW, L"",
        WS_CHILD | WS_VISIBLE | WS_TABSTOP | WS_VSCROLL | CBS_DROPDOWNLIST | CBS_HASSTRINGS, 0, 0, 0, 0,
        m_window, reinterpret_cast<HMENU>(INT_PTR{kControlEffect}), instance, nullptr);
    for (const hosts::EffectInfo& effect : m_library.Effects()) {
        SendMessageW(m_effectBox, CB_ADDSTRING, 0, reinterpret_cast<LPARAM>(WideOf(effect.name).c_str()));
    }
    m_panel = std::make_unique<PanelWindow>(m_window, *this, m_theme);
    m_presetList = std::make_unique<PresetList>(m_window, kControlPresets, m_theme, m_texts(text::kPresets));
    m_status = CreateWindowExW(
        0, WC_STATICW, L"", WS_CHILD | WS_VISIBLE | SS_CENTERIMAGE | SS_ENDELLIPSIS | SS_NOPREFIX, 0, 0, 0, 0,
        m_window, reinterpret_cast<HMENU>(INT_PTR{kControlStatus}), instance, nullptr);
    SetTimer(m_window, kTimerWatch, 1000, nullptr);
    Restyle();
    ShowSettings();
}

void MainWindow::Restyle() {
    m_theme.DressFrame(m_window);
    for (const HWND window : {m_effectLabel, m_effectBox, m_status}) m_theme.Dress(window);
    m_menu->Restyle();
    m_bar->Restyle();
    m_panel->Restyle();
    m_presetList->Restyle();
    m_thumbnails = {};
    SetTimer(m_window, kTimerIdle, kIdleMilliseconds, nullptr);
    LayOut();
    RedrawWindow(m_window, nullptr, nullptr, RDW_INVALIDATE | RDW_ERASE | RDW_ALLCHILDREN);
}

void MainWindow::LayOut() {
    if (m_status == nullptr || IsIconic(m_window)) return;
    RECT area = {};
    GetClientRect(m_window, &area);
    const auto px = [&](int length) { return m_theme.Px(length); };
    const int width = area.right, statusTop = area.bottom - px(22);
    const int labelHeight = px(18);
    const int presetsTop = std::max(statusTop - m_presetList->NaturalHeight(), px(120));
    const int rightWidth = std::clamp<int>(m_panel->NaturalSize().cx + GetSystemMetrics(SM_CXVSCROLL),
                                           px(200), std::max<int>(width * 62 / 100, px(200)));
    const int leftWidth = std::max(width - rightWidth - px(6), 0);
    const int upper = presetsTop - labelHeight - px(4);
    const int barTop = std::max(upper - m_bar->NaturalHeight(), 0);
    MoveWindow(m_picture->Window(), 0, 0, leftWidth, barTop, TRUE);
    m_bar->Place({px(4), barTop, leftWidth, upper});
    const int labelWidth = px(70);
    MoveWindow(m_effectLabel, leftWidth + px(10), px(6), labelWidth, px(24), TRUE);
    MoveWindow(m_effectBox, leftWidth + px(10) + labelWidth, px(6), px(220), px(240), TRUE);
    MoveWindow(m_panel->Window(), leftWidth, px(36), width - leftWidth, std::max(upper - px(36), 0), TRUE);
    MoveWindow(m_presetList->Label(), px(8), upper + px(2), px(300), labelHeight, TRUE);
    MoveWindow(m_presetList->Window(), px(4), presetsTop, width - px(8), std::max(statusTop - presetsTop, 0),
               TRUE);
    MoveWindow(m_status, px(8), statusTop, width - px(16), px(22), TRUE);
}

LRESULT MainWindow::OnNotify(const NMHDR& notification, LPARAM lParam) {
    if (const auto preset = m_presetList->ChosenBy(notification)) ApplyPreset(*preset);
    if (notification.code == NM_CUSTOMDRAW)
        return m_theme.DrawPart(*reinterpret_cast<const NMCUSTOMDRAW*>(lParam)).value_or(0);
    if (notification.code == TTN_GETDISPINFOW) {
        auto& tip = *reinterpret_cast<NMTTDISPINFOW*>(lParam);
        GetWindowTextW(reinterpret_cast<HWND>(notification.idFrom), tip.szText, 80);
    }
    return 0;
}

bool MainWindow::OnKey(WPARAM key) {
    struct Row {
        WPARAM key;
        int command;
    };
    static constexpr Row kKeys[] = {
        {VK_SPACE, kCommandPlay},      {VK_RIGHT, kCommandNextFrame}, {VK_LEFT, kCommandPreviousFrame},
        {VK_HOME, kCommandFirstFrame}, {VK_END, kCommandLastFrame},
    };
    for (const Row& row : kKeys) {
        if (row.key != key) continue;
        OnCommand(row.command, 0);
        return true;
    }
    return false;
}

void MainWindow::OnDrop(HDROP drop) {
    ClipRequest request;
    const UINT count = DragQueryFileW(drop, 0xFFFFFFFFu, nullptr, 0);
    for (UINT i = 0; i < count; ++i) {
        std::wstring file(DragQueryFileW(drop, i, nullptr, 0), L'\0');
        DragQueryFileW(drop, i, file.data(), static_cast<UINT>(file.size()) + 1);
        request.files.push_back(std::move(file));
    }
    DragFinish(drop);
    std::ranges::sort(request.files);
    if (!request.files.empty()) Open(std::move(request));
}

// Menu shortcuts. Those for typing and the clipboard go to an edit field that has the focus.
bool MainWindow::Translate(MSG& message) {
    static const HACCEL keys =
        LoadAcceleratorsW(GetModuleHandleW(nullptr), MAKEINTRESOURCEW(VM_KEYS_REELVIEW));
    if (message.message == WM_KEYDOWN || message.message == WM_SYSKEYDOWN) {
        wchar_t name[16] = {};
        GetClassNameW(message.hwnd, name, 16);
        const bool isField = lstrcmpiW(name, L"Edit") == 0;
        const bool isTextKey = message.wParam == 'C' || message.wParam == 'X' || message.wParam == 'V' ||
                               message.wParam == 'Z' || message.wParam == 'Y' || message.wParam == VK_HOME ||
                               message.wParam == VK_END;
        if (isField && isTextKey) return false;
    }
    if (m_progress) return false;
    return TranslateAcceleratorW(m_window, keys, &message) != 0;
}

void MainWindow::Run(int show) {
    if (const auto place = StoredPlace()) {
        SetWindowPlacement(m_window, &*place);
    } else {
        ShowWindow(m_window, show);
    }
    UpdateWindow(m_window);
    SetFocus(m_picture->Window());
    MSG message;
    while (GetMessageW(&message, nullptr, 0, 0) > 0) {
        if (Translate(message)) continue;
        const HWND dialog = m_progress ? m_progress->m_window : m_window;
        if (dialog != nullptr && IsDialogMessageW(dialog, &message)) {
            if (message.message == WM_KEYDOWN && m_panel) m_panel->ShowFocus();
            continue;
        }
        TranslateMessage(&message);
        DispatchMessageW(&message);
    }
}

void MainWindow::OnTimer(WPARAM id) {
    if (id == kTimerPlay) {
        if (!m_isRendering && m_transport.Advance(Now())) RequestPreview();
        if (!m_transport.IsPlaying()) {
            KillTimer(m_window, kTimerPlay);
            RequestPreview();
        }
    } else if (id == kTimerIdle) {
        KillTimer(m_window, kTimerIdle);
        RequestThumbnails();
    } else if (id == kTimerWatch) {
        ShowStatus();
    }
}

void MainWindow::Close() {
    StorePlace(m_window);
    m_isCancelled = true;
    ++*m_thumbnailRound;
    // A library that never returns must not keep the program running; the user has nothing to lose at this point.
    if (!m_worker->Stop(kPatience)) TerminateProcess(GetCurrentProcess(), 2);
    m_progress.reset();
    DestroyWindow(m_window);
}

void MainWindow::OnDpiChanged(int dpi, const RECT& place) {
    m_theme.Set(m_theme.CurrentScheme(), dpi);
    SetWindowPos(m_window, nullptr, place.left, place.top, place.right - place.left, place.bottom - place.top,
                 SWP_NOZORDER | SWP_NOACTIVATE);
    Restyle();
}

void MainWindow::OnLookChanged(UINT message) {
    // Restyled controls send this too.
    const bool isOwn = message == WM_THEMECHANGED && SystemScheme() == m_theme.CurrentScheme();
    if (m_status == nullptr || isOwn) return;
    m_theme.Set(SystemScheme(), m_theme.Dpi());
    Restyle();
}

// Messages about the window's look.
std::optional<LRESULT> MainWindow::OnLookMessage(UINT message, WPARAM wParam, LPARAM lParam) {
    switch (message) {
        case WM_DPICHANGED:
            OnDpiChanged(HIWORD(wParam), *reinterpret_cast<const RECT*>(lParam));
            return 0;
        case WM_SETTINGCHANGE:
        case WM_SYSCOLORCHANGE:
        case WM_THEMECHANGED:
            OnLookChanged(message);
            return 0;
        case WM_NCPAINT:
        case WM_NCACTIVATE: {
            const LRESULT result = DefWindowProcW(m_window, message, wParam, lParam);
            m_theme.PaintMenuRest(m_window);
            return result;
        }
        case WM_MEASUREITEM:
            if (m_menu && m_menu->Measure(*reinterpret_cast<MEASUREITEMSTRUCT*>(lParam))) return TRUE;
            return std::nullopt;
        case WM_DRAWITEM: {
            const auto& item = *reinterpret_cast<const DRAWITEMSTRUCT*>(lParam);
            if ((m_menu && m_menu->Draw(item)) || (m_bar && m_bar->Draw(item))) return TRUE;
            return std::nullopt;
        }
        case WM_CTLCOLORSTATIC:
        case WM_CTLCOLORBTN:
            return reinterpret_cast<LRESULT>(m_theme.ControlColours(reinterpret_cast<HDC>(wParam), false));
        case WM_CTLCOLOREDIT:
        case WM_CTLCOLORLISTBOX:
            return reinterpret_cast<LRESULT>(m_theme.ControlColours(reinterpret_cast<HDC>(wParam), true));
        case WM_ERASEBKGND: {
            RECT area = {};
            GetClientRect(m_window, &area);
            FillRect(reinterpret_cast<HDC>(wParam), &area, m_theme.WindowBrush());
            return 1;
        }
        default:
            return std::nullopt;
    }
}

// Messages about the user's actions.
std::optional<LRESULT> MainWindow::OnInputMessage(UINT message, WPARAM wParam, LPARAM lParam) {
    switch (message) {
        case WM_COMMAND:
            OnCommand(LOWORD(wParam), HIWORD(wParam));
            return 0;
        case WM_NOTIFY:
            return OnNotify(*reinterpret_cast<const NMHDR*>(lParam), lParam);
        case WM_HSCROLL:
            if (reinterpret_cast<HWND>(lParam) == m_bar->Scrub()) {
                m_transport.GoTo(m_bar->ScrubbedFrame(m_transport), Now());
                RequestPreview();
            }
            return 0;
        case WM_KEYDOWN:
            if (OnKey(wParam)) return 0;
            return std::nullopt;
        case WM_DROPFILES:
            OnDrop(reinterpret_cast<HDROP>(wParam));
            return 0;
        case WM_INITMENUPOPUP:
            ShowMarks();
            return 0;
        case WM_MENUCHAR:
            if (!m_theme.IsDark()) return std::nullopt;
            return m_menu->OnLetter(static_cast<wchar_t>(LOWORD(wParam)), reinterpret_cast<HMENU>(lParam));
        default:
            return std::nullopt;
    }
}

LRESULT MainWindow::OnMessage(UINT message, WPARAM wParam, LPARAM lParam) {
    if (const auto result = OnLookMessage(message, wParam, lParam)) return *result;
    if (const auto result = OnInputMessage(message, wParam, lParam)) return *result;
    switch (message) {
        case WM_SIZE:
            LayOut();
            return 0;
        case WM_GETMINMAXINFO:
            reinterpret_cast<MINMAXINFO*>(lParam)->ptMinTrackSize = {m_theme.Px(640), m_theme.Px(420)};
            return 0;
        case WM_TIMER:
            OnTimer(wParam);
            return 0;
        case kMessageRun: {
            const std::unique_ptr<std::function<void()>> task(
                reinterpret_cast<std::function<void()>*>(lParam));
            (*task)();
            return 0;
        }
        case WM_CLOSE:
            Close();
            return 0;
        case WM_DESTROY:
            PostQuitMessage(0);
            return 0;
        default:
            return DefWindowProcW(m_window, message, wParam, lParam);
    }
}

double MainWindow::Now() {
    return std::chrono::duration<double>(std::chrono::steady_clock::now().time_since_epoch()).count();
}

}  // namespace velmora::reelview
