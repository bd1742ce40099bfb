// The row kernels that exist in several forms. All forms of a kernel give the same bytes; the stages' own
// Row functions are the plain ones that they are tested against.
//
// For all: `in` and `out` are rows of `width` >= 0 pixels without any alignment; `in` may be `out` but must
// not overlap it otherwise. Alpha is copied.
#pragma once

#include <array>
#include <cstdint>
#include <limits>
#include <span>

#include "render/colour.h"
#include "render/simd/level.h"
#include "render/image.h"
#include "render/tone_line.h"
#include "render/wear_factors.h"

namespace velmora::render {

// One table a channel, prepared for the kernels.
struct ChannelTables {
    alignas(64) ByteTable blue;
    alignas(64) ByteTable green;
    alignas(64) ByteTable red;
    // What the 32-byte form looks up: in each half of a table, all but the first 16 entries as their difference (the
    // bits that are not equal) from the one 16 before.
    alignas(16) ByteTable blueDifferences;
    alignas(16) ByteTable greenDifferences;
    alignas(16) ByteTable redDifferences;
    // What the 16-byte form looks up: each entry at its channel's place in a pixel word.
    std::array<std::uint32_t, 256> blueWord;
    std::array<std::uint32_t, 256> greenWord;
    std::array<std::uint32_t, 256> redWord;

    void Set(const ByteTable& b, const ByteTable& g, const ByteTable& r) noexcept;
};

// What wear may change of a pixel word.
inline constexpr std::uint32_t kBlueChannel = 0x000000FFu;
inline constexpr std::uint32_t kColourChannels = 0x00FFFFFFu;

// Tables, the saturation mix (render/colour.h, without its table) and tables again, of which at least one is there.
struct Tone {
    const ChannelTables* before = nullptr;
    bool mixes = false;
    std::int32_t weight = 0;  // of the mix, -127..127
    const ChannelTables* after = nullptr;
    std::span<const ToneLine> lines = {};  // one or two that give the same as `before`, if there are

    [[nodiscard]] bool IsActive() const noexcept { return before != nullptr || mixes || after != nullptr; }
};

struct RowKernels {
    // All steps of a tone.
    void (*tone)(const Bgra* in, Bgra* out, std::int32_t width, const Tone& tone) noexcept;
    // Lightens the channels of each pixel by its factor (render/wear_factors.h). `channels` is a pixel word with
    // 0xFF at each channel that is to change, 0 at alpha.
    void (*wear)(const Bgra* in, Bgra* out, std::int32_t width, WearStrips strips,
                 std::uint32_t channels) noexcept;
    // Copies a row.
    void (*copy)(const Bgra* in, Bgra* out, std::int32_t width) noexcept;
    // Copies a row to where it is not read again soon: past the caches, in a form that can. `in` must not be
    // `out`. After the last row of a frame `endStream` makes the rows seen by other threads.
    void (*stream)(const Bgra* in, Bgra* out, std::int32_t width) noexcept;
    void (*endStream)() noexcept;
};

// `form` must be one that the processor can run.
[[nodiscard]] const RowKernels& KernelsOf(SimdLevel level) noexcept;

// A tone's steps one after the other over a row, which the nearest cache holds.
template <typename Tables, typename Mix>
void ToneInPasses(Tables&& tables, Mix&& mix, const Bgra* in, Bgra* out, std::int32_t width,
                  const Tone& tone) noexcept {
    if (tone.before != nullptr) {
        tables(in, out, width, *tone.before);
        in = out;
    }
    if (tone.mixes) {
        mix(in, out, width, tone.weight);
        in = out;
    }
    if (tone.after != nullptr) tables(in, out, width, *tone.after);
}

// The forms, each in its own file.
// Asks for pixels that a row's kernel comes to soon, where they lie in memory. The processor does so by itself as
// long as a row is all that it reads; wear's factors, read here and there, keep it from that. Past a frame's end
// nothing happens.
inline void FetchAhead(const Bgra* pixels) noexcept {
    constexpr std::uintptr_t kBytes = 5120;
    constexpr int kToRead = 0, kIntoSecondCache = 2;
    __builtin_prefetch(reinterpret_cast<const void*>(reinterpret_cast<std::uintptr_t>(pixels) + kBytes),
                       kToRead, kIntoSecondCache);
}

// How many pixels before the first one at a multiple of `bytes`; as good as never when none lies at one.
[[nodiscard]] inline std::int32_t PixelsToBoundary(const Bgra* pixels, std::uintptr_t bytes) noexcept {
    const std::uintptr_t away = (bytes - reinterpret_cast<std::uintptr_t>(pixels) % bytes) % bytes;
    constexpr std::int32_t kNever = std::numeric_limits<std::int32_t>::max();
    return away % sizeof(Bgra) == 0 ? static_cast<std::int32_t>(away / sizeof(Bgra)) : kNever;
}

extern const RowKernels kPlainKernels;
extern const RowKernels kSse2Kernels;
extern const RowKernels kAvx2Kernels;
extern const RowKernels kAvx512Kernels;
// The tones of the last two, in files of their own.
void ToneRowAvx2(const Bgra* in, Bgra* out, std::int32_t width, const Tone& tone) noexcept;
void ToneRowAvx512(const Bgra* in, Bgra* out, std::int32_t width, const Tone& tone) noexcept;

}  // namespace velmora::render
