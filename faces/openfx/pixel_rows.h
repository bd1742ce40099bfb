// Between the host's pixels and those that the effects work on.
#pragma once

#include <cstddef>
#include <cstdint>

#include "faces/openfx/host_image.h"
#include "faces/openfx/plugin_params.h"

namespace velmora::hosts::openfx {

// How a picture is rendered.
enum class WorkKind : std::uint8_t {
    kBytes,   // blue, green, red, alpha: the library's own pixels
    kShorts,  // the host's channels, 16 bits
    kFloats,  // the host's channels, display values
};

// What is done to a picture's pixels before and after rendering.
struct PixelFormat {
    PixelFormat(const HostImage& image, WorkingSpace workingSpace) noexcept;

    Depth depth;
    int channels;  // 3 or 4
    WorkKind work = WorkKind::kFloats;
    WorkingSpace space;
    // The colours are divided by alpha before, and multiplied after, by these functions; or by the renderer.
    bool isDividedHere = false;
    bool isDividedByRenderer = false;

    [[nodiscard]] std::size_t HostBytes() const noexcept {
        return static_cast<std::size_t>(channels) * static_cast<std::size_t>(SampleBytes(depth));
    }
    [[nodiscard]] std::size_t WorkBytes() const noexcept {
        return work == WorkKind::kBytes
                   ? 4
                   : static_cast<std::size_t>(channels) * (work == WorkKind::kShorts ? 2 : 4);
    }
};

// `count` pixels of the host's into a working row. The rows do not overlap.
void LoadRow(const PixelFormat& format, const std::byte* host, std::byte* work, int count) noexcept;

// A working row, which is used up, into the host's pixels, mixed into `original`, which are the source's pixels: `share`
// has the share of the result, 0..1, for each pixel; null: 1 everywhere. `original` and `host` may be the same.
void StoreRow(const PixelFormat& format, std::byte* work, const std::byte* original, const float* share,
              std::byte* host, int count) noexcept;

// The alpha of `count` pixels, 0..1, times `times`.
void AlphaRow(const HostImage& mask, const std::byte* host, float times, float* out, int count) noexcept;

}  // namespace velmora::hosts::openfx
