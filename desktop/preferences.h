// What the user prefers, for all hosts: kept in the registry. Windows only; the user-interface thread.
#pragma once

#include <optional>
#include <string>

namespace velmora::support {

class Preferences {
  public:
    // From the registry: off when nothing is stored there that begins with "y".
    void Read() noexcept;

    // Circular knobs are turned by dragging the mouse up and down.
    [[nodiscard]] bool KnobsDragVertical() const noexcept { return m_knobsDragVertical; }
    // Stores the choice too. A registry that refuses is no reason to bother the user: the choice then holds for
    // as long as the library is loaded.
    void SetKnobsDragVertical(bool vertical) noexcept;

  private:
    bool m_knobsDragVertical = false;
};

// Texts under "Software\Velmora\<section>" of the registry, in which preferences are kept. The current user's key is
// read first, then the machine's; writing goes to the user's.

// The text of a setting; nothing when neither key holds a text of at most 1024 bytes that may be read.
[[nodiscard]] std::optional<std::string> ReadSetting(const char* section, const char* name);

// Stores a text with its terminator and makes the key when it is missing; false when the registry refuses.
bool WriteSetting(const char* section, const char* name, const char* text);

}  // namespace velmora::support
