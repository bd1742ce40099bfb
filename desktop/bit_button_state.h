// How the bitmap button reacts to mouse events, without a window: which of its three images it shows and when it is
// clicked. BitButton (bit_button.h) carries out the results.
//
// The bitmap holds the images one above the other: 0 pressed, 1 under the mouse, 2 at rest.
#pragma once

namespace velmora::support {

enum class BitButtonMouse { kNormal, kHover, kPressedInside, kPressedOutside };

// What the window must do after an event, in the order of the members.
struct BitButtonReaction {
    bool click = false;       // notify the owner
    bool trackLeave = false;  // ask the system for a notification when the mouse leaves
    bool captureMouse = false;
    bool releaseCapture = false;  // the system sends "capture changed" during this
    bool redraw = false;

    bool operator==(const BitButtonReaction&) const = default;
};

class BitButtonState {
  public:
    // A button that does not notify shows image 0 and is never clicked.
    explicit BitButtonState(bool notify) noexcept : m_notify(notify) {}

    // `inside`: the pointer is inside the button.
    BitButtonReaction OnMouseMove(bool inside) noexcept;
    BitButtonReaction OnButtonDown() noexcept;
    BitButtonReaction OnButtonUp() noexcept;
    BitButtonReaction OnMouseLeave() noexcept;
    BitButtonReaction OnCaptureChanged() noexcept;

    [[nodiscard]] BitButtonMouse Mouse() const noexcept { return m_mouse; }
    [[nodiscard]] bool Notifies() const noexcept { return m_notify; }
    // 0, 1 or 2, counted from the bitmap's top.
    [[nodiscard]] int ImageIndex() const noexcept;

  private:
    BitButtonMouse m_mouse = BitButtonMouse::kNormal;
    bool m_notify;
};

}  // namespace velmora::support
