// A scratch as it lies in one frame: how strong it is, where it wavers and where it breaks off.
//
// The film runs on by one picture's height from frame to frame, and what was scratched into it runs with it.
// Breaks are shorter than a frame and so are new in each one; how strong and how worn a scratch is changes over
// 10 to 200 frames, and its sway over 8 to 40. In the first frames of a life a scratch sets in with flecks, in
// the last ones it breaks up.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

#include "render/scratch_shape.h"
#include "render/scratch_state.h"

namespace velmora::render {

// A roughness that scratches share, at most 22528 either way and 0 on average, for any row from 0 on.
struct ScratchTexture {
    static constexpr std::int32_t kRows = 2048;
    std::array<std::int16_t, kRows> values{};

    [[nodiscard]] std::int32_t At(std::int32_t row) const noexcept {
        return values[static_cast<std::size_t>(row & (kRows - 1))];
    }
};

// Course and presence at knots that divide the height evenly; the texture roughens the presence row by row.
struct ScratchLine {
    static constexpr std::int32_t kSegments = 64;

    struct Knot {
        std::int32_t offset = 0;  // of the left edge from `pixel`, 1/256 pixels
        std::int32_t level = 0;   // absent at 0 and below, whole from 65536 on, before the texture
    };

    const ScratchShapes* shapes = nullptr;
    std::int32_t pixels = 0;  // of the shapes
    bool isWhite = false;
    std::int32_t pixel = 0;
    std::uint32_t strength = 0;    // where the scratch is whole, 0..65535
    std::int32_t roughness = 0;    // of the level, for a texture of 32768
    std::int32_t absentLevel = 0;  // up to it no row of the texture makes anything visible
    std::int32_t texture = 0;      // where in the texture the frame's first row lies
    const ScratchTexture* rows = nullptr;
    std::int32_t shake = 0;  // of the edge from row to row, 1/256 pixels for a texture of 32768
    std::array<Knot, kSegments + 1> knots;
};

// A row of the picture between two knots: `part` of 4096 of the way from one to the next.
struct ScratchRowPlace {
    std::int32_t y;
    std::size_t knot;
    std::int32_t part;
};

// How far a scratch strays from its column, in 1/256 pixels: some thousandths of the picture's size.
struct ScratchStray {
    std::int64_t sway, shiver, tilt;

    ScratchStray(std::int32_t width, std::int32_t height) noexcept;
};

struct ScratchView {
    std::int32_t frame = 0;  // one of the life's own
    std::int32_t depth = 0;  // 0..65535
    bool isFirst = false;    // of the frame's scratches
};

// Everything of `line` but `pixel`, which the caller sets.
void LayScratch(const ScratchState& scratch, const ScratchView& view, const ScratchStray& stray,
                ScratchLine& line) noexcept;

}  // namespace velmora::render
