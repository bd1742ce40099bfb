#include "desktop/bit_button_state.h"

namespace velmora::support {

BitButtonReaction BitButtonState::OnMouseMove(bool inside) noexcept {
    const BitButtonMouse before = m_mouse;
    switch (m_mouse) {
        case BitButtonMouse::kNormal:
            if (inside) m_mouse = BitButtonMouse::kHover;
            break;
        case BitButtonMouse::kHover:
            if (!inside) m_mouse = BitButtonMouse::kNormal;
            break;
        case BitButtonMouse::kPressedInside:
        case BitButtonMouse::kPressedOutside:
            m_mouse = inside ? BitButtonMouse::kPressedInside : BitButtonMouse::kPressedOutside;
            break;
    }
    const bool entered = before == BitButtonMouse::kNormal && m_mouse == BitButtonMouse::kHover;
    return {.trackLeave = entered, .redraw = m_mouse != before};
}

BitButtonReaction BitButtonState::OnButtonDown() noexcept {
    m_mouse = BitButtonMouse::kPressedInside;
    return {.captureMouse = true, .redraw = true};
}

BitButtonReaction BitButtonState::OnButtonUp() noexcept {
    const bool released = m_mouse == BitButtonMouse::kPressedInside;
    if (released) {
        m_mouse = BitButtonMouse::kHover;
    } else if (m_mouse == BitButtonMouse::kPressedOutside) {
        m_mouse = BitButtonMouse::kNormal;
    }
    return {.click = released && m_notify, .releaseCapture = true, .redraw = true};
}

BitButtonReaction BitButtonState::OnMouseLeave() noexcept {
    if (m_mouse != BitButtonMouse::kHover) return {};
    m_mouse = BitButtonMouse::kNormal;
    return {.redraw = true};
}

BitButtonReaction BitButtonState::OnCaptureChanged() noexcept {
    m_mouse = BitButtonMouse::kNormal;
    return {.redraw = true};
}

int BitButtonState::ImageIndex() const noexcept {
    if (!m_notify) return 0;
    switch (m_mouse) {
        case BitButtonMouse::kNormal:
            return 2;
        case BitButtonMouse::kHover:
        case BitButtonMouse::kPressedOutside:
            return 1;
        case BitButtonMouse::kPressedInside:
            break;
    }
    return 0;
}

}  // namespace velmora::support
