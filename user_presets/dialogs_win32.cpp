#include "user_presets/dialogs.h"

#include <windows.h>
#include <commdlg.h>

#include "platform/win32.h"

namespace velmora {

namespace {

using support::win32::Wide;

// The file dialogs change the process's current folder to the one that the user opened. A host's relative names must
// not change their meaning because of that.
class CurrentFolderGuard {
  public:
    CurrentFolderGuard() noexcept
        : m_isKnown(GetCurrentDirectoryW(kCapacity, m_folder) - 1 < kCapacity - 1) {}
    ~CurrentFolderGuard() {
        if (m_isKnown) SetCurrentDirectoryW(m_folder);
    }
    CurrentFolderGuard(const CurrentFolderGuard&) = delete;
    CurrentFolderGuard& operator=(const CurrentFolderGuard&) = delete;

  private:
    static constexpr DWORD kCapacity = 1024;
    wchar_t m_folder[kCapacity];
    bool m_isKnown;
};

OPENFILENAMEW Describe(const FileDialog& dialog, DialogFileName& fileName, DWORD flags) {
    fileName.fill(0);
    OPENFILENAMEW description = {};
    description.lStructSize = sizeof description;
    description.hwndOwner = static_cast<HWND>(dialog.owner);
    description.lpstrFilter = Wide(dialog.filter);
    description.nFilterIndex = 1;
    description.lpstrFile = reinterpret_cast<wchar_t*>(fileName.data());
    description.nMaxFile = static_cast<DWORD>(fileName.size());
    description.lpstrTitle = Wide(dialog.title);
    description.Flags = flags;
    description.lpstrDefExt = Wide(dialog.defaultExtension);
    return description;
}

}  // namespace

bool ShowOpenDialog(const FileDialog& dialog, DialogFileName& fileName) noexcept {
    const CurrentFolderGuard guard;
    OPENFILENAMEW description =
        Describe(dialog, fileName, OFN_EXPLORER | OFN_PATHMUSTEXIST | OFN_FILEMUSTEXIST);
    return GetOpenFileNameW(&description) != 0;
}

bool ShowSaveDialog(const FileDialog& dialog, DialogFileName& fileName) noexcept {
    const CurrentFolderGuard guard;
    OPENFILENAMEW description = Describe(dialog, fileName, OFN_OVERWRITEPROMPT);
    return GetSaveFileNameW(&description) != 0;
}

void ShowWarning(const char16_t* text, const char16_t* caption) noexcept {
    MessageBoxW(GetForegroundWindow(), Wide(text), Wide(caption), MB_ICONEXCLAMATION | MB_OK);
}

}  // namespace velmora
