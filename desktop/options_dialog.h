// The options dialog: the library's name and version, its one preference, a logo that opens the maker's web page,
// and help. Windows only; the user-interface thread.
#pragma once

#include <windows.h>

#include "desktop/help_launcher.h"
#include "desktop/preferences.h"
#include "language/translation.h"

namespace velmora::support {

// What the dialog uses. All of it must outlive the dialog.
struct OptionsDialogParts {
    HMODULE templates = nullptr;     // holds the dialog's template and manifest
    HMODULE buttonModule = nullptr;  // for which the button class is registered; null: no logo
    HBITMAP logo = nullptr;          // may be null, see BitButtonDescription
    TranslationHelper* texts = nullptr;
    const HelpLauncher* help = nullptr;
    Preferences* preferences = nullptr;  // shown in the dialog; changed by OK
};

class OptionsDialog {
  public:
    explicit OptionsDialog(const OptionsDialogParts& parts) noexcept : m_parts(parts) {}
    OptionsDialog(const OptionsDialog&) = delete;
    OptionsDialog& operator=(const OptionsDialog&) = delete;

    // Shows the dialog until the user closes it. True after OK; false after Cancel, or when it could not be shown.
    [[nodiscard]] bool Show(HWND owner) noexcept;

    // Brings a dialog that is already open to the front.
    void ToFront() const noexcept;
    // Closes an open dialog, as Cancel does, and destroys its logo at once.
    void Abandon() noexcept;

  private:
    static INT_PTR CALLBACK Procedure(HWND window, UINT message, WPARAM wParam, LPARAM lParam) noexcept;

    INT_PTR OnMessage(UINT message, WPARAM wParam) noexcept;
    void OnOpen() noexcept;
    void OnCommand(int control) noexcept;
    void OnOk() noexcept;
    void OpenHelp() const noexcept;
    void SetTexts() noexcept;
    void CreateLogo() noexcept;

    OptionsDialogParts m_parts;
    HWND m_window = nullptr;
    HWND m_logo = nullptr;
};

}  // namespace velmora::support
