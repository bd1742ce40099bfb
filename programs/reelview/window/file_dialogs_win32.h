// The system's open and save dialogs. Windows only.
#pragma once

#include <windows.h>

#include <optional>
#include <string>

#include "programs/reelview/keeper/export_job_win32.h"
#include "programs/reelview/base/texts_win32.h"

namespace velmora::reelview {

// Empty when cancelled.
[[nodiscard]] std::optional<std::wstring> AskOpenFile(HWND owner, const Texts& texts);
[[nodiscard]] std::optional<std::wstring> AskPngFile(HWND owner, const Texts& texts);

struct ClipChoice {
    std::wstring file;
    ClipKind kind;
};
[[nodiscard]] std::optional<ClipChoice> AskClipFile(HWND owner, const Texts& texts);

}  // namespace velmora::reelview
