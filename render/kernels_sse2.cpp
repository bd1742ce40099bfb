// 16-byte forms. Tables are looked up one pixel at a time, words loaded whole: there are no byte permutations.

#include <emmintrin.h>

#include <algorithm>
#include <cstring>

#include "render/kernels.h"

namespace velmora::render {
namespace {

// Two pixels in a 64-bit word, for 64-bit builds.
[[maybe_unused]] std::uint64_t LookUpTwo(std::uint64_t pixels, const ChannelTables& t) noexcept {
    const auto one = [&t](std::uint32_t pixel) {
        return t.blueWord[pixel & 0xFFu] | t.greenWord[(pixel >> 8) & 0xFFu] |
               t.redWord[(pixel >> 16) & 0xFFu] | (pixel & 0xFF000000u);
    };
    return one(static_cast<std::uint32_t>(pixels)) |
           std::uint64_t{one(static_cast<std::uint32_t>(pixels >> 32))} << 32;
}

// Byte by byte, for 32-bit builds, which have few registers to take words apart in.
[[maybe_unused]] std::uint32_t LookUpOne(const Bgra& pixel, const ChannelTables& t) noexcept {
    return t.blueWord[pixel.blue] | t.greenWord[pixel.green] | t.redWord[pixel.red] |
           std::uint32_t{pixel.alpha} << 24;
}

// Words are stored one by one: gathered for a wide store they would wait for each other.
void TablesRow(const Bgra* in, Bgra* out, std::int32_t width, const ChannelTables& tables) noexcept {
    std::int32_t x = 0;
    for (; x + 4 <= width; x += 4) {
        FetchAhead(in + x);
        if constexpr (sizeof(void*) == 8) {
            for (std::int32_t i = x; i < x + 4; i += 2) {
                std::uint64_t pixels;
                std::memcpy(&pixels, in + i, sizeof pixels);
                pixels = LookUpTwo(pixels, tables);
                std::memcpy(out + i, &pixels, sizeof pixels);
            }
        } else {
            for (std::int32_t i = x; i < x + 4; ++i) {
                const std::uint32_t pixel = LookUpOne(in[i], tables);
                std::memcpy(out + i, &pixel, sizeof pixel);
            }
        }
    }
    kPlainKernels.tone(in + x, out + x, width - x, Tone{&tables, false, 0, nullptr});
}

// 16-bit channels of two pixels: 127 X + u (X - Y) with u = -w, saturating where the result is above white
// anyway.
__m128i MixTwo(__m128i channels, __m128i luma, __m128i u) noexcept {
    const __m128i products = _mm_madd_epi16(channels, luma);
    const __m128i sum = _mm_srli_epi32(_mm_add_epi32(products, _mm_shuffle_epi32(products, 0xB1)), 8);
    const __m128i grey = _mm_or_si128(sum, _mm_slli_epi32(sum, 16));
    const __m128i away = _mm_mullo_epi16(_mm_sub_epi16(channels, grey), u);
    const __m128i scaled = _mm_sub_epi16(_mm_slli_epi16(channels, 7), channels);
    return _mm_srai_epi16(_mm_adds_epi16(scaled, away), 7);
}

void MixRow(const Bgra* in, Bgra* out, std::int32_t width, std::int32_t weight) noexcept {
    const __m128i zero = _mm_setzero_si128();
    const __m128i luma = _mm_setr_epi16(30, 149, 76, 0, 30, 149, 76, 0);
    const __m128i u = _mm_set1_epi16(static_cast<short>(-weight));
    const __m128i colour = _mm_set1_epi32(0x00FFFFFF);
    std::int32_t x = 0;
    for (; x + 4 <= width; x += 4) {
        const __m128i pixels = _mm_loadu_si128(reinterpret_cast<const __m128i*>(in + x));
        const __m128i mixed = _mm_packus_epi16(MixTwo(_mm_unpacklo_epi8(pixels, zero), luma, u),
                                               MixTwo(_mm_unpackhi_epi8(pixels, zero), luma, u));
        const __m128i kept = _mm_or_si128(_mm_and_si128(colour, mixed), _mm_andnot_si128(colour, pixels));
        _mm_storeu_si128(reinterpret_cast<__m128i*>(out + x), kept);
    }
    kPlainKernels.tone(in + x, out + x, width - x, Tone{nullptr, true, weight, nullptr});
}

// The next four factors over a row.
class FactorReader {
  public:
    static constexpr std::int32_t kFactors = 4;

    explicit FactorReader(const WearStrips& strips) noexcept
        : m_strips(strips), m_next(m_strips.Next()), m_left(m_strips.Width()) {}

    __m128i Read() noexcept {
        const __m128i factors = _mm_loadu_si128(reinterpret_cast<const __m128i*>(m_next));
        m_next += kFactors;
        m_left -= kFactors;
        if (m_left >= 0) return factors;
        // The strip has ended within them: the others come from the next one.
        const __m128i theirs = _mm_cmpgt_epi32(_mm_setr_epi32(1, 2, 3, 4), _mm_set1_epi32(kFactors + m_left));
        m_next = m_strips.Next() - m_left;
        m_left += m_strips.Width();
        const __m128i others = _mm_loadu_si128(reinterpret_cast<const __m128i*>(m_next - kFactors));
        return _mm_or_si128(_mm_andnot_si128(theirs, factors), _mm_and_si128(theirs, others));
    }

  private:
    WearStrips m_strips;
    const WearFactor* m_next;
    std::int32_t m_left;  // of the strip
};

// Blue and red, then green, each in the upper byte of its 16 bits.
__m128i Worn(__m128i pixels, __m128i factors, __m128i channels) noexcept {
    const __m128i times = _mm_shufflehi_epi16(_mm_shufflelo_epi16(factors, 0xA0), 0xA0);
    const __m128i plus = _mm_shufflehi_epi16(_mm_shufflelo_epi16(factors, 0xF5), 0xF5);
    const __m128i upper = _mm_set1_epi16(static_cast<short>(0xFF00));
    const __m128i room = _mm_andnot_si128(pixels, channels);
    const __m128i blueRed = _mm_add_epi16(_mm_mulhi_epu16(_mm_slli_epi16(room, 8), times), plus);
    const __m128i green = _mm_add_epi16(_mm_mulhi_epu16(_mm_and_si128(room, upper), times), plus);
    return _mm_add_epi8(pixels, _mm_or_si128(_mm_srli_epi16(blueRed, 8), _mm_and_si128(green, upper)));
}

void WearRow(const Bgra* in, Bgra* out, std::int32_t width, WearStrips strips,
             std::uint32_t channels) noexcept {
    const __m128i changing = _mm_set1_epi32(static_cast<int>(channels));
    FactorReader factors(strips);
    std::int32_t x = 0;
    for (; x + 4 <= width; x += 4) {
        FetchAhead(in + x);
        const __m128i pixels = _mm_loadu_si128(reinterpret_cast<const __m128i*>(in + x));
        _mm_storeu_si128(reinterpret_cast<__m128i*>(out + x), Worn(pixels, factors.Read(), changing));
    }
    if (x == width) return;
    Bgra rest[4] = {};
    std::copy(in + x, in + width, rest);
    const __m128i pixels = _mm_loadu_si128(reinterpret_cast<const __m128i*>(rest));
    _mm_storeu_si128(reinterpret_cast<__m128i*>(rest), Worn(pixels, factors.Read(), changing));
    std::copy(rest, rest + (width - x), out + x);
}

void CopyRow(const Bgra* in, Bgra* out, std::int32_t width) noexcept {
    kPlainKernels.copy(in, out, width);
}

void StreamRow(const Bgra* in, Bgra* out, std::int32_t width) noexcept {
    constexpr std::int32_t kPixels = 4;
    std::int32_t x = std::min(PixelsToBoundary(out, 16), width);
    kPlainKernels.copy(in, out, x);
    for (; x + kPixels <= width; x += kPixels) {
        _mm_stream_si128(reinterpret_cast<__m128i*>(out + x),
                         _mm_loadu_si128(reinterpret_cast<const __m128i*>(in + x)));
    }
    kPlainKernels.copy(in + x, out + x, width - x);
}

void EndStream() noexcept {
    _mm_sfence();
}

// Eight bytes on a line, those in the upper halves.
struct Line {
    __m128i times, plus, minus, shift;

    explicit Line(const ToneLine& line) noexcept
        : times(_mm_set1_epi16(static_cast<short>(line.times))),
          plus(_mm_set1_epi16(static_cast<short>(line.plus))),
          minus(_mm_set1_epi16(static_cast<short>(line.minus))),
          shift(_mm_cvtsi32_si128(line.shift)) {}

    __m128i At(__m128i upperBytes) const noexcept {
        const __m128i sum = _mm_adds_epu16(_mm_mulhi_epu16(upperBytes, times), plus);
        return _mm_srl_epi16(_mm_subs_epu16(sum, minus), shift);
    }
};

void LineRow(const Bgra* in, Bgra* out, std::int32_t width, const ToneLine& toneLine) noexcept {
    const __m128i colour = _mm_set1_epi32(0x00FFFFFF), zero = _mm_setzero_si128();
    const Line line(toneLine);
    std::int32_t x = 0;
    for (; x + 4 <= width; x += 4) {
        FetchAhead(in + x);
        const __m128i pixels = _mm_loadu_si128(reinterpret_cast<const __m128i*>(in + x));
        const __m128i toned = _mm_packus_epi16(line.At(_mm_unpacklo_epi8(zero, pixels)),
                                               line.At(_mm_unpackhi_epi8(zero, pixels)));
        const __m128i kept = _mm_or_si128(_mm_and_si128(colour, toned), _mm_andnot_si128(colour, pixels));
        _mm_storeu_si128(reinterpret_cast<__m128i*>(out + x), kept);
    }
    for (; x < width; ++x) {
        const Bgra p = in[x];
        out[x] = {EntryOf(toneLine, p.blue), EntryOf(toneLine, p.green), EntryOf(toneLine, p.red), p.alpha};
    }
}

void ToneRow(const Bgra* in, Bgra* out, std::int32_t width, const Tone& tone) noexcept {
    if (tone.lines.empty()) return ToneInPasses(TablesRow, MixRow, in, out, width, tone);
    for (const ToneLine& line : tone.lines) {
        LineRow(in, out, width, line);
        in = out;
    }
    ToneInPasses(TablesRow, MixRow, out, out, width, Tone{nullptr, tone.mixes, tone.weight, tone.after});
}

}  // namespace

const RowKernels kSse2Kernels = {ToneRow, WearRow, CopyRow, StreamRow, EndStream};

}  // namespace velmora::render
