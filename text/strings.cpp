#include "text/strings.h"

#include <algorithm>
#include <cstdint>
#include <memory>
#include <new>
#include <string>

#include "text/encodings.h"

namespace velmora {

namespace {

// Memory for `length` characters and a terminator; null when there is not enough.
template <typename Character>
Character* Allocate(std::size_t length) noexcept {
    if (length >= PTRDIFF_MAX / sizeof(Character)) return nullptr;
    return new (std::nothrow) Character[length + 1];
}

// Sets the string (its data and its length) to a copy of a text. The old data is freed last: the text may be part of
// it.
template <typename Character>
void Replace(Character*& data, std::uint32_t& length, const Character* text, std::uint32_t count) noexcept {
    if (text != nullptr && count == kMeasureText) {
        count = static_cast<std::uint32_t>(std::char_traits<Character>::length(text));
    }
    Character* copy = nullptr;
    if (text != nullptr && count != 0) copy = Allocate<Character>(count);
    if (copy != nullptr) {
        std::copy_n(text, count, copy);
        copy[count] = 0;
    }
    delete[] data;
    data = copy;
    length = copy != nullptr ? count : 0;
}

}  // namespace

VMUnicodeString::VMUnicodeString(const char16_t* text, std::uint32_t length) noexcept {
    Assign(text, length);
}

VMUnicodeString::VMUnicodeString(const VMUnicodeString& other) noexcept {
    Assign(other);
}

// NOLINTNEXTLINE(bugprone-unhandled-self-assignment): the copy is made before the old text is freed
VMUnicodeString& VMUnicodeString::operator=(const VMUnicodeString& other) noexcept {
    Assign(other);
    return *this;
}

VMUnicodeString::~VMUnicodeString() {
    delete[] m_data;
}

void VMUnicodeString::Assign(const char16_t* text, std::uint32_t length) noexcept {
    Replace(m_data, m_length, text, length);
}

void VMUnicodeString::Assign(const VMUnicodeString& other) noexcept {
    Assign(other.m_data, other.m_length);
}

// NOLINTNEXTLINE(performance-unnecessary-value-param): by value, as a string may be appended to itself
void VMUnicodeString::Append(VMUnicodeString other) noexcept {
    if (!other.IsNotEmpty() || other.m_length >= kMeasureText - m_length) return;
    const std::uint32_t length = m_length + other.m_length;
    char16_t* joined = Allocate<char16_t>(length);
    if (joined == nullptr) return;
    std::copy_n(other.m_data, other.m_length, std::copy_n(m_data, m_length, joined));
    joined[length] = 0;
    delete[] m_data;
    m_data = joined;
    m_length = length;
}

void VMUnicodeString::Clear() noexcept {
    Assign(nullptr, 0);
}

bool VMUnicodeString::operator==(const VMUnicodeString& other) const noexcept {
    return m_length == other.m_length && std::equal(m_data, m_data + m_length, other.m_data);
}

VMString::VMString(const char* text, std::uint32_t length) noexcept {
    Assign(text, length);
}

VMString::VMString(const VMString& other) noexcept {
    Assign(other.m_data, other.m_length);
}

// NOLINTNEXTLINE(bugprone-unhandled-self-assignment): the copy is made before the old text is freed
VMString& VMString::operator=(const VMString& other) noexcept {
    Assign(other.m_data, other.m_length);
    return *this;
}

VMString::~VMString() {
    delete[] m_data;
}

void VMString::Assign(const char* text, std::uint32_t length) noexcept {
    Replace(m_data, m_length, text, length);
}

void VMString::Clear() noexcept {
    Assign(nullptr, 0);
}

VMUnicodeString VMString::ToUnicode() const noexcept {
    const std::uint32_t needed = WidenText(m_data, m_length, nullptr, 0);
    if (needed == 0) return {};
    const std::unique_ptr<char16_t[]> wide(Allocate<char16_t>(needed));
    if (wide == nullptr) return {};
    return {wide.get(), WidenText(m_data, m_length, wide.get(), needed)};
}

}  // namespace velmora
