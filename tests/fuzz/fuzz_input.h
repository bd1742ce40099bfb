// Shared by the fuzzing programs: their assertion, and the fuzzer's bytes read as numbers.
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <cstring>

namespace velmora::fuzz {

// A violated rule ends the program, so that the fuzzer keeps the input.
inline void Require(bool holds) {
    if (!holds) std::abort();
}

// Read front to back; past the end everything is 0.
class FuzzInput {
  public:
    FuzzInput(const std::uint8_t* data, std::size_t size) : m_next(data), m_end(data + size) {}

    [[nodiscard]] bool AtEnd() const { return m_next == m_end; }
    std::uint8_t Byte() { return AtEnd() ? std::uint8_t{0} : *m_next++; }
    // 0..limit - 1; `limit` 1..256.
    std::int32_t Below(std::int32_t limit) { return Byte() % limit; }
    std::uint32_t Word() {
        const std::uint32_t low = Byte(), second = Byte(), third = Byte();
        return low | second << 8 | third << 16 | std::uint32_t{Byte()} << 24;
    }
    double Double() {
        const std::uint64_t low = Word();
        const std::uint64_t bits = low | std::uint64_t{Word()} << 32;
        double value;
        std::memcpy(&value, &bits, sizeof value);
        return value;
    }

  private:
    const std::uint8_t* m_next;
    const std::uint8_t* m_end;
};

}  // namespace velmora::fuzz
