#include "text/encodings.h"

#include <windows.h>

namespace velmora {

static_assert(sizeof(wchar_t) == sizeof(char16_t));

std::uint32_t WidenText(const char* text, std::uint32_t length, char16_t* buffer,
                        std::uint32_t capacity) noexcept {
    if (text == nullptr || length == 0 || length > 0x7FFFFFFFu || capacity > 0x7FFFFFFFu) return 0;
    const int space = buffer == nullptr ? 0 : static_cast<int>(capacity);
    if (buffer != nullptr && space == 0) return 0;  // a size of 0 would only query the length
    const int written = MultiByteToWideChar(CP_ACP, 0, text, static_cast<int>(length),
                                            reinterpret_cast<wchar_t*>(buffer), space);
    return written > 0 ? static_cast<std::uint32_t>(written) : 0;
}

std::uint32_t NarrowText(const char16_t* text, std::uint32_t length, char* buffer,
                         std::uint32_t capacity) noexcept {
    if (text == nullptr || length == 0 || length > 0x7FFFFFFFu || capacity > 0x7FFFFFFFu) return 0;
    if (capacity == 0) return 0;  // would only query the length
    // A system whose code page is UTF-8 accepts neither the flag nor the query for replacements. It needs neither:
    // every character has an exact equivalent there.
    const bool isUtf8 = GetACP() == CP_UTF8;
    BOOL isReplaced = FALSE;
    const int written =
        WideCharToMultiByte(CP_ACP, isUtf8 ? 0 : WC_NO_BEST_FIT_CHARS, reinterpret_cast<const wchar_t*>(text),
                            static_cast<int>(length), buffer, static_cast<int>(capacity), nullptr,
                            isUtf8 ? nullptr : &isReplaced);
    return written > 0 && !isReplaced ? static_cast<std::uint32_t>(written) : 0;
}

}  // namespace velmora
