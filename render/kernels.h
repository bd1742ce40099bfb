// The pixel kernels: row operations that exist at several SIMD levels. All levels of a kernel give the same bytes as
// the plain one.
//
// For tone, wear and copies: `in` and `out` are rows of `width` >= 0 pixels and need no alignment. `in` may be `out` but
// must not overlap it otherwise. Alpha is copied.
#pragma once

#include <array>
#include <cstdint>
#include <span>

#include "render/colour.h"
#include "render/simd/level.h"
#include "render/image.h"
#include "render/wear_factors.h"

namespace velmora::render {

// A table for lookups by byte shuffles, which find one of 16 entries. A group is 16 entries that follow one another.
struct ShuffleTable {
    // In each half of the table, the groups after the first are XORed with the group before.
    alignas(64) ByteTable differences;
    // A smooth table's entry i is i, or 2 i where the table is steep, plus the group's base and a climb of 0 to 15. Two
    // groups share 16 bytes: group g < 8 has the lower four bits, group g + 8 the upper ones. In each half, all but the
    // first 16 bytes are XORed with those before.
    alignas(64) std::array<std::uint8_t, 128> climbs;
    alignas(16) std::array<std::uint8_t, 16> bases;
    alignas(16) std::array<std::uint8_t, 16> steeps;  // 255 for steep groups, else 0
    enum class Kind {
        kGentle,
        kSteep,
        kAny
    } kind;  // a gentle table has no steep group, a table of any kind no climbs

    void Set(const ByteTable& table) noexcept;

  private:
    void SetGroup(std::size_t group, const std::uint8_t* entries) noexcept;
};

// One table per channel, prepared for the kernels.
struct ChannelTables {
    alignas(64) ByteTable blue;
    alignas(64) ByteTable green;
    alignas(64) ByteTable red;
    // For lookups by byte shuffles.
    ShuffleTable blueShuffles;
    ShuffleTable greenShuffles;
    ShuffleTable redShuffles;
    ShuffleTable::Kind shuffles;  // the last of the three tables' kinds
    // For lookups without byte shuffles: what each entry changes in a pixel word, by XOR, so that the other channels
    // and alpha stay.
    std::array<std::uint32_t, 256> blueWord;
    std::array<std::uint32_t, 256> greenWord;
    std::array<std::uint32_t, 256> redWord;

    void Set(const ByteTable& b, const ByteTable& g, const ByteTable& r) noexcept;
};

// The bits of a pixel word that wear may change.
inline constexpr std::uint32_t kBlueChannel = 0x000000FFu;
inline constexpr std::uint32_t kColourChannels = 0x00FFFFFFu;

// Tables, the saturation mix (render/colour.h, without its table) and tables again. At least one of them is present.
struct Tone {
    const ChannelTables* before = nullptr;
    bool mixes = false;
    std::int32_t weight = 0;  // of the mix, -127..127
    const ChannelTables* after = nullptr;
    std::span<const ToneLine> lines = {};  // one or two that give the same as `before`, or none

    [[nodiscard]] bool IsActive() const noexcept { return before != nullptr || mixes || after != nullptr; }
};

struct GlowKernels;
struct GlowPlanes;
struct GlowedTone;
struct YcbcrKernels;
struct ScratchKernels;

struct Kernels {
    // All steps of a tone. Its weight must be in -127..127.
    void (*tone)(const Bgra* in, Bgra* out, std::int32_t width, const Tone& tone) noexcept;
    // Lightens the channels of each pixel by its factor (render/wear_factors.h). `channels` is a pixel word with
    // 0xFF at each channel to change and 0 at alpha.
    void (*wear)(const Bgra* in, Bgra* out, std::int32_t width, WearStrips strips,
                 std::uint32_t channels) noexcept;
    // Copies a row.
    void (*copy)(const Bgra* in, Bgra* out, std::int32_t width) noexcept;
    // Copies a row that will not be read again soon, bypassing the caches if the level can. `in` must not be `out`.
    // After the last row of a frame, `endStream` makes the rows visible to other threads.
    void (*stream)(const Bgra* in, Bgra* out, std::int32_t width) noexcept;
    void (*endStream)() noexcept;
    const ScratchKernels* scratches;  // render/scratch_span.h
    const GlowKernels* glow;          // render/glow_kernels.h
    const YcbcrKernels* ycbcr;        // render/ycbcr.h
    const GlowedTone* glowedTone;     // null if the level has none
    bool tonesShortRows = false;      // `tone` handles a row's end with masks, not through a copy
};

// Glow and tone in one step, for layers in planes (render/glow_kernels.h).
struct GlowedTone {
    void (*split)(const std::uint16_t* near, const std::uint16_t* far, std::uint16_t* const planes[3],
                  std::int32_t count, std::int16_t share) noexcept;
    // Screens a row with the layer, then applies the tone.
    void (*tone)(const Bgra* in, Bgra* out, std::int32_t width, const Tone& tone,
                 const GlowPlanes& layer) noexcept;
};

// The kernels of a level. If this build lacks the level, the next lower one is used. The processor must support the
// result.
[[nodiscard]] const Kernels& KernelsOf(SimdLevel level) noexcept;

// The plain kernels. Their tone takes any weight.
extern const Kernels kPlainKernels;
extern const GlowKernels kPlainGlow;
extern const YcbcrKernels kPlainYcbcr;
extern const ScratchKernels kPlainScratches;

// Applies a tone's steps in separate passes over a row, which stays in the first-level cache.
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

// The tables of the levels that this build has, each in its own file.
extern const Kernels kSse2Kernels;
extern const Kernels kSsse3Kernels;
extern const Kernels kAvx2Kernels;
extern const Kernels kAvx512Kernels;

// Kernels that higher levels share, since longer vectors would not speed them up: a scratch is only a few pixels wide,
// and the glow layer is a quarter of the picture.
extern const ScratchKernels kSse2Scratches;
// With eight registers, most of a block of channels would be in memory, so that SSSE3 is no gain in 32 bits.
void ToneRowSse2(const Bgra* in, Bgra* out, std::int32_t width, const Tone& tone) noexcept;
extern const GlowKernels kAvx2Glow;
void SplitGlowAvx2(const std::uint16_t* near, const std::uint16_t* far, std::uint16_t* const planes[3],
                   std::int32_t count, std::int16_t share) noexcept;

}  // namespace velmora::render
