#include "programs/reelview/window/progress_window_win32.h"

#include <commctrl.h>

#include "programs/reelview/base/window_class_win32.h"

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

}  // namespace velmora::reelview
