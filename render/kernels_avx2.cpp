// 32-byte forms. Every function that holds wide values carries the target itself: nothing else in the
// program may be compiled for a processor that might not be there.

#include <immintrin.h>

#include <algorithm>

#include "render/kernels.h"

#define VM_AVX2 __attribute__((target("avx2")))

namespace velmora::render {
namespace {

// As in the 16-byte form, eight factors.
class FactorReader {
  public:
    static constexpr std::int32_t kFactors = 8;

    explicit FactorReader(const WearStrips& strips) noexcept
        : m_strips(strips), m_next(m_strips.Next()), m_left(m_strips.Width()) {}

    VM_AVX2 __m256i Read() noexcept {
        const __m256i factors = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(m_next));
        m_next += kFactors;
        m_left -= kFactors;
        if (m_left >= 0) return factors;
        const __m256i places = _mm256_setr_epi32(1, 2, 3, 4, 5, 6, 7, 8);
        const __m256i theirs = _mm256_cmpgt_epi32(places, _mm256_set1_epi32(kFactors + m_left));
        m_next = m_strips.Next() - m_left;
        m_left += m_strips.Width();
        const __m256i others = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(m_next - kFactors));
        return _mm256_blendv_epi8(factors, others, theirs);
    }

  private:
    WearStrips m_strips;
    const WearFactor* m_next;
    std::int32_t m_left;  // of the strip
};

VM_AVX2 inline __m256i Worn(__m256i pixels, __m256i factors, __m256i channels) noexcept {
    const __m256i times = _mm256_shufflehi_epi16(_mm256_shufflelo_epi16(factors, 0xA0), 0xA0);
    const __m256i plus = _mm256_shufflehi_epi16(_mm256_shufflelo_epi16(factors, 0xF5), 0xF5);
    const __m256i upper = _mm256_set1_epi16(static_cast<short>(0xFF00));
    const __m256i room = _mm256_andnot_si256(pixels, channels);
    const __m256i blueRed = _mm256_add_epi16(_mm256_mulhi_epu16(_mm256_slli_epi16(room, 8), times), plus);
    const __m256i green = _mm256_add_epi16(_mm256_mulhi_epu16(_mm256_and_si256(room, upper), times), plus);
    return _mm256_add_epi8(pixels,
                           _mm256_or_si256(_mm256_srli_epi16(blueRed, 8), _mm256_and_si256(green, upper)));
}

VM_AVX2 void WearRow(const Bgra* in, Bgra* out, std::int32_t width, WearStrips strips,
                     std::uint32_t channels) noexcept {
    const __m256i changing = _mm256_set1_epi32(static_cast<int>(channels));
    FactorReader factors(strips);
    std::int32_t x = 0;
    for (; x + 8 <= width; x += 8) {
        FetchAhead(in + x);
        const __m256i pixels = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(in + x));
        _mm256_storeu_si256(reinterpret_cast<__m256i*>(out + x), Worn(pixels, factors.Read(), changing));
    }
    if (x == width) return;
    const __m256i places = _mm256_setr_epi32(0, 1, 2, 3, 4, 5, 6, 7);
    const __m256i tail = _mm256_cmpgt_epi32(_mm256_set1_epi32(width - x), places);
    const __m256i pixels = _mm256_maskload_epi32(reinterpret_cast<const int*>(in + x), tail);
    _mm256_maskstore_epi32(reinterpret_cast<int*>(out + x), tail, Worn(pixels, factors.Read(), changing));
}

VM_AVX2 void CopyRow(const Bgra* in, Bgra* out, std::int32_t width) noexcept {
    std::int32_t x = 0;
    for (; x + 16 <= width; x += 16) {
        FetchAhead(in + x);
        const __m256i first = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(in + x));
        const __m256i second = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(in + x + 8));
        _mm256_storeu_si256(reinterpret_cast<__m256i*>(out + x), first);
        _mm256_storeu_si256(reinterpret_cast<__m256i*>(out + x + 8), second);
    }
    kPlainKernels.copy(in + x, out + x, width - x);
}

VM_AVX2 void StreamRow(const Bgra* in, Bgra* out, std::int32_t width) noexcept {
    std::int32_t x = std::min(PixelsToBoundary(out, 32), width);
    kPlainKernels.copy(in, out, x);
    for (; x + 8 <= width; x += 8) {
        _mm256_stream_si256(reinterpret_cast<__m256i*>(out + x),
                            _mm256_loadu_si256(reinterpret_cast<const __m256i*>(in + x)));
    }
    kPlainKernels.copy(in + x, out + x, width - x);
}

void EndStream() noexcept {
    _mm_sfence();
}

}  // namespace

const RowKernels kAvx2Kernels = {ToneRowAvx2, WearRow, CopyRow, StreamRow, EndStream};

}  // namespace velmora::render
