#include "text/encodings.h"

#include <algorithm>
#include <iterator>

namespace velmora {

namespace {

// Windows-1252 is Latin-1 except for the bytes 0x80 to 0x9F. Five of them are unassigned and stand for the control
// characters with the same number, as on Windows.
constexpr char16_t kHighControls[32] = {
    0x20AC, 0x0081, 0x201A, 0x0192, 0x201E, 0x2026, 0x2020, 0x2021,  // 80
    0x02C6, 0x2030, 0x0160, 0x2039, 0x0152, 0x008D, 0x017D, 0x008F,  // 88
    0x0090, 0x2018, 0x2019, 0x201C, 0x201D, 0x2022, 0x2013, 0x2014,  // 90
    0x02DC, 0x2122, 0x0161, 0x203A, 0x0153, 0x009D, 0x017E, 0x0178,  // 98
};

char16_t WidenByte(char character) {
    const auto byte = static_cast<unsigned char>(character);
    return byte >= 0x80 && byte < 0xA0 ? kHighControls[byte - 0x80] : byte;
}

// The byte for a character, -1 when there is none.
int Narrow(char16_t character) {
    const auto* found = std::find(std::begin(kHighControls), std::end(kHighControls), character);
    if (found != std::end(kHighControls)) return 0x80 + static_cast<int>(found - kHighControls);
    const bool isLatin1 = character < 0x80 || (character >= 0xA0 && character <= 0xFF);
    return isLatin1 ? character : -1;
}

}  // namespace

std::uint32_t WidenText(const char* text, std::uint32_t length, char16_t* buffer,
                        std::uint32_t capacity) noexcept {
    if (text == nullptr || length == 0) return 0;
    if (buffer == nullptr) return length;
    if (capacity < length) return 0;
    std::transform(text, text + length, buffer, WidenByte);
    return length;
}

std::uint32_t NarrowText(const char16_t* text, std::uint32_t length, char* buffer,
                         std::uint32_t capacity) noexcept {
    if (text == nullptr || length > capacity) return 0;
    for (std::uint32_t i = 0; i < length; ++i) {
        const int byte = Narrow(text[i]);
        if (byte < 0) return 0;
        buffer[i] = static_cast<char>(byte);
    }
    return length;
}

}  // namespace velmora
