#include "programs/reelview/window/dialogs_win32.h"

#include <commctrl.h>
#include <commdlg.h>

#include <array>

#include "programs/reelview/base/window_class_win32.h"
#include "programs/reelview/base/texts.h"

namespace velmora::reelview {
namespace {

constexpr int kSteps = 1000;

}  // namespace

ProgressWindow::ProgressWindow(HWND owner, const Theme& theme, const Labels& labels, std::int64_t frames,
                               std::atomic<bool>& isCancelled)
    : m_owner(owner), m_theme(theme), m_frames(frames), m_isCancelled(isCancelled) {
    RegisterObjectClass<ProgressWindow>(kProgressClass, 0);
    const HINSTANCE instance = GetModuleHandleW(nullptr);
    RECT box = {0, 0, theme.Px(360), theme.Px(104)}, place = {};
    AdjustWindowRectEx(&box, WS_POPUP | WS_CAPTION, FALSE, WS_EX_DLGMODALFRAME);
    GetWindowRect(owner, &place);
    const int width = box.right - box.left, height = box.bottom - box.top;
    CreateWindowExW(WS_EX_DLGMODALFRAME | WS_EX_CONTROLPARENT, kProgressClass, labels.title.c_str(),
                    WS_POPUP | WS_CAPTION, (place.left + place.right - width) / 2,
                    (place.top + place.bottom - height) / 2, width, height, owner, nullptr, instance, this);
    theme.DressFrame(m_window);
    m_text = CreateWindowExW(0, WC_STATICW, L"", WS_CHILD | WS_VISIBLE, theme.Px(16), theme.Px(12),
                             theme.Px(328), theme.Px(18), m_window, nullptr, instance, nullptr);
    m_bar = CreateWindowExW(0, PROGRESS_CLASSW, labels.title.c_str(), WS_CHILD | WS_VISIBLE, theme.Px(16),
                            theme.Px(34), theme.Px(328), theme.Px(16), m_window, nullptr, instance, nullptr);
    SendMessageW(m_bar, PBM_SETRANGE32, 0, kSteps);
    m_cancel = CreateWindowExW(0, WC_BUTTONW, labels.cancel.c_str(),
                               WS_CHILD | WS_VISIBLE | WS_TABSTOP | BS_DEFPUSHBUTTON, theme.Px(244),
                               theme.Px(64), theme.Px(100), theme.Px(28), m_window,
                               reinterpret_cast<HMENU>(INT_PTR{IDCANCEL}), instance, nullptr);
    SendMessageW(m_text, WM_SETFONT, reinterpret_cast<WPARAM>(theme.TextFont()), FALSE);
    SendMessageW(m_cancel, WM_SETFONT, reinterpret_cast<WPARAM>(theme.TextFont()), FALSE);
    EnableWindow(owner, FALSE);
    ShowWindow(m_window, SW_SHOW);
    SetFocus(m_cancel);
    Show(0);
}

ProgressWindow::~ProgressWindow() {
    // Enable the owner first, or another program's window comes to the front.
    EnableWindow(m_owner, TRUE);
    if (m_window != nullptr) DestroyWindow(m_window);
}

void ProgressWindow::Show(std::int64_t framesDone) {
    SendMessageW(m_bar, PBM_SETPOS, static_cast<WPARAM>(framesDone * kSteps / m_frames), 0);
    SetWindowTextW(m_text, (std::to_wstring(framesDone) + L" / " + std::to_wstring(m_frames)).c_str());
}

LRESULT ProgressWindow::OnMessage(UINT message, WPARAM wParam, LPARAM lParam) {
    switch (message) {
        case WM_COMMAND:
            if (LOWORD(wParam) == IDCANCEL || LOWORD(wParam) == IDOK) {
                m_isCancelled = true;
                EnableWindow(m_cancel, FALSE);
            }
            return 0;
        case WM_CLOSE:
            m_isCancelled = true;
            return 0;
        case WM_ERASEBKGND: {
            RECT area = {};
            GetClientRect(m_window, &area);
            FillRect(reinterpret_cast<HDC>(wParam), &area, m_theme.WindowBrush());
            return 1;
        }
        case WM_CTLCOLORSTATIC:
        case WM_CTLCOLORBTN:
            return reinterpret_cast<LRESULT>(m_theme.ControlColours(reinterpret_cast<HDC>(wParam), false));
        default:
            return DefWindowProcW(m_window, message, wParam, lParam);
    }
}

namespace {

constexpr DWORD kLongestPath = 32768;

// "label (patterns)", then the patterns, each terminated by a zero.
void AddFilter(std::wstring& filter, const std::wstring& label, const std::wstring& patterns) {
    filter += label + L" (" + patterns + L')';
    filter += L'\0';
    filter += patterns;
    filter += L'\0';
}

struct Asked {
    std::wstring file;
    DWORD filterIndex;
};

std::optional<Asked> Ask(HWND owner, const std::wstring& filter, const wchar_t* extension, bool isSaving) {
    std::wstring file(kLongestPath, L'\0');
    OPENFILENAMEW dialog = {};
    dialog.lStructSize = sizeof dialog;
    dialog.hwndOwner = owner;
    dialog.lpstrFilter = filter.c_str();
    dialog.nFilterIndex = 1;
    dialog.lpstrFile = file.data();
    dialog.nMaxFile = kLongestPath;
    dialog.lpstrDefExt = extension;
    dialog.Flags = OFN_EXPLORER | OFN_HIDEREADONLY | OFN_NOCHANGEDIR | OFN_PATHMUSTEXIST |
                   (isSaving ? OFN_OVERWRITEPROMPT : OFN_FILEMUSTEXIST);
    const BOOL isChosen = isSaving ? GetSaveFileNameW(&dialog) : GetOpenFileNameW(&dialog);
    if (!isChosen) return std::nullopt;
    return Asked{file.c_str(), dialog.nFilterIndex};
}

bool HasExtension(const std::wstring& file, const std::wstring& extension) {
    return file.size() > extension.size() &&
           lstrcmpiW(file.c_str() + file.size() - extension.size(), extension.c_str()) == 0;
}

}  // namespace

std::optional<std::wstring> AskOpenFile(HWND owner, const Texts& texts) {
    std::wstring filter;
    AddFilter(filter, texts(text::kAllKinds),
              L"*.png;*.jpg;*.jpeg;*.bmp;*.tif;*.tiff;*.gif;*.y4m;*.avi;*.mp4;*.m4v;*.mov;*.wmv");
    AddFilter(filter, texts(text::kAllFiles), L"*.*");
    const auto asked = Ask(owner, filter, nullptr, false);
    if (!asked) return std::nullopt;
    return asked->file;
}

std::optional<std::wstring> AskPngFile(HWND owner, const Texts& texts) {
    std::wstring filter;
    AddFilter(filter, texts(text::kPngPicture), L"*.png");
    const auto asked = Ask(owner, filter, L"png", true);
    if (!asked) return std::nullopt;
    return asked->file;
}

// The selected type counts, but a file name with another type's extension is just as clear.
std::optional<ClipChoice> AskClipFile(HWND owner, const Texts& texts) {
    struct Row {
        const char* label;
        const wchar_t* extension;
        ClipKind kind;
    };
    static constexpr std::array kRows = {
        Row{text::kAviPlain, L".avi", ClipKind::kAviPlain},
        Row{text::kAviCodec, L".avi", ClipKind::kAviCodec},
        Row{text::kPngSequence, L".png", ClipKind::kPngSequence},
        Row{text::kY4mFilm, L".y4m", ClipKind::kY4m},
    };
    std::wstring filter;
    for (const Row& row : kRows) AddFilter(filter, texts(row.label), std::wstring(L"*") + row.extension);
    // A default extension makes the dialog add that of the selected type.
    const auto asked = Ask(owner, filter, L"avi", true);
    if (!asked) return std::nullopt;
    const std::size_t index =
        asked->filterIndex >= 1 && asked->filterIndex <= kRows.size() ? asked->filterIndex - 1 : 0;
    if (HasExtension(asked->file, kRows[index].extension)) return ClipChoice{asked->file, kRows[index].kind};
    for (const Row& row : kRows) {
        if (HasExtension(asked->file, row.extension)) return ClipChoice{asked->file, row.kind};
    }
    return ClipChoice{asked->file + kRows[index].extension, kRows[index].kind};
}

}  // namespace velmora::reelview
