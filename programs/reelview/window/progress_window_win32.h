// Shows the progress of saving, with a button to cancel it. Windows only.
#pragma once

#include <windows.h>

#include <atomic>
#include <cstdint>
#include <string>

#include "programs/reelview/base/theme_win32.h"

namespace velmora::reelview {

inline constexpr wchar_t kProgressClass[] = L"Velmora Reel Progress";

class ProgressWindow {
  public:
    struct Labels {
        std::wstring title, cancel;
    };

    // Disables the owner during its lifetime.
    ProgressWindow(HWND owner, const Theme& theme, const Labels& labels, std::int64_t frames,
                   std::atomic<bool>& isCancelled);
    ~ProgressWindow();
    ProgressWindow(const ProgressWindow&) = delete;
    ProgressWindow& operator=(const ProgressWindow&) = delete;

    void Show(std::int64_t framesDone);

    LRESULT OnMessage(UINT message, WPARAM wParam, LPARAM lParam);
    HWND m_window = nullptr;

  private:
    HWND m_owner, m_text = nullptr, m_bar = nullptr, m_cancel = nullptr;
    const Theme& m_theme;
    std::int64_t m_frames;
    std::atomic<bool>& m_isCancelled;
};

}  // namespace velmora::reelview
