// Deep pictures: 16-bit and floating-point pixels. A frame passes through the same chain of stages (render/chain.h) as
// an 8-bit one, with the same settings and the same random draws, but in floating point from one end to the other.
// Nothing is rounded between the stages, so the result is the 8-bit one without its rounding and dither.
//
// A number that is not one counts as 0. Alpha is kept. Below black and above white the stages of the look continue in
// straight lines, unless their formulas are bounded (render/deep/deep_tone.h); damage moves a channel toward white or
// black and never beyond.
#pragma once

#include <cstddef>
#include <cstdint>

#include "render/frame_context.h"
#include "render/growing_memory.h"
#include "render/image.h"
#include "render/render_state.h"
#include "render/renderer.h"
#include "render/stage_settings.h"

namespace velmora::render {

enum class DeepSamples : std::uint8_t {
    kUnsigned16,  // 0 black, 65535 white, in the processor's byte order
    kFloat,       // 0 black, 1 white; values outside are kept
};

// Pixels are red, green, blue and, with four channels, alpha, in this order in memory and without gaps.
struct DeepFormat {
    DeepSamples samples = DeepSamples::kFloat;
    std::int32_t channels = 4;  // 3 or 4
    // The colours are multiplied by alpha. They are divided before the stages and multiplied again after them; where
    // alpha is 0 there is no colour, so such a pixel becomes black.
    bool isPremultiplied = false;

    [[nodiscard]] std::ptrdiff_t PixelBytes() const noexcept {
        return std::ptrdiff_t{channels} * (samples == DeepSamples::kFloat ? 4 : 2);
    }
};

// Rows of pixels, not owned. Rows and pixels must be aligned to their samples.
struct DeepPicture {
    void* pixels = nullptr;  // the first pixel of row 0, from which rows, shifts and positions are counted
    std::ptrdiff_t rowStep =
        0;  // bytes from one row to the next, negative if row 0 is at the highest address

    [[nodiscard]] std::uint8_t* Row(std::int32_t y) const noexcept {
        return static_cast<std::uint8_t*>(pixels) + rowStep * y;
    }
};

// A frame to render. The destination may be the source, or overlap it: the result is then as if the source had been
// copied first.
struct DeepFrame {
    std::int32_t width = 0;
    std::int32_t height = 0;
    DeepFormat format;        // of both pictures
    DeepPicture source;       // not written unless it is the destination
    DeepPicture destination;  // nothing outside the window is written
    // The part of the frame to render, not empty. Jitter and glow read the whole source; without them nothing outside
    // the window is read. Windows that make up a frame give the bytes of the frame rendered at once.
    Rectangle window{};

    // Everything in one call: the window is the whole frame.
    [[nodiscard]] static DeepFrame Whole(std::int32_t width, std::int32_t height, const DeepFormat& format,
                                         const DeepPicture& source, const DeepPicture& destination) noexcept {
        return {width, height, format, source, destination, {0, height, 0, width}};
    }
    // Sizes, steps, alignment and window are as described above.
    [[nodiscard]] bool IsValid() const noexcept;
};

// What deep rendering keeps from frame to frame, so that frames of one size allocate once.
struct DeepMemory {
    GrowingMemory<float> glow;
    GrowingMemory<std::uint8_t> copy;  // of the source, for frames rendered in place
};

// Renders the window of a frame. The frame must be valid and the random state must have been started for it;
// `context`, made of the frame's size, has its time. Without memory for glow the picture gets none; without memory for
// a copy of a source that the destination overlaps, nothing is written and the result is false.
//
// Allocates only for the first frame of a size. Frames rendered at the same time need a state and a memory each.
[[nodiscard]] bool RenderDeep(const DeepFrame& frame, const FrameContext& context,
                              const StageSettings& settings, RenderState& state, DeepMemory& memory,
                              const RenderOptions& options = {}) noexcept;

}  // namespace velmora::render
