#include "language/copy_text.h"

namespace velmora::language {
namespace {

constexpr bool IsHighSurrogate(char16_t character) {
    return character >= 0xD800 && character <= 0xDBFF;
}

}  // namespace

std::int32_t CopyText(const char16_t* text, char16_t* buffer, std::int32_t capacity) noexcept {
    if (!buffer || capacity < 1) return 0;
    std::int32_t length = 0;
    while (text && length < capacity - 1 && text[length] != 0) {
        buffer[length] = text[length];
        ++length;
    }
    const bool isCut = text && text[length] != 0;
    if (isCut && length > 0 && IsHighSurrogate(buffer[length - 1])) --length;
    buffer[length] = 0;
    return length;
}

}  // namespace velmora::language
