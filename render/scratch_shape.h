// The cross-sections of scratches, as weights of whole pixels.
#pragma once

#include <array>
#include <cstdint>

#include "render/scratch_state.h"

namespace velmora::render {

inline constexpr std::int32_t kScratchPhases = 32;  // steps of a pixel in which a scratch's left edge may lie
inline constexpr std::int32_t kMostScratchPixels = 12;

// For a left edge `phase` steps into a pixel: what share of that pixel and of those to its right the scratch
// covers, 0..65280 (65536 would be all).
struct ScratchShape {
    std::int32_t pixels = 0;  // how many a scratch can touch, rounded up to whole vectors of four
    std::array<std::array<std::uint16_t, kMostScratchPixels>, kScratchPhases> weights{};
};

// The shape of a profile; `index` in 0..kScratchProfiles − 1.
[[nodiscard]] const ScratchShape& ScratchShapeOf(bool isWhite, std::int32_t index) noexcept;

}  // namespace velmora::render
