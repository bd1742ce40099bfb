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

// Four pixels at a time. Adding a half rounded down never lifts a number to the next whole one.
VM_AVX512 void WearRow(const Bgra* in, Bgra* out, std::int32_t width, const std::uint8_t* bytes,
                       const float* fractions) noexcept {
    constexpr __mmask16 kColour = 0x7777;
    const __m512i pixelOfLane = _mm512_setr_epi32(0, 0, 0, 0, 1, 1, 1, 1, 2, 2, 2, 2, 3, 3, 3, 3);
    const __m512i white = _mm512_set1_epi32(255);
    const __m512 half = _mm512_set1_ps(0.5f);
    std::int32_t x = 0;
    for (; x + 4 <= width; x += 4) {
        const __m128i pixels = _mm_loadu_si128(reinterpret_cast<const __m128i*>(in + x));
        const __m128i worn = _mm_cvtsi32_si128(static_cast<int>(
            bytes[x] | bytes[x + 1] << 8 | bytes[x + 2] << 16 | static_cast<unsigned>(bytes[x + 3]) << 24));
        __m128i result = pixels;
        if (_mm_cvtsi128_si32(worn) != 0) {
            const __m128 four = _mm_i32gather_ps(fractions, _mm_cvtepu8_epi32(worn), 4);
            const __m512 fraction =
                _mm512_maskz_permutexvar_ps(kColour, pixelOfLane, _mm512_castps128_ps512(four));
            const __m512i channels = _mm512_cvtepu8_epi32(pixels);
            const __m512 product =
                _mm512_mul_ps(fraction, _mm512_cvtepi32_ps(_mm512_sub_epi32(white, channels)));
            const __m512 lifted =
                _mm512_add_round_ps(product, half, _MM_FROUND_TO_NEG_INF | _MM_FROUND_NO_EXC);
            result = _mm512_cvtepi32_epi8(_mm512_add_epi32(channels, _mm512_cvttps_epi32(lifted)));
        }
        _mm_storeu_si128(reinterpret_cast<__m128i*>(out + x), result);
    }
    kPlainKernels.wear(in + x, out + x, width - x, bytes + x, fractions);
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
