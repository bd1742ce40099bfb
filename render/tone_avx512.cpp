// Tables and saturation mix over 64 pixels, apart by channels: byte permutations, which look up a table that lies in
// four registers, then serve 64 bytes of one channel, and the mix needs no bytes of alpha.

#include <immintrin.h>

#include "render/kernels.h"

#define VM_AVX512 __attribute__((target("avx512f,avx512bw,avx512vl,avx512vbmi")))

namespace velmora::render {
namespace {

constexpr std::int32_t kBlock = 64;  // pixels

// 64 pixels, either as four registers of sixteen or as one register a channel, the pixels in an order of its own.
struct Block {
    __m512i v[4];
};

// Swaps rows and columns of the 4 × 4 words of each quarter.
VM_AVX512 inline Block Transposed(const Block& b) noexcept {
    const __m512i low01 = _mm512_unpacklo_epi32(b.v[0], b.v[1]),
                  low23 = _mm512_unpacklo_epi32(b.v[2], b.v[3]);
    const __m512i high01 = _mm512_unpackhi_epi32(b.v[0], b.v[1]),
                  high23 = _mm512_unpackhi_epi32(b.v[2], b.v[3]);
    return {{_mm512_unpacklo_epi64(low01, low23), _mm512_unpackhi_epi64(low01, low23),
             _mm512_unpacklo_epi64(high01, high23), _mm512_unpackhi_epi64(high01, high23)}};
}

// Gathers equal channels of four pixels in a word, or undoes it.
VM_AVX512 inline __m512i Regrouped(__m512i pixels) noexcept {
    return _mm512_shuffle_epi8(
        pixels, _mm512_broadcast_i32x4(_mm_setr_epi8(0, 4, 8, 12, 1, 5, 9, 13, 2, 6, 10, 14, 3, 7, 11, 15)));
}

VM_AVX512 inline Block ToChannels(Block b) noexcept {
    for (__m512i& v : b.v) v = Regrouped(v);
    return Transposed(b);
}

VM_AVX512 inline Block ToPixels(const Block& channels) noexcept {
    Block b = Transposed(channels);
    for (__m512i& v : b.v) v = Regrouped(v);
    return b;
}

VM_AVX512 inline __m512i LookUp(__m512i bytes, const ByteTable& table) noexcept {
    const std::uint8_t* entries = table.data();
    const __m512i low =
        _mm512_permutex2var_epi8(_mm512_load_si512(entries), bytes, _mm512_load_si512(entries + 64));
    const __m512i high =
        _mm512_permutex2var_epi8(_mm512_load_si512(entries + 128), bytes, _mm512_load_si512(entries + 192));
    return _mm512_mask_blend_epi8(_mm512_movepi8_mask(bytes), low, high);
}

VM_AVX512 inline void LookUpAll(Block& b, const ChannelTables& tables) noexcept {
    b.v[0] = LookUp(b.v[0], tables.blue);
    b.v[1] = LookUp(b.v[1], tables.green);
    b.v[2] = LookUp(b.v[2], tables.red);
}

// Two numbers of 8 bits, unsigned, in each word of 16; their products with these signed ones are added up.
VM_AVX512 inline __m512i Pair(int first, int second) noexcept {
    return _mm512_set1_epi16(static_cast<short>((first & 0xFF) | second * 256));
}

VM_AVX512 inline __m512i Luma(__m512i blueGreen, __m512i redGreen) noexcept {
    // 149 green in two parts: neither sum leaves 15 bits.
    return _mm512_srli_epi16(_mm512_add_epi16(_mm512_maddubs_epi16(blueGreen, Pair(30, 97)),
                                              _mm512_maddubs_epi16(redGreen, Pair(76, 52))),
                             8);
}

// 127 X + u (X - Y) with u = -w, saturating where the result is above white anyway.
VM_AVX512 inline __m512i Mixed(__m512i channelAndLuma, __m512i away) noexcept {
    const __m512i scaled = _mm512_maddubs_epi16(channelAndLuma, Pair(127, 0));
    return _mm512_srai_epi16(_mm512_adds_epi16(scaled, _mm512_maddubs_epi16(channelAndLuma, away)), 7);
}

VM_AVX512 inline void Mix(Block& b, std::int32_t weight) noexcept {
    const __m512i low = Luma(_mm512_unpacklo_epi8(b.v[0], b.v[1]), _mm512_unpacklo_epi8(b.v[2], b.v[1]));
    const __m512i high = Luma(_mm512_unpackhi_epi8(b.v[0], b.v[1]), _mm512_unpackhi_epi8(b.v[2], b.v[1]));
    const __m512i luma = _mm512_packus_epi16(low, high);
    const __m512i away = Pair(-weight, weight);
    for (int c = 0; c < 3; ++c) {
        b.v[c] = _mm512_packus_epi16(Mixed(_mm512_unpacklo_epi8(b.v[c], luma), away),
                                     Mixed(_mm512_unpackhi_epi8(b.v[c], luma), away));
    }
}

VM_AVX512 inline Block Toned(const Block& pixels, const Tone& tone) noexcept {
    Block b = ToChannels(pixels);
    if (tone.before != nullptr) LookUpAll(b, *tone.before);
    if (tone.mixes) Mix(b, tone.weight);
    if (tone.after != nullptr) LookUpAll(b, *tone.after);
    return ToPixels(b);
}

VM_AVX512 inline __mmask16 MaskOf(std::int32_t pixels) noexcept {
    return pixels >= 16  ? static_cast<__mmask16>(0xFFFF)
           : pixels <= 0 ? static_cast<__mmask16>(0)
                         : static_cast<__mmask16>((1u << pixels) - 1u);
}

}  // namespace

VM_AVX512 void ToneRowAvx512(const Bgra* in, Bgra* out, std::int32_t width, const Tone& tone) noexcept {
    std::int32_t x = 0;
    for (; x + kBlock <= width; x += kBlock) {
        Block b;
        for (int i = 0; i < 4; ++i) {
            FetchAhead(in + x + 16 * i);
            b.v[i] = _mm512_loadu_si512(in + x + 16 * i);
        }
        b = Toned(b, tone);
        for (int i = 0; i < 4; ++i) _mm512_storeu_si512(out + x + 16 * i, b.v[i]);
    }
    if (x == width) return;
    Block b;
    for (int i = 0; i < 4; ++i)
        b.v[i] = _mm512_maskz_loadu_epi32(MaskOf(width - x - 16 * i), in + x + 16 * i);
    b = Toned(b, tone);
    for (int i = 0; i < 4; ++i)
        _mm512_mask_storeu_epi32(out + x + 16 * i, MaskOf(width - x - 16 * i), b.v[i]);
}

}  // namespace velmora::render
