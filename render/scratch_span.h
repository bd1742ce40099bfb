// Where a scratch crosses one row of the picture, and how strongly.
#pragma once

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>

#include "render/image.h"
#include "render/scratch_line.h"

namespace velmora::render {

// The levels toward which black and white scratches move a pixel, of 255. Both are inside the range, as on a print:
// dirt does not deepen its black, and its clear base is not whiter than its highlights. So black scratches fade into
// shadows and white ones into highlights.
inline constexpr std::int32_t kDarkest = 18;
inline constexpr std::int32_t kBrightest = 240;

struct ScratchSpan {
    std::int32_t first = 0;                  // pixel of the row, may be outside
    std::size_t place = 0;                   // of the weights in the line's shapes
    const std::uint16_t* weights = nullptr;  // ScratchLine::pixels of them, shares of 65536
    std::uint32_t strength = 0;              // of 65536
};

// Below these levels a scratch has lost some of its width, or all but a hairline.
inline constexpr std::int32_t kScratchNarrowing = 52000, kScratchWorn = 34000;
inline constexpr std::int32_t kShakeRows = 977;  // the edge's shake comes from another part of the texture

// Finds the scratch's part of a row; false if it has none.
//
// Only the first branch depends on the texture's rows: they are too irregular for branch prediction.
[[gnu::always_inline]] inline bool FindSpan(const ScratchLine& line, const ScratchRowPlace& place,
                                            ScratchSpan& span) noexcept {
    const ScratchLine::Knot &from = line.knots[place.knot], &to = line.knots[place.knot + 1];
    const std::int32_t level = from.level + ((to.level - from.level) * place.part >> 12);
    if (level <= line.absentLevel) return false;
    const std::int32_t ragged = line.rows->At(line.texture + place.y) * line.roughness >> 15;
    const std::int32_t present = std::clamp(level + ragged, 0, 65535);
    span.strength = static_cast<std::uint32_t>(present) * line.strength >> 16;
    const std::int32_t shaken = line.rows->At(line.texture + place.y + kShakeRows) * line.shake >> 15;
    const std::int32_t edge = from.offset + ((to.offset - from.offset) * place.part >> 12) + shaken;
    span.first = line.pixel + (edge >> 8);
    const std::size_t shape = std::size_t{present < kScratchNarrowing} + std::size_t{present < kScratchWorn};
    span.place = shape * kScratchPhases + static_cast<std::size_t>((edge & 255) >> 3);
    span.weights = line.shapes->WeightsAt(span.place);
    return true;
}

// Some rows that follow one another between the same two knots.
struct ScratchRows {
    static constexpr std::size_t kMost = 24;

    std::int32_t y = 0;  // of the first
    std::size_t knot = 0;
    std::size_t count = 0;
    alignas(16)
        std::array<std::int32_t, kMost> parts{};  // as in ScratchRowPlace; those after `count` are not used
};

// A scratch's parts of such rows.
struct ScratchSpans {
    static constexpr std::uint16_t kNone = 65535;

    alignas(16) std::array<std::int32_t, ScratchRows::kMost> first;  // as in ScratchSpan
    alignas(
        16) std::array<std::uint16_t, ScratchRows::kMost> place;  // of the weights (ScratchShapes), or kNone
    alignas(16) std::array<std::uint16_t, ScratchRows::kMost> strength;  // as in ScratchSpan
};

// The kernels of scratches. Finding the spans of many rows at once lets vectors do it.
struct ScratchKernels {
    void (*find)(const ScratchLine* lines, std::uint32_t count, const ScratchRows& rows,
                 ScratchSpans* spans) noexcept;
    // Draws the scratches' parts of the row `which` of those.
    void (*draw)(const ScratchLine* lines, const ScratchSpans* spans, std::uint32_t count, std::size_t which,
                 Bgra* row, std::int32_t width) noexcept;
};

}  // namespace velmora::render
