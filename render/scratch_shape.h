// The cross-sections of scratches, as weights of whole pixels.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

#include "render/scratch_state.h"

namespace velmora::render {

inline constexpr std::int32_t kScratchPhases = 32;  // positions of a scratch's left edge within a pixel
inline constexpr std::int32_t kMostScratchPixels = 12;
inline constexpr std::int32_t kScratchSections = 3;  // kinds of cross-section, for scratches of each width

// For a left edge `phase` steps into a pixel: the share of that pixel and of those to its right that the scratch
// covers, 0..65280 (65536 would be all).
struct ScratchShape {
    std::int32_t pixels = 0;  // how many a scratch can touch, rounded up to whole vectors of four
    std::array<std::array<std::uint16_t, kMostScratchPixels>, kScratchPhases> weights{};
};

// Before a scratch breaks off it narrows until only its finest part is left.
enum ScratchWear : std::size_t { kScratchWhole, kScratchNarrow, kScratchWorn };
using ScratchShapes = std::array<ScratchShape, 3>;

// The shapes of a profile, 0..kScratchProfiles − 1, with a section of 0..kScratchSections − 1.
[[nodiscard]] const ScratchShapes& ScratchShapesOf(bool isWhite, std::int32_t profile,
                                                   std::int32_t section) noexcept;

}  // namespace velmora::render
