#include "render/scratches.h"

#include <immintrin.h>

#include <algorithm>
#include <cstring>

#include "render/mix_bits.h"
#include "render/rounding.h"

namespace velmora::render {
namespace {

constexpr std::int32_t kDarkest = 9;      // what a black scratch leaves of a pixel
constexpr std::int32_t kBrightest = 246;  // what a white one makes of it

// Independent noises of one scratch.
enum Lane : std::uint32_t { kSway, kShiver, kTilt, kBreath, kGrain, kBreak, kWorn };

std::int32_t HashAt(std::uint32_t look, Lane lane, std::int32_t cell) noexcept {
    return static_cast<std::int32_t>(MixBits(look + lane * 0x632BE5ABu + static_cast<std::uint32_t>(cell)) >>
                                     16);
}

// 0..65535, smooth between cells of 2^cellBits knots.
std::int32_t NoiseAt(std::uint32_t look, Lane lane, std::int32_t knot, int cellBits) noexcept {
    const std::int32_t cell = knot >> cellBits;
    const std::int32_t t = ((knot & ((1 << cellBits) - 1)) << 8) >> cellBits;  // of 256
    const std::int32_t eased = (t * t * (768 - 2 * t)) >> 16;
    const std::int32_t from = HashAt(look, lane, cell);
    return from + (((HashAt(look, lane, cell + 1) - from) * eased) >> 8);
}

std::int32_t Centred(std::int32_t noise) noexcept {
    return noise - 32768;
}

// How far a scratch strays from its column, in 1/256 pixels: some thousandths of the picture's size.
struct Stray {
    std::int64_t sway, shiver, tilt;

    Stray(std::int32_t width, std::int32_t height) noexcept
        : sway(std::int64_t{std::min(width, 16384)} * 256 * 14 / 10000),
          shiver(sway / 6),
          tilt(std::int64_t{std::min(height, 16384)} * 256 * 6 / 1000) {}
};

void LayCourse(const ScratchState& scratch, std::int32_t age, const Stray& stray,
               ScratchLine& line) noexcept {
    constexpr std::int32_t kCreep = 3;  // knots per frame: the waver wanders up the picture
    const std::int64_t tilt = stray.tilt * Centred(HashAt(scratch.look, kTilt, 0)) / 32768;
    const std::int64_t column = (scratch.position % 1000 * 256) / 1000;
    for (std::int32_t k = 0; k <= ScratchLine::kSegments; ++k) {
        const std::int32_t along = k + age * kCreep;
        std::int64_t offset = stray.sway * Centred(NoiseAt(scratch.look, kSway, along, 4));
        offset += stray.shiver * Centred(NoiseAt(scratch.look, kShiver, along, 2));
        offset = offset / 32768 + column + tilt * (k - ScratchLine::kSegments / 2) / ScratchLine::kSegments;
        line.knots[static_cast<std::size_t>(k)].offset = static_cast<std::int32_t>(offset);
    }
}

// The marks run through the gate with the film: each frame shows the piece after that of the frame before.
void LayStrength(const ScratchState& scratch, std::int32_t age, std::int32_t depth,
                 ScratchLine& line) noexcept {
    const std::int64_t full = std::int64_t{depth} * scratch.opacity * scratch.tremble >> 16;
    // About every other scratch is whole, the others break where the noise falls below their wear.
    const std::int32_t worn = std::max(0, HashAt(scratch.look, kWorn, 0) - 32768) * 7 / 8;
    for (std::int32_t k = 0; k <= ScratchLine::kSegments; ++k) {
        const std::int32_t along = k + age * ScratchLine::kSegments;
        const std::int32_t breath =
            24000 + NoiseAt(scratch.look, kBreath, along, 2) / 2 + HashAt(scratch.look, kGrain, along) / 7;
        const std::int32_t above = NoiseAt(scratch.look, kBreak, along, 3) - worn;
        const std::int32_t present = worn == 0 ? 65536 : std::clamp(above * 5, 0, 65536);
        const std::int64_t strength = ((full * breath >> 16) * present) >> 16;
        line.knots[static_cast<std::size_t>(k)].strength =
            static_cast<std::int32_t>(std::clamp<std::int64_t>(strength, 0, 65535));
    }
}

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
    std::size_t knot;
    std::int32_t part;
};

template <typename Span>
void DrawLine(const ScratchLine& line, Bgra* row, std::int32_t width, const RowPlace& place) noexcept {
    const ScratchLine::Knot &from = line.knots[place.knot], &to = line.knots[place.knot + 1];
    const std::uint32_t strength =
        static_cast<std::uint32_t>(from.strength + ((to.strength - from.strength) * place.part >> 12));
    if (strength == 0) return;
    const std::int32_t edge = from.offset + ((to.offset - from.offset) * place.part >> 12);
    const std::int32_t first = line.pixel + (edge >> 8);
    const ScratchShape& shape = *line.shape;
    const std::uint16_t* weights = shape.weights[static_cast<std::size_t>((edge & 255) >> 3)].data();
    if (first >= 0 && first <= width - shape.pixels) {
        return Span::Draw(row + first, weights, shape.pixels, strength, line.isWhite);
    }
    for (std::int32_t x = std::max(first, 0); x < std::min(first + shape.pixels, width); ++x) {
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
                           Form form) noexcept
    : m_lines(lines),
      m_count(count),
      m_knotStep((std::uint64_t{ScratchLine::kSegments} << 16) / static_cast<std::uint64_t>(height)),
      m_form(form) {}

void ScratchStage::Row(const Bgra* in, Bgra* out, std::int32_t width, std::int32_t y) const noexcept {
    if (in != out) std::memcpy(out, in, static_cast<std::size_t>(width) * sizeof(Bgra));
    const std::uint64_t along = m_knotStep * static_cast<std::uint64_t>(y);
    const RowPlace place = {static_cast<std::size_t>(along >> 16),
                            static_cast<std::int32_t>(along & 0xFFFF) >> 4};
    const auto draw = m_form == Form::kPlain ? DrawLines<PlainSpan> : DrawLines<Sse2Span>;
    draw(m_lines, m_count, out, width, place);
}

ScratchStage PrepareScratches(const StageSettings& settings, std::int32_t xOffset,
                              const FrameContext& context, ScratchMemory& memory, Form form) noexcept {
    const std::int32_t depth = std::clamp(RoundHalfAway(settings.scratchDepth * 65535.0), 0, 65535);
    const std::uint32_t count = std::min(settings.scratchCount, kMostScratches);
    if (depth == 0 || count == 0) return {};
    const std::int32_t frame = ScratchFrame(context.FrameNumber());
    const ScratchReplay& replay = memory.replays.At(ReplayKeyOf(settings), frame);
    const Stray stray(context.Width(), context.Height());
    for (std::uint32_t i = 0; i < count; ++i) {
        const ScratchState scratch = ScratchStateAt(replay.LifeOf(i), frame, settings, context.Width());
        ScratchLine& line = memory.lines[i];
        line.shape = &ScratchShapeOf(scratch.isWhite, scratch.profileIndex);
        line.isWhite = scratch.isWhite;
        line.pixel = static_cast<std::int32_t>(scratch.position / 1000) + xOffset;
        LayCourse(scratch, frame - scratch.firstFrame, stray, line);
        LayStrength(scratch, frame - scratch.firstFrame, depth, line);
    }
    return {memory.lines.data(), count, context.Height(), form};
}

}  // namespace velmora::render
