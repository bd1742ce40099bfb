// Two small owning strings: `VMString` for 8-bit text in the system code page, `VMUnicodeString` for 16-bit text.
//
// The data pointer is null exactly when the length is 0; otherwise it owns length + 1 characters, the last of them a
// zero. No operation reports an error: a failed allocation or conversion leaves the string empty or unchanged, as each
// operation says, and callers check IsNotEmpty where it matters.
#pragma once

#include <cstdint>

namespace velmora {

// Passed as a length: measure up to the terminating zero.
inline constexpr std::uint32_t kMeasureText = 0xFFFFFFFFu;

class VMUnicodeString {
  public:
    VMUnicodeString() noexcept = default;
    // Copies `length` characters (kMeasureText: up to the zero). A null text or a length of 0 gives an empty string.
    VMUnicodeString(const char16_t* text, std::uint32_t length) noexcept;
    VMUnicodeString(const VMUnicodeString& other) noexcept;
    VMUnicodeString& operator=(const VMUnicodeString& other) noexcept;
    virtual ~VMUnicodeString();

    // Like construction. The text may be part of this string. Empty when the allocation fails.
    void Assign(const char16_t* text, std::uint32_t length) noexcept;
    void Assign(const VMUnicodeString& other) noexcept;
    // Appends the other string; unchanged when the allocation fails.
    void Append(VMUnicodeString other) noexcept;
    void Clear() noexcept;

    // Null for an empty string.
    [[nodiscard]] const char16_t* Text() const noexcept { return m_data; }
    [[nodiscard]] bool IsNotEmpty() const noexcept { return m_length != 0; }
    [[nodiscard]] std::uint32_t Length() const noexcept { return m_length; }
    [[nodiscard]] bool IsIndex(std::uint32_t index) const noexcept { return index < m_length; }
    [[nodiscard]] bool operator==(const VMUnicodeString& other) const noexcept;

  private:
    std::uint32_t m_length = 0;
    char16_t* m_data = nullptr;
};

class VMString {
  public:
    VMString() noexcept = default;
    // Like VMUnicodeString's, with 8-bit text.
    VMString(const char* text, std::uint32_t length) noexcept;
    VMString(const VMString& other) noexcept;
    VMString& operator=(const VMString& other) noexcept;
    virtual ~VMString();

    void Assign(const char* text, std::uint32_t length) noexcept;
    void Clear() noexcept;

    [[nodiscard]] const char* Text() const noexcept { return m_data; }
    [[nodiscard]] bool IsNotEmpty() const noexcept { return m_length != 0; }
    [[nodiscard]] std::uint32_t Length() const noexcept { return m_length; }
    // Widened from the system code page; empty after any failure.
    [[nodiscard]] VMUnicodeString ToUnicode() const noexcept;

  private:
    std::uint32_t m_length = 0;
    char* m_data = nullptr;
};

}  // namespace velmora
