// The window that shows the progress of saving, and the system's dialogs for files. Windows only.
#pragma once

#include <windows.h>

#include <atomic>
#include <cstdint>
#include <optional>
#include <string>

#include "programs/reelview/base/theme_win32.h"
#include "programs/reelview/keeper/export_job_win32.h"
#include "programs/reelview/base/texts.h"

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

// The system's open and save dialogs. Empty when cancelled.
[[nodiscard]] std::optional<std::wstring> AskOpenFile(HWND owner, const Texts& texts);
[[nodiscard]] std::optional<std::wstring> AskPngFile(HWND owner, const Texts& texts);

struct ClipChoice {
    std::wstring file;
    ClipKind kind;
};
[[nodiscard]] std::optional<ClipChoice> AskClipFile(HWND owner, const Texts& texts);

}  // namespace velmora::reelview
