// The row kernels that exist in several forms. All forms of a kernel give the same bytes; the stages' own
// Row functions are the plain ones that they are tested against.
//
// For all: `in` and `out` are rows of `width` >= 0 pixels without any alignment; `in` may be `out` but must
// not overlap it otherwise. Alpha is copied.
#pragma once

#include <array>
#include <cstdint>

#include "render/colour.h"
#include "render/cpu.h"
#include "render/image.h"

namespace velmora::render {

// One table a channel, prepared for the kernels.
struct ChannelTables {
    alignas(64) ByteTable blue;
    alignas(64) ByteTable green;
    alignas(64) ByteTable red;
    // The same, each entry at its channel's place in a pixel word: what the forms without byte permutations
    // look up.
    std::array<std::uint32_t, 256> blueWord;
    std::array<std::uint32_t, 256> greenWord;
    std::array<std::uint32_t, 256> redWord;

    void Set(const ByteTable& b, const ByteTable& g, const ByteTable& r) noexcept;
};

struct RowKernels {
    // Each channel through its table.
    void (*tables)(const Bgra* in, Bgra* out, std::int32_t width, const ChannelTables& tables) noexcept;
    // The saturation mix with weight w in -127..127 (render/colour.h), without a table.
    void (*mix)(const Bgra* in, Bgra* out, std::int32_t width, std::int32_t weight) noexcept;
    // Lightens all three channels of each pixel by the fraction of its wear byte, (byte / 255) * amount.
    void (*wear)(const Bgra* in, Bgra* out, std::int32_t width, const std::uint8_t* bytes,
                 float amount) noexcept;
    // Copies a row; `out` is not read again soon.
    void (*copy)(const Bgra* in, Bgra* out, std::int32_t width) noexcept;
};

// `form` must be one that the processor can run.
[[nodiscard]] const RowKernels& KernelsOf(Form form) noexcept;

// The forms, each in its own file.
// What the forms without byte permutations look tables up with.
void TablesRowByWords(const Bgra* in, Bgra* out, std::int32_t width, const ChannelTables& tables) noexcept;

extern const RowKernels kPlainKernels;
extern const RowKernels kSse2Kernels;
extern const RowKernels kAvx2Kernels;
extern const RowKernels kAvx512Kernels;

}  // namespace velmora::render
