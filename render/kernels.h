// The pixel kernels: what works on whole rows and exists at several SIMD levels. All levels of a kernel give the same
// bytes, those of the plain one.
//
// For tone, wear, copies and scratches: `in` and `out` are rows of `width` >= 0 pixels without any alignment; `in` may
// be `out` but must not overlap it otherwise. Alpha is copied.
#pragma once

#include <array>
#include <cstdint>
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
    // What byte shuffles look up: in each half of a table, all but the first 16 entries as their difference (the
    // bits that are not equal) from the one 16 before.
    alignas(16) ByteTable blueDifferences;
    alignas(16) ByteTable greenDifferences;
    alignas(16) ByteTable redDifferences;
    // What is looked up without byte shuffles: each entry at its channel's place in a pixel word.
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

struct GlowKernels;
struct YcbcrKernels;
struct ScratchLine;
struct ScratchRowPlace;

struct Kernels {
    // All steps of a tone, whose weight must lie in -127..127.
    void (*tone)(const Bgra* in, Bgra* out, std::int32_t width, const Tone& tone) noexcept;
    // Lightens the channels of each pixel by its factor (render/wear_factors.h). `channels` is a pixel word with
    // 0xFF at each channel that is to change, 0 at alpha.
    void (*wear)(const Bgra* in, Bgra* out, std::int32_t width, WearStrips strips,
                 std::uint32_t channels) noexcept;
    // Draws a row's part of some scratches.
    void (*scratches)(const ScratchLine* lines, std::uint32_t count, Bgra* row, std::int32_t width,
                      const ScratchRowPlace& place) noexcept;
    // Copies a row.
    void (*copy)(const Bgra* in, Bgra* out, std::int32_t width) noexcept;
    // Copies a row to where it is not read again soon: past the caches, at a level that can. `in` must not be
    // `out`. After the last row of a frame `endStream` makes the rows seen by other threads.
    void (*stream)(const Bgra* in, Bgra* out, std::int32_t width) noexcept;
    void (*endStream)() noexcept;
    const GlowKernels* glow;    // render/glow_kernels.h
    const YcbcrKernels* ycbcr;  // render/ycbcr.h
};

// The kernels of a level. One that this build does not have gives those of the next lower one that it has; the
// processor must be able to run them.
[[nodiscard]] const Kernels& KernelsOf(SimdLevel level) noexcept;

// The plain kernels. This one's tone takes any weight.
extern const Kernels kPlainKernels;
extern const GlowKernels kPlainGlow;
extern const YcbcrKernels kPlainYcbcr;
void DrawScratchesPlain(const ScratchLine* lines, std::uint32_t count, Bgra* row, std::int32_t width,
                        const ScratchRowPlace& place) noexcept;

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

}  // namespace velmora::render
