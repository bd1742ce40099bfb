// 64-byte forms.

#include <immintrin.h>

#include <algorithm>

#include "render/kernels.h"

#define VM_AVX512 __attribute__((target("avx512f,avx512bw,avx512vl,avx512vbmi")))

namespace velmora::render {
namespace {

constexpr std::int32_t kPixels = 16;  // in a register

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

// R(a room) of one channel, as a byte at the channel's place of each pixel.
//
// 2^23 and the room make a float whose last byte is the room: fused, the product with a less a 2^23 is rounded
// once, as the product with the room would be. Then a half is added. In 2^22 and such a sum, rounded down, the
// last bit stands for a half, so that the byte above it is the number wanted.
template <int kChannel>
VM_AVX512 inline __m512i Lightened(__m512i room, __m512 fraction, __m512 lifted) noexcept {
    // No masks of 64 bits here: where registers have 32, one is made anew for every use.
    const __m512i places = _mm512_broadcast_i32x4(_mm_setr_epi32(0x00, 0x04, 0x08, 0x0C));
    const __m512i from = _mm512_or_si512(places, _mm512_set1_epi32(static_cast<int>(0x80808000u | kChannel)));
    const __m512i number = _mm512_or_si512(_mm512_shuffle_epi8(room, from), _mm512_set1_epi32(0x4B000000));
    const __m512 product = _mm512_fmsub_ps(fraction, _mm512_castsi512_ps(number), lifted);
    const __m512 sum =
        _mm512_add_round_ps(product, _mm512_set1_ps(4194304.5f), _MM_FROUND_TO_NEG_INF | _MM_FROUND_NO_EXC);
    // Of either half of 64 bits: bits 1 to 8 at the channel's byte, at the others some of the bits above, which are 0.
    constexpr std::uint64_t kZeroBits = 0x2929292909090909u,
                            kChannelByte = std::uint64_t{0xFF} << 8 * kChannel;
    constexpr std::uint64_t kPlaces = kChannelByte | kChannelByte << 32;
    const __m512i bits = _mm512_set1_epi64(
        static_cast<std::int64_t>((kZeroBits & ~kPlaces) | (0x2121212101010101u & kPlaces)));
    return _mm512_multishift_epi64_epi8(bits, _mm512_castps_si512(sum));
}

VM_AVX512 inline __m512i Worn(__m512i pixels, __m512 fraction, __m512i channels) noexcept {
    const __m512 lifted = _mm512_mul_ps(fraction, _mm512_set1_ps(8388608.0f));
    const __m512i room = _mm512_andnot_si512(pixels, channels);
    const __m512i blue = Lightened<0>(room, fraction, lifted), green = Lightened<1>(room, fraction, lifted);
    const __m512i result =
        _mm512_or_si512(_mm512_or_si512(blue, green), Lightened<2>(room, fraction, lifted));
    return _mm512_add_epi8(pixels, result);
}

struct WearStep {
    const float* fractions;
    __m512i channels;
    VM_AVX512 __m512i operator()(__m512i pixels, std::int32_t x, __mmask16 mask) const noexcept {
        return Worn(pixels, _mm512_maskz_loadu_ps(mask, fractions + x), channels);
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

// The next sixteen fractions of strips; where a strip ends within them, the next one goes on.
struct StripReader {
    const float* const* strips;
    std::int32_t stripWidth;
    const float* next = *strips;
    std::int32_t left = stripWidth;  // of the strip

    VM_AVX512 __m512 Read(std::int32_t count) noexcept {
        if (left >= count) {
            const __m512 whole = _mm512_maskz_loadu_ps(FirstLanes(count), next);
            next += kPixels;
            left -= kPixels;
            return whole;
        }
        const __mmask16 mask = FirstLanes(left);
        const __m512 before = _mm512_maskz_loadu_ps(mask, next);
        const float* const following = *++strips;
        // Only lanes behind `left` are read: where they are in memory is where they belong in the register.
        const auto start =
            reinterpret_cast<std::uintptr_t>(following) - sizeof(float) * static_cast<std::uintptr_t>(left);
        const __m512 both =
            _mm512_mask_loadu_ps(before, static_cast<__mmask16>(~mask), reinterpret_cast<const void*>(start));
        next = following + (kPixels - left);
        left += stripWidth - kPixels;
        return both;
    }

    VM_AVX512 static __mmask16 FirstLanes(std::int32_t count) noexcept {
        return static_cast<__mmask16>((1u << count) - 1u);
    }
};

VM_AVX512 void WearStrips(const Bgra* in, Bgra* out, std::int32_t width, const float* const* strips,
                          std::int32_t stripWidth, std::uint32_t channels) noexcept {
    if (width == 0) return;
    StripReader reader = {strips, stripWidth};
    const __m512i changing = _mm512_set1_epi32(static_cast<int>(channels));
    std::int32_t x = 0;
    for (; x + kPixels <= width; x += kPixels) {
        const __m512i pixels = _mm512_loadu_si512(in + x);
        _mm512_storeu_si512(out + x, Worn(pixels, reader.Read(kPixels), changing));
    }
    if (x == width) return;
    const __mmask16 tail = StripReader::FirstLanes(width - x);
    const __m512i pixels = _mm512_maskz_loadu_epi32(tail, in + x);
    _mm512_mask_storeu_epi32(out + x, tail, Worn(pixels, reader.Read(width - x), changing));
}

}  // namespace

const RowKernels kAvx512Kernels = {ToneRowAvx512, WearRow, CopyRow, StreamRow, EndStream, WearStrips};

}  // namespace velmora::render
