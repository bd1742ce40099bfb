// Deep pictures: 16-bit and floating-point pixels, and a frame of them.
#pragma once

#include <cstddef>
#include <cstdint>

#include "render/image.h"

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

}  // namespace velmora::render
