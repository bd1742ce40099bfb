// Tables and saturation mix over 32 pixels, apart by channels: in-register look-ups, which know 16 entries each, then
// serve 32 bytes of one channel, and the mix needs no bytes of alpha.

#include <immintrin.h>

#include <algorithm>
#include <array>

#include "render/kernels.h"

#define VM_AVX2 __attribute__((target("avx2")))

namespace velmora::render {
namespace {

constexpr std::int32_t kBlock = 32;  // pixels

// 32 pixels, either as four registers of eight or as one register a channel, the pixels in an order of its own.
struct Block {
    __m256i v[4];
};

// Swaps rows and columns of the 4 × 4 words of each half. In place, as what follows: 32-bit builds copy blocks by
// halves of registers, and loads of whole ones then wait for both.
VM_AVX2 inline void Transpose(Block& b) noexcept {
    const __m256i low01 = _mm256_unpacklo_epi32(b.v[0], b.v[1]),
                  low23 = _mm256_unpacklo_epi32(b.v[2], b.v[3]);
    const __m256i high01 = _mm256_unpackhi_epi32(b.v[0], b.v[1]),
                  high23 = _mm256_unpackhi_epi32(b.v[2], b.v[3]);
    b.v[0] = _mm256_unpacklo_epi64(low01, low23);
    b.v[1] = _mm256_unpackhi_epi64(low01, low23);
    b.v[2] = _mm256_unpacklo_epi64(high01, high23);
    b.v[3] = _mm256_unpackhi_epi64(high01, high23);
}

// Gathers equal channels of four pixels in a word, or undoes it.
VM_AVX2 inline __m256i Regrouped(__m256i pixels) noexcept {
    return _mm256_shuffle_epi8(pixels, _mm256_broadcastsi128_si256(_mm_setr_epi8(0, 4, 8, 12, 1, 5, 9, 13, 2,
                                                                                 6, 10, 14, 3, 7, 11, 15)));
}

VM_AVX2 inline void Regroup(Block& b) noexcept {
    for (__m256i& v : b.v) v = Regrouped(v);
}

VM_AVX2 inline void LoadChannels(const Bgra* in, Block& b) noexcept {
    FetchAhead(in);
    FetchAhead(in + kBlock / 2);
    for (int i = 0; i < 4; ++i) b.v[i] = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(in + 8 * i));
    Regroup(b);
    Transpose(b);
}

VM_AVX2 inline void StoreChannels(Bgra* out, Block& b) noexcept {
    Transpose(b);
    Regroup(b);
    for (int i = 0; i < 4; ++i) _mm256_storeu_si256(reinterpret_cast<__m256i*>(out + 8 * i), b.v[i]);
}

VM_AVX2 inline __m256i Sixteen(const ByteTable& table, std::size_t first) noexcept {
    return _mm256_broadcastsi128_si256(
        _mm_load_si128(reinterpret_cast<const __m128i*>(table.data() + first)));
}

// Looks up 32 bytes in each of `kCount` registers. A look-up in 16 entries gives 0 where its index is negative: with 16
// less from step to step the differences add up to an entry of the right sixteen, of either half of the table at once.
template <std::size_t kCount>
VM_AVX2 inline void LookUp(__m256i* const (&bytes)[kCount], const ByteTable& differences) noexcept {
    const __m256i step = _mm256_set1_epi8(16);
    __m256i at[kCount], low[kCount], high[kCount];
    for (std::size_t k = 0; k < kCount; ++k) {
        at[k] = _mm256_and_si256(*bytes[k], _mm256_set1_epi8(127));
        low[k] = high[k] = _mm256_setzero_si256();
    }
    // Unrolled, each step's index would be made of the first one, by more numbers than there are registers.
#pragma GCC unroll 1
    for (std::size_t i = 0; i < 128; i += 16) {
        const __m256i lower = Sixteen(differences, i), upper = Sixteen(differences, 128 + i);
        for (std::size_t k = 0; k < kCount; ++k) {
            low[k] = _mm256_xor_si256(low[k], _mm256_shuffle_epi8(lower, at[k]));
            high[k] = _mm256_xor_si256(high[k], _mm256_shuffle_epi8(upper, at[k]));
            at[k] = _mm256_sub_epi8(at[k], step);
        }
    }
    for (std::size_t k = 0; k < kCount; ++k) *bytes[k] = _mm256_blendv_epi8(low[k], high[k], *bytes[k]);
}

// Entries are loaded for both blocks where there are registers for it.
VM_AVX2 inline void LookUpBoth(__m256i& first, __m256i& second, const ByteTable& differences) noexcept {
    constexpr bool kHasSixteenRegisters = sizeof(void*) == 8;
    if constexpr (kHasSixteenRegisters) {
        LookUp<2>({&first, &second}, differences);
    } else {
        LookUp<1>({&first}, differences);
        LookUp<1>({&second}, differences);
    }
}

VM_AVX2 inline void LookUpAll(Block& a, Block& b, const ChannelTables& tables) noexcept {
    LookUpBoth(a.v[0], b.v[0], tables.blueDifferences);
    LookUpBoth(a.v[1], b.v[1], tables.greenDifferences);
    LookUpBoth(a.v[2], b.v[2], tables.redDifferences);
}

struct Line {
    __m256i times, plus, minus;
    __m128i shift;

    VM_AVX2 explicit Line(const ToneLine& line) noexcept
        : times(_mm256_set1_epi16(static_cast<short>(line.times))),
          plus(_mm256_set1_epi16(static_cast<short>(line.plus))),
          minus(_mm256_set1_epi16(static_cast<short>(line.minus))),
          shift(_mm_cvtsi32_si128(line.shift)) {}

    VM_AVX2 __m256i At(__m256i upperBytes) const noexcept {
        const __m256i sum = _mm256_adds_epu16(_mm256_mulhi_epu16(upperBytes, times), plus);
        return _mm256_srl_epi16(_mm256_subs_epu16(sum, minus), shift);
    }
    VM_AVX2 __m256i Bytes(__m256i bytes) const noexcept {
        const __m256i zero = _mm256_setzero_si256();
        return _mm256_packus_epi16(At(_mm256_unpacklo_epi8(zero, bytes)),
                                   At(_mm256_unpackhi_epi8(zero, bytes)));
    }
};

// A tone's lines, one or two; for what has none, one that is not used.
class Lines {
  public:
    VM_AVX2 explicit Lines(std::span<const ToneLine> lines) noexcept
        : m_first(lines.empty() ? ToneLine{} : lines.front()),
          m_second(lines.empty() ? ToneLine{} : lines.back()),
          m_areTwo(lines.size() == 2) {}

    VM_AVX2 __m256i Bytes(__m256i bytes) const noexcept {
        const __m256i once = m_first.Bytes(bytes);
        return m_areTwo ? m_second.Bytes(once) : once;
    }
    VM_AVX2 void Put(Block& b) const noexcept {
        for (int c = 0; c < 3; ++c) b.v[c] = Bytes(b.v[c]);
    }

  private:
    Line m_first, m_second;
    bool m_areTwo;
};

// Two numbers of 8 bits, unsigned, in each word of 16; their products with these signed ones are added up.
VM_AVX2 inline __m256i Pair(int first, int second) noexcept {
    return _mm256_set1_epi16(static_cast<short>((first & 0xFF) | second * 256));
}

VM_AVX2 inline __m256i Luma(__m256i blueGreen, __m256i redGreen) noexcept {
    // 149 green in two parts: neither sum leaves 15 bits.
    return _mm256_srli_epi16(_mm256_add_epi16(_mm256_maddubs_epi16(blueGreen, Pair(30, 97)),
                                              _mm256_maddubs_epi16(redGreen, Pair(76, 52))),
                             8);
}

// 127 X + u (X - Y) with u = -w, saturating where the result is above white anyway.
VM_AVX2 inline __m256i Mixed(__m256i channelAndLuma, __m256i away) noexcept {
    const __m256i scaled = _mm256_maddubs_epi16(channelAndLuma, Pair(127, 0));
    return _mm256_srai_epi16(_mm256_adds_epi16(scaled, _mm256_maddubs_epi16(channelAndLuma, away)), 7);
}

VM_AVX2 inline void Mix(Block& b, std::int32_t weight) noexcept {
    const __m256i low = Luma(_mm256_unpacklo_epi8(b.v[0], b.v[1]), _mm256_unpacklo_epi8(b.v[2], b.v[1]));
    const __m256i high = Luma(_mm256_unpackhi_epi8(b.v[0], b.v[1]), _mm256_unpackhi_epi8(b.v[2], b.v[1]));
    const __m256i luma = _mm256_packus_epi16(low, high);
    const __m256i away = Pair(-weight, weight);
    for (int c = 0; c < 3; ++c) {
        b.v[c] = _mm256_packus_epi16(Mixed(_mm256_unpacklo_epi8(b.v[c], luma), away),
                                     Mixed(_mm256_unpackhi_epi8(b.v[c], luma), away));
    }
}

// Two blocks, so that entries are loaded for both.
VM_AVX2 inline void ToneTwo(Block& a, Block& b, const Tone& tone, const Lines& lines) noexcept {
    if (!tone.lines.empty()) {
        lines.Put(a);
        lines.Put(b);
    } else if (tone.before != nullptr) {
        LookUpAll(a, b, *tone.before);
    }
    if (tone.mixes) {
        Mix(a, tone.weight);
        Mix(b, tone.weight);
    }
    if (tone.after != nullptr) LookUpAll(a, b, *tone.after);
}

// Lines alone need no channels apart.
VM_AVX2 void LinesRow(const Bgra* in, Bgra* out, std::int32_t width, const Tone& tone) noexcept {
    const __m256i alpha = _mm256_set1_epi32(static_cast<int>(0xFF000000u));
    const Lines lines(tone.lines);
    std::int32_t x = 0;
    for (; x + 8 <= width; x += 8) {
        FetchAhead(in + x);
        const __m256i pixels = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(in + x));
        const __m256i toned = lines.Bytes(pixels);
        _mm256_storeu_si256(reinterpret_cast<__m256i*>(out + x), _mm256_blendv_epi8(toned, pixels, alpha));
    }
    kSse2Kernels.tone(in + x, out + x, width - x, tone);
}

}  // namespace

VM_AVX2 void ToneRowAvx2(const Bgra* in, Bgra* out, std::int32_t width, const Tone& tone) noexcept {
    if (!tone.lines.empty() && !tone.mixes && tone.after == nullptr) return LinesRow(in, out, width, tone);
    const Lines lines(tone.lines);
    const auto toneTwo = [&tone, &lines](const Bgra* from, Bgra* to) VM_AVX2 {
        Block a, b;
        LoadChannels(from, a);
        LoadChannels(from + kBlock, b);
        ToneTwo(a, b, tone, lines);
        StoreChannels(to, a);
        StoreChannels(to + kBlock, b);
    };
    std::int32_t x = 0;
    for (; x + 2 * kBlock <= width; x += 2 * kBlock) toneTwo(in + x, out + x);
    if (x == width) return;
    std::array<Bgra, 2 * kBlock> rest{};
    std::copy(in + x, in + width, rest.begin());
    toneTwo(rest.data(), rest.data());
    std::copy_n(rest.begin(), width - x, out + x);
}

}  // namespace velmora::render
