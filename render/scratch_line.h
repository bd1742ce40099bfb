// A scratch as it lies in one frame: how strong it is, where it wavers and where it breaks off.
//
// The film moves on by one picture's height from frame to frame, and the scratches in it move along. Breaks are
// shorter than a frame, so each frame has new ones. The strength and wear of a scratch change over 10 to 200 frames,
// and its sway over 8 to 40. A scratch begins with flecks in the first frames of its life and breaks up in the last.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

#include "render/scratch_state.h"

namespace velmora::render {

// A roughness that all scratches share: within +-22528 and 0 on average, for any row from 0 on.
struct ScratchTexture {
    static constexpr std::int32_t kRows = 2048;
    static constexpr std::int32_t kRepeated =
        8;  // the first rows again, for reading some at once from any row
    std::array<std::int16_t, kRows + kRepeated> values{};

    [[nodiscard]] std::int32_t At(std::int32_t row) const noexcept {
        return values[static_cast<std::size_t>(row & (kRows - 1))];
    }
};

// Position and level at knots that divide the height evenly; the texture roughens the level row by row.
struct ScratchLine {
    static constexpr std::int32_t kSegments = 64;

    struct Knot {
        std::int32_t offset = 0;  // of the left edge from `pixel`, 1/256 pixels
        std::int32_t level = 0;   // before the texture: absent at 0 and below, whole from 65536 on
    };

    const ScratchShapes* shapes = nullptr;
    std::int32_t pixels = 0;  // of the shapes
    bool isWhite = false;
    std::int32_t pixel = 0;
    std::uint32_t strength = 0;    // where the scratch is whole, 0..65535
    std::int32_t roughness = 0;    // of the level, for a texture of 32768; 0..65534
    std::int32_t absentLevel = 0;  // at or below it the texture makes no row visible
    std::int32_t texture = 0;      // row of the texture at the frame's first row
    const ScratchTexture* rows = nullptr;
    std::int32_t shake = 0;  // of the edge from row to row, 1/256 pixels for a texture of 32768
    std::array<Knot, kSegments + 1> knots;
};

// A row of the picture between two knots: `part` / 4096, below 1, of the way from one to the next.
struct ScratchRowPlace {
    std::int32_t y;
    std::size_t knot;
    std::int32_t part;
};

// How far a scratch strays from its column, in 1/256 pixels: a few thousandths of the picture's size.
struct ScratchStray {
    std::int64_t sway, shiver, tilt;

    ScratchStray(std::int32_t width, std::int32_t height) noexcept;
};

struct ScratchView {
    std::int32_t frame = 0;  // within the life
    std::int32_t depth = 0;  // 0..65535
    bool isFirst = false;    // of the frame's scratches
};

// Sets everything in `line` except `pixel`, which the caller sets.
void LayScratch(const ScratchState& scratch, const ScratchView& view, const ScratchStray& stray,
                ScratchLine& line) noexcept;

}  // namespace velmora::render
