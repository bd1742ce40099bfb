#include "text/encodings.h"

#include <cstddef>
#include <cstdint>

namespace velmora {
namespace {

// What a first byte implies. Overlong sequences are found by the lowest value that needs so many bytes.
struct Sequence {
    std::size_t length;  // 0: no sequence begins with this byte
    std::uint32_t firstBits;
    std::uint32_t lowestValue;
};

constexpr Sequence SequenceOf(std::uint32_t first) {
    if (first < 0x80) return {1, first, 0};
    if (first < 0xC0) return {0, 0, 0};
    if (first < 0xE0) return {2, first & 0x1F, 0x80};
    if (first < 0xF0) return {3, first & 0x0F, 0x800};
    if (first < 0xF8) return {4, first & 0x07, 0x10000};
    return {0, 0, 0};
}

constexpr std::uint32_t ByteAt(std::string_view text, std::size_t index) {
    return static_cast<unsigned char>(text[index]);
}

void Append(std::u16string& text, std::uint32_t value) {
    if (value < 0x10000) {
        text.push_back(static_cast<char16_t>(value));
        return;
    }
    const std::uint32_t offset = value - 0x10000;
    text.push_back(static_cast<char16_t>(0xD800 + (offset >> 10)));
    text.push_back(static_cast<char16_t>(0xDC00 + (offset & 0x3FF)));
}

constexpr bool IsHighSurrogate(char16_t character) {
    return character >= 0xD800 && character <= 0xDBFF;
}

// Takes one character from the front of a text that is not empty; nothing when it is not well-formed.
std::optional<std::uint32_t> TakeCharacter(std::string_view& text) {
    const Sequence sequence = SequenceOf(ByteAt(text, 0));
    if (sequence.length == 0 || sequence.length > text.size()) return std::nullopt;
    std::uint32_t value = sequence.firstBits;
    for (std::size_t i = 1; i < sequence.length; ++i) {
        const std::uint32_t next = ByteAt(text, i);
        if ((next & 0xC0) != 0x80) return std::nullopt;
        value = value << 6 | (next & 0x3F);
    }
    const bool isSurrogate = value >= 0xD800 && value <= 0xDFFF;
    if (value < sequence.lowestValue || value > 0x10FFFF || isSurrogate) return std::nullopt;
    text.remove_prefix(sequence.length);
    return value;
}

}  // namespace

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

bool IsUtf8(std::string_view text) noexcept {
    while (!text.empty()) {
        if (!TakeCharacter(text)) return false;
    }
    return true;
}

std::optional<std::u16string> Utf16FromUtf8(std::string_view text) {
    std::u16string result;
    while (!text.empty()) {
        const std::optional<std::uint32_t> value = TakeCharacter(text);
        if (!value) return std::nullopt;
        Append(result, *value);
    }
    return result;
}

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

}  // namespace velmora
