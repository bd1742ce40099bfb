// What the user prefers, for all hosts: kept in the registry. Windows only; the user-interface thread.
#pragma once

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

}  // namespace velmora::support
