// The bitmap button: a child window of class "Velmora BitButton" that shows one of the three images of a bitmap
// with alpha, follows the mouse and posts WM_COMMAND to its owner when clicked. Windows only; one thread.
#pragma once

#include <windows.h>

#include "desktop/bit_button_state.h"

namespace velmora::support {

inline constexpr wchar_t kBitButtonClass[] = L"Velmora BitButton";

// Registers the class for `module`, which must be passed when a button is created; false if the system refuses.
// Unregistering fails while buttons exist.
[[nodiscard]] bool RegisterBitButtonClass(HMODULE module) noexcept;
bool UnregisterBitButtonClass(HMODULE module) noexcept;

struct BitButtonDescription {
    HWND owner = nullptr;      // parent; receives the command
    HMODULE module = nullptr;  // for which the class was registered
    HBITMAP bitmap =
        nullptr;  // 32-bit, colours premultiplied by alpha; three images; outlives the button; may be null
    WORD command = 0;
    POINT position = {};  // in the owner's client area, pixels
    bool notify = true;   // when clear, nothing is posted and image 0 is shown
    bool plain = false;   // a standard push button in place of images
};

// The size in pixels of a button with this bitmap: a third of its height; 74 x 32 without a bitmap.
[[nodiscard]] SIZE BitButtonSize(HBITMAP bitmap) noexcept;

// The new button, visible; null when it could not be created. It is destroyed with its owner.
HWND CreateBitButton(const BitButtonDescription& description) noexcept;

}  // namespace velmora::support
