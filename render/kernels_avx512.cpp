// 64-byte forms, with byte permutations: a table of 256 bytes lies in four registers.

#include <immintrin.h>

#include <algorithm>

#include "render/kernels.h"

#define VM_AVX512 __attribute__((target("avx512f,avx512bw,avx512vl,avx512vbmi")))

namespace velmora::render {
namespace {

constexpr std::int32_t kPixels = 16;  // in a register
constexpr __mmask64 kBlue = 0x1111111111111111u, kGreen = kBlue << 1, kRed = kBlue << 2, kAlpha = kBlue << 3;

// Calls step(pixels, x, mask) for each 16 pixels of a row from column x on, the mask telling which of them there
// are, and stores what it returns.
template <typename Step>
VM_AVX512 inline void ForEachSixteen(const Bgra* in, Bgra* out, std::int32_t width,
                                     const Step& step) noexcept {
    std::int32_t x = 0;
    for (; x + kPixels <= width; x += kPixels) {
        const __m512i pixels = _mm512_loadu_si512(in + x);
        _mm512_storeu_si512(out + x, step(pixels, x, static_cast<__mmask16>(0xFFFF)));
    }
    if (x == width) return;
    const __mmask16 tail = static_cast<__mmask16>((1u << (width - x)) - 1u);
    const __m512i pixels = _mm512_maskz_loadu_epi32(tail, in + x);
    _mm512_mask_storeu_epi32(out + x, tail, step(pixels, x, tail));
}

// The bytes of `mask` replaced by the table's entries for them; `isHigh` tells the bytes above 127. A byte that
// was replaced must not be in the mask of a later call.
VM_AVX512 inline __m512i LookUp(__m512i bytes, __mmask64 mask, __mmask64 isHigh,
                                const ByteTable& table) noexcept {
    const std::uint8_t* entries = table.data();
    const __mmask64 low = _kandn_mask64(isHigh, mask), high = _kand_mask64(isHigh, mask);
    bytes = _mm512_mask2_permutex2var_epi8(_mm512_load_si512(entries), bytes, low,
                                           _mm512_load_si512(entries + 64));
    return _mm512_mask2_permutex2var_epi8(_mm512_load_si512(entries + 128), bytes, high,
                                          _mm512_load_si512(entries + 192));
}

struct TablesStep {
    const ChannelTables& tables;
    VM_AVX512 __m512i operator()(__m512i pixels, std::int32_t, __mmask16) const noexcept {
        const __mmask64 isHigh = _mm512_movepi8_mask(pixels);
        if (tables.areEqual) return LookUp(pixels, ~kAlpha, isHigh, tables.blue);
        __m512i result = LookUp(pixels, kBlue, isHigh, tables.blue);
        result = LookUp(result, kGreen, isHigh, tables.green);
        return LookUp(result, kRed, isHigh, tables.red);
    }
};

VM_AVX512 void TablesRow(const Bgra* in, Bgra* out, std::int32_t width,
                         const ChannelTables& tables) noexcept {
    ForEachSixteen(in, out, width, TablesStep{tables});
}

// As in the 16-byte form, eight pixels at a time.
VM_AVX512 inline __m512i MixEight(__m512i channels, __m512i luma, __m512i u) noexcept {
    const __m512i products = _mm512_madd_epi16(channels, luma);
    const __m512i sum =
        _mm512_srli_epi32(_mm512_add_epi32(products, _mm512_shuffle_epi32(products, _MM_PERM_CDAB)), 8);
    const __m512i grey = _mm512_or_si512(sum, _mm512_slli_epi32(sum, 16));
    const __m512i away = _mm512_mullo_epi16(_mm512_sub_epi16(channels, grey), u);
    const __m512i scaled = _mm512_sub_epi16(_mm512_slli_epi16(channels, 7), channels);
    return _mm512_srai_epi16(_mm512_adds_epi16(scaled, away), 7);
}

struct MixStep {
    std::int32_t weight;
    VM_AVX512 __m512i operator()(__m512i pixels, std::int32_t, __mmask16) const noexcept {
        const __m512i zero = _mm512_setzero_si512();
        const __m512i luma = _mm512_set1_epi64(0x0000004C0095001E);  // 30, 149, 76, 0
        const __m512i u = _mm512_set1_epi16(static_cast<short>(-weight));
        const __m512i mixed = _mm512_packus_epi16(MixEight(_mm512_unpacklo_epi8(pixels, zero), luma, u),
                                                  MixEight(_mm512_unpackhi_epi8(pixels, zero), luma, u));
        return _mm512_mask_blend_epi8(kAlpha, mixed, pixels);
    }
};

VM_AVX512 void MixRow(const Bgra* in, Bgra* out, std::int32_t width, std::int32_t weight) noexcept {
    ForEachSixteen(in, out, width, MixStep{weight});
}

template <bool kBefore, bool kAfter>
struct MixedToneStep {
    const Tone& tone;
    VM_AVX512 __m512i operator()(__m512i pixels, std::int32_t x, __mmask16 mask) const noexcept {
        if constexpr (kBefore) pixels = TablesStep{*tone.before}(pixels, x, mask);
        pixels = MixStep{tone.weight}(pixels, x, mask);
        if constexpr (kAfter) pixels = TablesStep{*tone.after}(pixels, x, mask);
        return pixels;
    }
};

VM_AVX512 void ToneRow(const Bgra* in, Bgra* out, std::int32_t width, const Tone& tone) noexcept {
    if (!tone.mixes) return ToneInPasses(kAvx512Kernels, in, out, width, tone);
    if (tone.before == nullptr) {
        if (tone.after == nullptr) return MixRow(in, out, width, tone.weight);
        return ForEachSixteen(in, out, width, MixedToneStep<false, true>{tone});
    }
    if (tone.after == nullptr) return ForEachSixteen(in, out, width, MixedToneStep<true, false>{tone});
    ForEachSixteen(in, out, width, MixedToneStep<true, true>{tone});
}

// R(a room) of one channel, as a byte at the channel's place of each pixel of `result`.
//
// 2^23 and the room make a float whose last byte is the room: fused, the product with a less a 2^23 is rounded
// once, as the product with the room would be. Then a half is added. In 2^22 and such a sum, rounded down, the
// last bit stands for a half, so that the byte above it is the number wanted.
template <int kChannel>
VM_AVX512 inline __m512i Lightened(__m512i result, __m512i room, __m512 fraction, __m512 lifted) noexcept {
    constexpr __mmask64 kFirst = kBlue, kThis = kBlue << kChannel;
    const __m512i first = _mm512_set_epi32(12, 8, 4, 0, 12, 8, 4, 0, 12, 8, 4, 0, 12, 8, 4, 0);
    const __m512i from = _mm512_add_epi8(first, _mm512_set1_epi8(kChannel));
    const __m512i number = _mm512_mask_shuffle_epi8(_mm512_set1_epi32(0x4B000000), kFirst, room, from);
    const __m512 product = _mm512_fmsub_ps(fraction, _mm512_castsi512_ps(number), lifted);
    const __m512 sum =
        _mm512_add_round_ps(product, _mm512_set1_ps(4194304.5f), _MM_FROUND_TO_NEG_INF | _MM_FROUND_NO_EXC);
    // Bits 1 to 8 of either half of 64 bits, at the channel's byte.
    const __m512i bits = _mm512_set1_epi64(0x2121212101010101);
    return _mm512_mask_multishift_epi64_epi8(result, kThis, bits, _mm512_castps_si512(sum));
}

struct WearStep {
    const float* fractions;
    __m512i channels;
    VM_AVX512 __m512i operator()(__m512i pixels, std::int32_t x, __mmask16 mask) const noexcept {
        const __m512 fraction = _mm512_maskz_loadu_ps(mask, fractions + x);
        const __m512 lifted = _mm512_mul_ps(fraction, _mm512_set1_ps(8388608.0f));
        const __m512i room = _mm512_andnot_si512(pixels, channels);
        __m512i result = Lightened<0>(_mm512_setzero_si512(), room, fraction, lifted);
        result = Lightened<1>(result, room, fraction, lifted);
        result = Lightened<2>(result, room, fraction, lifted);
        return _mm512_add_epi8(pixels, result);
    }
};

VM_AVX512 void WearRow(const Bgra* in, Bgra* out, std::int32_t width, const float* fractions,
                       std::uint32_t channels) noexcept {
    ForEachSixteen(in, out, width, WearStep{fractions, _mm512_set1_epi32(static_cast<int>(channels))});
}

struct CopyStep {
    VM_AVX512 __m512i operator()(__m512i pixels, std::int32_t, __mmask16) const noexcept { return pixels; }
};

VM_AVX512 void CopyRow(const Bgra* in, Bgra* out, std::int32_t width) noexcept {
    ForEachSixteen(in, out, width, CopyStep{});
}

VM_AVX512 void StreamRow(const Bgra* in, Bgra* out, std::int32_t width) noexcept {
    std::int32_t x = std::min(PixelsToBoundary(out, 64), width);
    CopyRow(in, out, x);
    for (; x + kPixels <= width; x += kPixels) {
        _mm512_stream_si512(reinterpret_cast<__m512i*>(out + x), _mm512_loadu_si512(in + x));
    }
    CopyRow(in + x, out + x, width - x);
}

void EndStream() noexcept {
    _mm_sfence();
}

}  // namespace

const RowKernels kAvx512Kernels = {TablesRow, MixRow, ToneRow, WearRow, CopyRow, StreamRow, EndStream};

}  // namespace velmora::render
