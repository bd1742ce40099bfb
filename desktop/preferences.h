// The user's preferences, shared by all hosts and kept in the registry. Windows only; the user-interface thread.
#pragma once

#include <optional>
#include <string>

namespace velmora::support {

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

}  // namespace velmora::support
