#include "render/kernels.h"

#include <algorithm>
#include <cstring>

#include "render/simd/target.h"

namespace velmora::render {
namespace {

void TablesRow(const Bgra* in, Bgra* out, std::int32_t width, const ChannelTables& tables) noexcept {
    for (std::int32_t x = 0; x < width; ++x) {
        out[x] = {tables.blue[in[x].blue], tables.green[in[x].green], tables.red[in[x].red], in[x].alpha};
    }
}

void MixRow(const Bgra* in, Bgra* out, std::int32_t width, std::int32_t weight) noexcept {
    for (std::int32_t x = 0; x < width; ++x) out[x] = MixWithGrey(in[x], weight);
}

std::uint8_t Lightened(std::uint32_t channel, WearFactor factor) noexcept {
    return static_cast<std::uint8_t>(channel +
                                     ((((255 - channel) * 256 * factor.times >> 16) + factor.plus) >> 8));
}

void WearRow(const Bgra* in, Bgra* out, std::int32_t width, WearStrips strips,
             std::uint32_t channels) noexcept {
    const WearFactor* factors = nullptr;
    for (std::int32_t x = 0, left = 0; x < width; ++x, --left) {
        if (left == 0) factors = strips.Next(), left = strips.Width();
        const Bgra pixel = in[x];
        const WearFactor factor = *factors++, others = channels == kBlueChannel ? WearFactor{0, 0} : factor;
        out[x] = {Lightened(pixel.blue, factor), Lightened(pixel.green, others), Lightened(pixel.red, others),
                  pixel.alpha};
    }
}

void CopyRow(const Bgra* in, Bgra* out, std::int32_t width) noexcept {
    std::memmove(out, in, static_cast<std::size_t>(width) * sizeof(Bgra));
}

void NothingToEnd() noexcept {}

void ToneRow(const Bgra* in, Bgra* out, std::int32_t width, const Tone& tone) noexcept {
    ToneInPasses(TablesRow, MixRow, in, out, width, tone);
}

}  // namespace

const Kernels kPlainKernels = {ToneRow,          WearRow,     CopyRow,      CopyRow, NothingToEnd,
                               &kPlainScratches, &kPlainGlow, &kPlainYcbcr, nullptr};

namespace {

// In each half, from the second 16 bytes on.
template <std::size_t kSize>
void XorWithBytesBefore(std::array<std::uint8_t, kSize>& bytes) noexcept {
    for (std::size_t i = kSize; i-- > 16;) {
        if (i % (kSize / 2) >= 16) bytes[i] ^= bytes[i - 16];
    }
}

}  // namespace

void ShuffleTable::Set(const ByteTable& table) noexcept {
    differences = table;
    XorWithBytesBefore(differences);
    climbs = {};
    kind = Kind::kGentle;
    for (std::size_t group = 0; group < 16; ++group) SetGroup(group, table.data() + 16 * group);
    XorWithBytesBefore(climbs);
}

void ShuffleTable::SetGroup(std::size_t group, const std::uint8_t* entries) noexcept {
    steeps[group] = 0;
    for (const std::int32_t slope : {1, 2}) {
        const auto rest = [&](std::int32_t i) {
            return entries[i] - slope * (static_cast<std::int32_t>(16 * group) + i);
        };
        std::int32_t least = rest(0), most = rest(0);
        for (std::int32_t i = 1; i < 16; ++i) {
            least = std::min(least, rest(i));
            most = std::max(most, rest(i));
        }
        if (most - least > 15) continue;
        bases[group] = static_cast<std::uint8_t>(least);
        steeps[group] = slope == 2 ? 255 : 0;
        if (slope == 2) kind = std::max(kind, Kind::kSteep);
        for (std::int32_t i = 0; i < 16; ++i) {
            climbs[group % 8 * 16 + static_cast<std::size_t>(i)] |=
                static_cast<std::uint8_t>((rest(i) - least) << group / 8 * 4);
        }
        return;
    }
    kind = Kind::kAny;
}

void ChannelTables::Set(const ByteTable& b, const ByteTable& g, const ByteTable& r) noexcept {
    blue = b;
    green = g;
    red = r;
    blueShuffles.Set(b);
    greenShuffles.Set(g);
    redShuffles.Set(r);
    shuffles = std::max({blueShuffles.kind, greenShuffles.kind, redShuffles.kind});
    for (std::uint32_t i = 0; i < 256; ++i) {
        blueWord[i] = i ^ b[i];
        greenWord[i] = (i ^ g[i]) << 8;
        redWord[i] = (i ^ r[i]) << 16;
    }
}

SimdLevel BestSimdLevel() noexcept {
#if VM_IS_X86
    // Checks the processor and whether the operating system saves the wide registers.
    if (__builtin_cpu_supports("avx512f") && __builtin_cpu_supports("avx512bw") &&
        __builtin_cpu_supports("avx512vl") && __builtin_cpu_supports("avx512vbmi")) {
        return SimdLevel::kAvx512;
    }
    if (__builtin_cpu_supports("avx2")) return SimdLevel::kAvx2;
    if (__builtin_cpu_supports("ssse3")) return SimdLevel::kSsse3;
    if (__builtin_cpu_supports("sse2")) return SimdLevel::kSse2;
    return SimdLevel::kPlain;
#else
    // The instructions that the compiler was set to use are present.
    return VM_HAS_SSSE3 ? SimdLevel::kSsse3 : VM_HAS_SSE2 ? SimdLevel::kSse2 : SimdLevel::kPlain;
#endif
}

const Kernels& KernelsOf([[maybe_unused]] SimdLevel level) noexcept {
#if VM_HAS_AVX512
    if (level >= SimdLevel::kAvx512) return kAvx512Kernels;
#endif
#if VM_HAS_AVX2
    if (level >= SimdLevel::kAvx2) return kAvx2Kernels;
#endif
#if VM_HAS_SSSE3
    if (level >= SimdLevel::kSsse3) return kSsse3Kernels;
#endif
#if VM_HAS_SSE2
    if (level >= SimdLevel::kSse2) return kSse2Kernels;
#endif
    return kPlainKernels;
}

}  // namespace velmora::render
