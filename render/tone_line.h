// Tables that are a line clamped at black and white, as brightness, flicker and contrast make them. Kernels without
// byte permutations compute them faster than they can look them up.
#pragma once

#include <algorithm>
#include <array>
#include <cstdint>
#include <optional>

namespace velmora::render {

// A lookup table for one channel.
using ByteTable = std::array<std::uint8_t, 256>;

// The entry for i, in unsigned 16 bits: (i × 256 × times >> 16) + plus, at most 65535, less minus, at least 0;
// shifted right by `shift` and at most 255.
struct ToneLine {
    std::uint16_t times = 0;
    std::uint16_t plus = 0;
    std::uint16_t minus = 0;
    std::uint16_t shift = 0;
};

[[nodiscard]] constexpr std::uint8_t EntryOf(const ToneLine& line, std::uint8_t i) noexcept {
    const std::uint32_t product = (std::uint32_t{i} << 8) * line.times >> 16;
    const std::uint32_t sum = std::min(product + line.plus, 65535u);
    const std::uint32_t rest = sum > line.minus ? sum - line.minus : 0u;
    return static_cast<std::uint8_t>(std::min(rest >> line.shift, 255u));
}

// The line that gives exactly this table, which rises by `slope` (0..8) from entry to entry where it is not clamped.
// None if no 16-bit numbers give it.
[[nodiscard]] std::optional<ToneLine> LineOf(const ByteTable& table, double slope) noexcept;

}  // namespace velmora::render
