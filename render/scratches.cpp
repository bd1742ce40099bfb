#include "render/scratches.h"

#include <immintrin.h>

#include <algorithm>
#include <cstring>

#include "render/rounding.h"

namespace velmora::render {
namespace {

// What a black scratch leaves of a pixel and a white one makes of it. Both lie inside the range, as on a print,
// whose black is not deepened by dirt and whose clear base is not whiter than its lights: black scratches fade
// into shadows and white ones into highlights.
constexpr std::int32_t kDarkest = 18;
constexpr std::int32_t kBrightest = 240;

void DrawPixel(Bgra& pixel, std::uint32_t weight, std::uint32_t strength, bool isWhite) noexcept {
    const std::uint32_t share = weight * strength >> 16;
    for (std::uint8_t* channel : {&pixel.blue, &pixel.green, &pixel.red}) {
        const std::int32_t towards = std::max(0, isWhite ? kBrightest - *channel : *channel - kDarkest);
        const std::int32_t change =
            static_cast<std::int32_t>(static_cast<std::uint32_t>(towards) * share >> 16);
        *channel = static_cast<std::uint8_t>(isWhite ? *channel + change : *channel - change);
    }
}

// The pixels of a scratch that lie whole in the picture.
struct PlainSpan {
    static void Draw(Bgra* span, const std::uint16_t* weights, std::int32_t pixels, std::uint32_t strength,
                     bool isWhite) noexcept {
        for (std::int32_t i = 0; i < pixels; ++i) DrawPixel(span[i], weights[i], strength, isWhite);
    }
};

// Four pixels a step. The saturating differences keep the direction and, by their limits' alpha, the alpha.
struct Sse2Span {
    static void Draw(Bgra* span, const std::uint16_t* weights, std::int32_t pixels, std::uint32_t strength,
                     bool isWhite) noexcept {
        const __m128i zero = _mm_setzero_si128();
        const __m128i darkest = _mm_set1_epi32(static_cast<std::int32_t>(0xFF000000u | kDarkest * 0x010101u));
        const __m128i brightest = _mm_set1_epi32(kBrightest * 0x010101);
        const __m128i strengths = _mm_set1_epi16(static_cast<short>(strength));
        for (std::int32_t i = 0; i < pixels; i += 4) {
            const __m128i pixel = _mm_loadu_si128(reinterpret_cast<const __m128i*>(span + i));
            const __m128i weight = _mm_loadl_epi64(reinterpret_cast<const __m128i*>(weights + i));
            const __m128i share = _mm_mulhi_epu16(weight, strengths);
            const __m128i pairs = _mm_unpacklo_epi16(share, share);
            const __m128i towards = isWhite ? _mm_subs_epu8(brightest, pixel) : _mm_subs_epu8(pixel, darkest);
            // The difference in the upper byte: the product's upper half is then 256 times the change.
            const __m128i low =
                _mm_mulhi_epu16(_mm_unpacklo_epi8(zero, towards), _mm_unpacklo_epi32(pairs, pairs));
            const __m128i high =
                _mm_mulhi_epu16(_mm_unpackhi_epi8(zero, towards), _mm_unpackhi_epi32(pairs, pairs));
            const __m128i change = _mm_packus_epi16(_mm_srli_epi16(low, 8), _mm_srli_epi16(high, 8));
            const __m128i drawn = isWhite ? _mm_add_epi8(pixel, change) : _mm_sub_epi8(pixel, change);
            _mm_storeu_si128(reinterpret_cast<__m128i*>(span + i), drawn);
        }
    }
};

// A row between two knots: `part` of 4096 of the way from one to the next.
struct RowPlace {
    std::int32_t y;
    std::size_t knot;
    std::int32_t part;
};

// A scratch less present than this has lost some of its width, and all but a hair.
constexpr std::int32_t kNarrowing = 52000, kWorn = 34000;
constexpr std::int32_t kShakeRows = 977;  // takes the edge's shake from elsewhere in the texture

// No branch but the first hangs on the texture's rows: they are too irregular to be foreseen.
template <typename Span>
void DrawLine(const ScratchLine& line, Bgra* row, std::int32_t width, const RowPlace& place) noexcept {
    const ScratchLine::Knot &from = line.knots[place.knot], &to = line.knots[place.knot + 1];
    const std::int32_t level = from.level + ((to.level - from.level) * place.part >> 12);
    if (level <= line.absentLevel) return;
    const std::int32_t ragged = line.rows->At(line.texture + place.y) * line.roughness >> 15;
    const std::int32_t present = std::clamp(level + ragged, 0, 65535);
    const std::uint32_t strength = static_cast<std::uint32_t>(present) * line.strength >> 16;
    const std::int32_t shaken = line.rows->At(line.texture + place.y + kShakeRows) * line.shake >> 15;
    const std::int32_t edge = from.offset + ((to.offset - from.offset) * place.part >> 12) + shaken;
    const std::int32_t first = line.pixel + (edge >> 8);
    const ScratchShape& shape =
        (*line.shapes)[std::size_t{present < kNarrowing} + std::size_t{present < kWorn}];
    const std::uint16_t* weights = shape.weights[static_cast<std::size_t>((edge & 255) >> 3)].data();
    if (first >= 0 && first <= width - line.pixels) {
        return Span::Draw(row + first, weights, line.pixels, strength, line.isWhite);
    }
    for (std::int32_t x = std::max(first, 0); x < std::min(first + line.pixels, width); ++x) {
        DrawPixel(row[x], weights[x - first], strength, line.isWhite);
    }
}

template <typename Span>
void DrawLines(const ScratchLine* lines, std::uint32_t count, Bgra* row, std::int32_t width,
               const RowPlace& place) noexcept {
    for (const ScratchLine* line = lines; line != lines + count; ++line)
        DrawLine<Span>(*line, row, width, place);
}

}  // namespace

ScratchStage::ScratchStage(const ScratchLine* lines, std::uint32_t count, std::int32_t height,
                           SimdLevel level) noexcept
    : m_lines(lines),
      m_count(count),
      m_knotStep((std::uint64_t{ScratchLine::kSegments} << 16) / static_cast<std::uint64_t>(height)),
      m_level(level) {}

void ScratchStage::Row(const Bgra* in, Bgra* out, std::int32_t width, std::int32_t y) const noexcept {
    if (in != out) std::memcpy(out, in, static_cast<std::size_t>(width) * sizeof(Bgra));
    const std::uint64_t along = m_knotStep * static_cast<std::uint64_t>(y);
    const RowPlace place = {y, static_cast<std::size_t>(along >> 16),
                            static_cast<std::int32_t>(along & 0xFFFF) >> 4};
    const auto draw = m_level == SimdLevel::kPlain ? DrawLines<PlainSpan> : DrawLines<Sse2Span>;
    draw(m_lines, m_count, out, width, place);
}

ScratchStage PrepareScratches(const StageSettings& settings, std::int32_t xOffset,
                              const FrameContext& context, ScratchMemory& memory, SimdLevel level) noexcept {
    const std::int32_t depth = std::clamp(RoundHalfAway(settings.scratchDepth * 65535.0), 0, 65535);
    const std::uint32_t count = std::min(settings.scratchCount, kMostScratches);
    if (depth == 0 || count == 0) return {};
    const std::int32_t frame = ScratchFrame(context.FrameNumber());
    const ScratchReplay& replay = memory.replays.At(ReplayKeyOf(settings), frame);
    const ScratchStray stray(context.Width(), context.Height());
    for (std::uint32_t i = 0; i < count; ++i) {
        const ScratchState scratch = ScratchStateAt(replay.LifeOf(i), frame, settings, context.Width());
        ScratchLine& line = memory.lines[i];
        line.pixel = static_cast<std::int32_t>(scratch.position / 1000) + xOffset;
        LayScratch(scratch, {.frame = frame, .depth = depth, .isFirst = i == 0}, stray, line);
    }
    return {memory.lines.data(), count, context.Height(), level};
}

}  // namespace velmora::render
