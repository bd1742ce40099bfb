// Where a scratch crosses one row of the picture, and how strongly.
#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>

#include "render/scratch_line.h"

namespace velmora::render {

// The levels toward which black and white scratches move a pixel, of 255. Both are inside the range, as on a print:
// dirt does not deepen its black, and its clear base is not whiter than its highlights. So black scratches fade into
// shadows and white ones into highlights.
inline constexpr std::int32_t kDarkest = 18;
inline constexpr std::int32_t kBrightest = 240;

struct ScratchSpan {
    std::int32_t first = 0;                  // pixel of the row, may be outside
    const std::uint16_t* weights = nullptr;  // ScratchLine::pixels of them, shares of 65536
    std::uint32_t strength = 0;              // of 65536
};

// Finds the scratch's part of a row; false if it has none.
//
// Only the first branch depends on the texture's rows: they are too irregular for branch prediction.
[[gnu::always_inline]] inline bool FindSpan(const ScratchLine& line, const ScratchRowPlace& place,
                                            ScratchSpan& span) noexcept {
    // Below these levels a scratch has lost some of its width, or all but a hairline.
    constexpr std::int32_t kNarrowing = 52000, kWorn = 34000;
    constexpr std::int32_t kShakeRows = 977;  // the edge's shake comes from another part of the texture
    const ScratchLine::Knot &from = line.knots[place.knot], &to = line.knots[place.knot + 1];
    const std::int32_t level = from.level + ((to.level - from.level) * place.part >> 12);
    if (level <= line.absentLevel) return false;
    const std::int32_t ragged = line.rows->At(line.texture + place.y) * line.roughness >> 15;
    const std::int32_t present = std::clamp(level + ragged, 0, 65535);
    span.strength = static_cast<std::uint32_t>(present) * line.strength >> 16;
    const std::int32_t shaken = line.rows->At(line.texture + place.y + kShakeRows) * line.shake >> 15;
    const std::int32_t edge = from.offset + ((to.offset - from.offset) * place.part >> 12) + shaken;
    span.first = line.pixel + (edge >> 8);
    const ScratchShape& shape =
        (*line.shapes)[std::size_t{present < kNarrowing} + std::size_t{present < kWorn}];
    span.weights = shape.weights[static_cast<std::size_t>((edge & 255) >> 3)].data();
    return true;
}

}  // namespace velmora::render
