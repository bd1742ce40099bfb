// 64-byte forms, with byte permutations: a table of 256 bytes lies in four registers.

#include <immintrin.h>

#include "render/kernels.h"

#define VM_AVX512 __attribute__((target("avx512f,avx512bw,avx512vl,avx512vbmi")))

namespace velmora::render {
namespace {

constexpr std::int32_t kPixels = 16;  // in a register

// The mask of a row's last `left` pixels.
VM_AVX512 inline __mmask16 Tail(std::int32_t left) noexcept {
    return left >= kPixels ? static_cast<__mmask16>(0xFFFF) : static_cast<__mmask16>((1u << left) - 1u);
}

// `result` with the bytes of `mask` replaced by the table's entries for `bytes`.
VM_AVX512 inline __m512i LookUp(__m512i result, __mmask64 mask, __m512i bytes,
                                const ByteTable& table) noexcept {
    const std::uint8_t* entries = table.data();
    const __m512i low =
        _mm512_permutex2var_epi8(_mm512_load_si512(entries), bytes, _mm512_load_si512(entries + 64));
    const __m512i high =
        _mm512_permutex2var_epi8(_mm512_load_si512(entries + 128), bytes, _mm512_load_si512(entries + 192));
    const __mmask64 isHigh = _mm512_movepi8_mask(bytes);
    return _mm512_mask_mov_epi8(result, mask, _mm512_mask_blend_epi8(isHigh, low, high));
}

VM_AVX512 void TablesRow(const Bgra* in, Bgra* out, std::int32_t width,
                         const ChannelTables& tables) noexcept {
    constexpr __mmask64 kBlue = 0x1111111111111111u, kGreen = kBlue << 1, kRed = kBlue << 2;
    for (std::int32_t x = 0; x < width; x += kPixels) {
        const __mmask16 tail = Tail(width - x);
        const __m512i bytes = _mm512_maskz_loadu_epi32(tail, in + x);
        __m512i result = LookUp(bytes, kBlue, bytes, tables.blue);
        result = LookUp(result, kGreen, bytes, tables.green);
        result = LookUp(result, kRed, bytes, tables.red);
        _mm512_mask_storeu_epi32(out + x, tail, result);
    }
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

VM_AVX512 void MixRow(const Bgra* in, Bgra* out, std::int32_t width, std::int32_t weight) noexcept {
    constexpr __mmask64 kAlpha = 0x8888888888888888u;
    const __m512i zero = _mm512_setzero_si512();
    const __m512i luma = _mm512_set1_epi64(0x0000004C0095001E);  // 30, 149, 76, 0
    const __m512i u = _mm512_set1_epi16(static_cast<short>(-weight));
    for (std::int32_t x = 0; x < width; x += kPixels) {
        const __mmask16 tail = Tail(width - x);
        const __m512i pixels = _mm512_maskz_loadu_epi32(tail, in + x);
        const __m512i mixed = _mm512_packus_epi16(MixEight(_mm512_unpacklo_epi8(pixels, zero), luma, u),
                                                  MixEight(_mm512_unpackhi_epi8(pixels, zero), luma, u));
        _mm512_mask_storeu_epi32(out + x, tail, _mm512_mask_blend_epi8(kAlpha, mixed, pixels));
    }
}

// One channel of sixteen pixels, at `shift` of their words. Adding a half rounded down never lifts a number to
// the next whole one.
template <int kShift>
VM_AVX512 inline __m512i Lightened(__m512i pixels, __m512 fraction) noexcept {
    const __m512i byte = _mm512_set1_epi32(255);
    const __m512i channel = _mm512_and_si512(_mm512_srli_epi32(pixels, kShift), byte);
    const __m512 product = _mm512_mul_ps(fraction, _mm512_cvtepi32_ps(_mm512_sub_epi32(byte, channel)));
    const __m512 lifted =
        _mm512_add_round_ps(product, _mm512_set1_ps(0.5f), _MM_FROUND_TO_NEG_INF | _MM_FROUND_NO_EXC);
    // The sum stays below 256, so it can be added in place without a carry into the next channel.
    return _mm512_slli_epi32(_mm512_cvttps_epi32(lifted), kShift);
}

VM_AVX512 void WearRow(const Bgra* in, Bgra* out, std::int32_t width, const std::uint8_t* bytes,
                       float amount) noexcept {
    for (std::int32_t x = 0; x < width; x += kPixels) {
        const __mmask16 tail = Tail(width - x);
        const __m128i worn = _mm_maskz_loadu_epi8(tail, bytes + x);
        const __mmask16 touched = _mm_test_epi8_mask(worn, worn);
        if (touched == 0 && in == out) continue;
        const __m512i pixels = _mm512_maskz_loadu_epi32(tail, in + x);
        __m512i result = pixels;
        if (touched != 0) {
            const __m512 levels = _mm512_cvtepi32_ps(_mm512_cvtepu8_epi32(worn));
            const __m512 fraction =
                _mm512_mul_ps(_mm512_div_ps(levels, _mm512_set1_ps(255.0f)), _mm512_set1_ps(amount));
            result = _mm512_add_epi32(result, Lightened<0>(pixels, fraction));
            result = _mm512_add_epi32(result, Lightened<8>(pixels, fraction));
            result = _mm512_add_epi32(result, Lightened<16>(pixels, fraction));
        }
        _mm512_mask_storeu_epi32(out + x, tail, result);
    }
}

VM_AVX512 void CopyRow(const Bgra* in, Bgra* out, std::int32_t width) noexcept {
    for (std::int32_t x = 0; x < width; x += kPixels) {
        const __mmask16 tail = Tail(width - x);
        _mm512_mask_storeu_epi32(out + x, tail, _mm512_maskz_loadu_epi32(tail, in + x));
    }
}

}  // namespace

const RowKernels kAvx512Kernels = {TablesRow, MixRow, WearRow, CopyRow};

}  // namespace velmora::render
