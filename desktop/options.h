// The user's preferences, and the dialog that shows them. Windows only; the user-interface thread.
#pragma once

#include <windows.h>

#include <optional>
#include <string>

#include "desktop/help_launcher.h"
#include "language/translation.h"

namespace velmora::support {

// The preferences, shared by all hosts and kept in the registry.
class Preferences {
  public:
    // Reads the registry: on only when the stored text begins with "y".
    void Read() noexcept;

    // Circular knobs are turned by dragging the mouse up and down.
    [[nodiscard]] bool KnobsDragVertical() const noexcept { return m_knobsDragVertical; }
    // Also stores the choice. If the registry refuses, the user is not bothered: the choice then lasts as long as the
    // library is loaded.
    void SetKnobsDragVertical(bool vertical) noexcept;

  private:
    bool m_knobsDragVertical = false;
};

// Preferences are texts under "Software\Velmora\<section>" in the registry. The current user's key is read first, then
// the machine's; writes go to the user's.

// The text of a setting; nothing when neither key holds a readable text of at most 1024 bytes.
[[nodiscard]] std::optional<std::string> ReadSetting(const char* section, const char* name);

// Stores a text with its terminator, creating the key if it is missing; false when the registry refuses.
bool WriteSetting(const char* section, const char* name, const char* text);

// The options dialog: the library's name and version, its one preference, a logo that opens the maker's web page,
// and help.

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
