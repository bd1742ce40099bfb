// The user's preferences, the dialog that shows them, and the help that it opens. Windows only; the user-interface
// thread.
#pragma once

#include <windows.h>

#include <cstdint>
#include <optional>
#include <string>

#include "language/translation.h"

namespace velmora::support {

// The preferences, shared by all hosts and kept in the registry.
class Preferences {
  public:
    // Reads the registry. The preference is on only if the stored text begins with "y".
    void Read() noexcept;

    // Circular knobs are turned by dragging the mouse up and down.
    [[nodiscard]] bool KnobsDragVertical() const noexcept { return m_knobsDragVertical; }
    // Also stores the choice. If the registry refuses, there is no message, and the choice lasts as long as the library is
    // loaded.
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

// Opens the help file at a numbered topic, either in the system's help viewer (a separate program) or through the HTML
// help control inside this process (help_launcher.cpp).
class HelpLauncher {
  public:
    // `folder` is 16-bit text that ends in a separator, `fileName` 8-bit text in the system code page.
    void SetFile(std::u16string folder, const std::string& fileName);

    // Non-zero when the help was started. `owner` is a window handle or null.
    [[nodiscard]] std::int32_t Show(void* owner, std::int32_t topic, bool externalViewer) const;

  private:
    [[nodiscard]] std::int32_t ShowInViewer(void* owner, std::int32_t topic) const;
    [[nodiscard]] std::int32_t ShowInProcess(void* owner, std::int32_t topic) const;

    std::u16string m_path;
};

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
