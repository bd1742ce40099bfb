#include "text/code_page.h"

namespace velmora {

std::u16string Widen(std::string_view text) {
    const auto length = static_cast<std::uint32_t>(text.size());
    std::u16string wide(length, u'\0');  // no 8-bit code page needs more
    wide.resize(WidenText(text.data(), length, wide.data(), length));
    return wide;
}

std::optional<std::string> NarrowExactly(std::u16string_view text) {
    if (text.empty()) return std::string();
    constexpr std::uint32_t kMostBytes = 4;  // per character, in any code page
    const auto length = static_cast<std::uint32_t>(text.size());
    std::string narrow(std::size_t{length} * kMostBytes, '\0');
    narrow.resize(NarrowText(text.data(), length, narrow.data(), length * kMostBytes));
    if (narrow.empty()) return std::nullopt;
    return narrow;
}

bool NarrowFileName(const char16_t* name, char* buffer, std::uint32_t capacity) noexcept {
    if (name == nullptr) return false;
    const std::size_t length = std::char_traits<char16_t>::length(name);
    if (length == 0 || length >= capacity) return false;
    if (NarrowText(name, static_cast<std::uint32_t>(length), buffer, capacity) != length) return false;
    buffer[length] = '\0';
    return true;
}

}  // namespace velmora
