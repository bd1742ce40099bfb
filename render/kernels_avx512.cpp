// 64-byte forms.

#include <immintrin.h>

#include <algorithm>

#include "render/kernels.h"

#define VM_AVX512 __attribute__((target("avx512f,avx512bw,avx512vl,avx512vbmi")))

namespace velmora::render {
namespace {

constexpr std::int32_t kPixels = 16;  // in a register

// Calls step(pixels) for each 16 pixels of a row and stores what it returns.
template <typename Step>
VM_AVX512 inline void ForEachSixteen(const Bgra* in, Bgra* out, std::int32_t width,
                                     const Step& step) noexcept {
    std::int32_t x = 0;
    for (; x + kPixels <= width; x += kPixels) {
        FetchAhead(in + x);
        const __m512i pixels = _mm512_loadu_si512(in + x);
        _mm512_storeu_si512(out + x, step(pixels));
    }
    if (x == width) return;
    const __mmask16 tail = static_cast<__mmask16>((1u << (width - x)) - 1u);
    const __m512i pixels = _mm512_maskz_loadu_epi32(tail, in + x);
    _mm512_mask_storeu_epi32(out + x, tail, step(pixels));
}

// As in the 16-byte form, sixteen factors.
class FactorReader {
  public:
    explicit FactorReader(const WearStrips& strips) noexcept
        : m_strips(strips), m_next(m_strips.Next()), m_left(m_strips.Width()) {}

    VM_AVX512 __m512i Read() noexcept {
        const __m512i factors = _mm512_loadu_si512(m_next);
        m_next += kPixels;
        m_left -= kPixels;
        if (m_left >= 0) return factors;
        const auto theirs = static_cast<__mmask16>(0xFFFFu << (kPixels + m_left));
        m_next = m_strips.Next() - m_left;
        m_left += m_strips.Width();
        return _mm512_mask_loadu_epi32(factors, theirs, m_next - kPixels);
    }

  private:
    WearStrips m_strips;
    const WearFactor* m_next;
    std::int32_t m_left;  // of the strip
};

struct WearStep {
    FactorReader& factors;
    __m512i channels;

    VM_AVX512 __m512i operator()(__m512i pixels) const noexcept {
        const __m512i eachTwice = _mm512_set4_epi32(0x0D0C0D0C, 0x09080908, 0x05040504, 0x01000100);
        const __m512i both = factors.Read();
        const __m512i times = _mm512_shuffle_epi8(both, eachTwice);
        const __m512i plus = _mm512_shuffle_epi8(both, _mm512_or_si512(eachTwice, _mm512_set1_epi8(2)));
        const __m512i upper = _mm512_set1_epi16(static_cast<short>(0xFF00));
        const __m512i room = _mm512_andnot_si512(pixels, channels);
        const __m512i blueRed = _mm512_add_epi16(_mm512_mulhi_epu16(_mm512_slli_epi16(room, 8), times), plus);
        const __m512i green =
            _mm512_add_epi16(_mm512_mulhi_epu16(_mm512_and_si512(room, upper), times), plus);
        constexpr int kChoice = 0xCA;  // the first number's bits choose the second number, else the third
        const __m512i more = _mm512_ternarylogic_epi32(upper, green, _mm512_srli_epi16(blueRed, 8), kChoice);
        return _mm512_add_epi8(pixels, more);
    }
};

VM_AVX512 void WearRow(const Bgra* in, Bgra* out, std::int32_t width, WearStrips strips,
                       std::uint32_t channels) noexcept {
    FactorReader factors(strips);
    ForEachSixteen(in, out, width, WearStep{factors, _mm512_set1_epi32(static_cast<int>(channels))});
}

struct CopyStep {
    VM_AVX512 __m512i operator()(__m512i pixels) const noexcept { return pixels; }
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

const RowKernels kAvx512Kernels = {ToneRowAvx512, WearRow, CopyRow, StreamRow, EndStream};

}  // namespace velmora::render
