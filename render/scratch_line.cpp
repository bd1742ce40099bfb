#include "render/scratch_line.h"

#include <algorithm>

#include "render/random.h"

namespace velmora::render {
namespace {

constexpr std::int32_t kSegments = ScratchLine::kSegments;
constexpr std::int32_t kOne = 65536;
constexpr std::int32_t kMostLevel = 70000;  // barely above whole, so that the texture shows there too

// Independent noises and draws of one scratch.
enum Lane : std::uint32_t {
    kSway,
    kSwaySize,
    kSwayLength,
    kSwayTurn,
    kShiver,
    kTilt,
    kStrength,
    kFade,
    kFadeLength,
    kWear,
    kWearDrift,
    kBreaks,
    kBreakLength,
    kUnevenness,
    kFlaws,
    kRoughness,
    kTexture,
    kSection,
    kOnset,
};

// 0..65535
constexpr std::int32_t HashAt(std::uint32_t look, Lane lane, std::int32_t cell = 0) noexcept {
    return static_cast<std::int32_t>(MixBits(look + lane * 0x632BE5ABu + static_cast<std::uint32_t>(cell)) >>
                                     16);
}

constexpr std::int32_t Between(std::int32_t from, std::int32_t to, std::int32_t part) noexcept {
    return from + static_cast<std::int32_t>(std::int64_t{to - from} * part >> 16);
}

constexpr std::int32_t Eased(std::int32_t t) noexcept {  // of 256
    return (t * t * (768 - 2 * t)) >> 16;
}

// Noise of −32768..32767, smooth between cells. Positions and steps are 1/65536 cells.
class Noise {
  public:
    Noise(std::uint32_t look, Lane lane, std::int64_t position, std::int32_t step) noexcept
        : m_look(look), m_lane(lane), m_position(position), m_step(step) {
        Enter();
    }

    std::int32_t Next() noexcept {
        if ((m_position >> 16) != m_cell) Enter();
        const std::int32_t eased = Eased(static_cast<std::int32_t>(m_position >> 8 & 255));
        m_position += m_step;
        return m_from + ((m_to - m_from) * eased >> 8) - 32768;
    }

  private:
    void Enter() noexcept {
        m_cell = static_cast<std::int32_t>(m_position >> 16);
        m_from = HashAt(m_look, m_lane, m_cell);
        m_to = HashAt(m_look, m_lane, m_cell + 1);
    }

    std::uint32_t m_look;
    Lane m_lane;
    std::int64_t m_position;
    std::int32_t m_step;
    std::int32_t m_cell = 0, m_from = 0, m_to = 0;
};

// For knots of a frame `age` frames into the life, in cells of `cellKnots` knots.
Noise AlongFilm(std::uint32_t look, Lane lane, std::int32_t age, std::int32_t cellKnots) noexcept {
    const std::int32_t step = kOne / cellKnots;
    return {look, lane, std::int64_t{age} * kSegments * step, step};
}

// Constant within a frame, in cells of 10 to 200 frames.
std::int32_t OverFrames(std::uint32_t look, Lane lane, std::int32_t age) noexcept {
    const std::int32_t draw = HashAt(look, kFadeLength, static_cast<std::int32_t>(lane));
    const std::int32_t frames =
        10 + static_cast<std::int32_t>(std::int64_t{draw} * draw / (kOne / 190) >> 16);
    return Noise(look, lane, std::int64_t{age} * kOne / frames, 0).Next();
}

constexpr std::int32_t kQuantiles = 9;

// Strengths, of 256, at octiles of all scratches: most are faint hairlines, one in eight stands out.
constexpr std::int32_t kStrengths[kQuantiles] = {44, 58, 70, 84, 100, 122, 156, 224, 300};
// Levels at octiles of all scratches: a few hardly break, most do, and a quarter appears only in short stretches.
constexpr std::int32_t kLevels[kQuantiles] = {96000, 80000, 58000, 42000, 28000, 15000, 0, -20000, -44000};

std::int32_t QuantileAt(const std::int32_t (&values)[kQuantiles], std::int32_t part) noexcept {
    const std::int32_t place = part * (kQuantiles - 1);
    const std::int32_t index = place >> 16;
    return Between(values[index], values[index + 1], place & 0xFFFF);
}

std::uint32_t StrengthOf(const ScratchState& scratch, const ScratchView& view) noexcept {
    // A user who asks for a single scratch wants to see it, so the first is never in the faint half.
    const std::int32_t drawn = HashAt(scratch.look, kStrength);
    const std::int32_t share = QuantileAt(kStrengths, view.isFirst ? (kOne + drawn) / 2 : drawn);
    const std::int32_t age = view.frame - scratch.firstFrame;
    const std::int32_t fade = kOne * 15 / 16 + OverFrames(scratch.look, kFade, age) * 3 / 4;
    const std::int64_t whole = std::int64_t{view.depth} * scratch.opacity * scratch.tremble >> 16;
    return static_cast<std::uint32_t>(std::min<std::int64_t>((whole * share >> 8) * fade >> 16, 65535));
}

void LayCourse(const ScratchState& scratch, std::int32_t age, const ScratchStray& stray,
               ScratchLine& line) noexcept {
    const std::uint32_t look = scratch.look;
    // The cube of a uniform draw: most are nearly upright.
    const std::int64_t lean = HashAt(look, kTilt) - 32768;
    const std::int64_t tilt = stray.tilt * (lean * lean / 32768 * lean / 32768) / 32768;
    const std::int64_t sway = stray.sway * Between(kOne / 3, kOne, HashAt(look, kSwaySize)) >> 16;
    const std::int64_t column = (scratch.position % 1000 * 256) / 1000;
    // The sway stays in place and slowly changes shape; otherwise the line would seem to crawl.
    const std::int32_t turn = age * 256 / Between(8, 40, HashAt(look, kSwayTurn));
    const std::int32_t turned = Eased(turn & 255);
    const std::int32_t step = kOne / Between(14, 60, HashAt(look, kSwayLength));
    const std::int64_t place = std::int64_t{turn >> 8} * kSegments * kOne;
    Noise before(look, kSway, place, step), after(look, kSway, place + kSegments * kOne, step);
    Noise shivering = AlongFilm(look, kShiver, age, 9);
    for (std::int32_t k = 0; k <= kSegments; ++k) {
        const std::int32_t from = before.Next(), to = after.Next();
        const std::int64_t strayed =
            sway * (from + ((to - from) * turned >> 8)) + stray.shiver * shivering.Next();
        const std::int64_t leaning = tilt * (k - kSegments / 2) / kSegments;
        line.knots[static_cast<std::size_t>(k)].offset =
            static_cast<std::int32_t>((strayed >> 15) + column + leaning);
    }
}

// How much is taken off the level at a knot: everything at the ends of the life, nothing a few frames away from them.
// Scratches present at the start of the clip have no onset.
class Onset {
  public:
    Onset(const ScratchState& scratch, std::int32_t frame) noexcept
        : m_knots(Between(2, 7, HashAt(scratch.look, kOnset)) * kSegments),
          m_before(scratch.firstFrame == 0 ? m_knots : (frame - scratch.firstFrame) * kSegments),
          m_after((scratch.endFrame - frame) * kSegments) {}

    [[nodiscard]] std::int32_t LackAt(std::int32_t knot) const noexcept {
        return std::max(0, m_knots - std::min(m_before + knot, m_after - knot)) * (kOne / m_knots) * 5 / 4;
    }

  private:
    std::int32_t m_knots, m_before, m_after;
};

void LayLevels(const ScratchState& scratch, std::int32_t frame, ScratchLine& line) noexcept {
    const std::uint32_t look = scratch.look;
    const std::int32_t age = frame - scratch.firstFrame;
    const std::int32_t mean = QuantileAt(kLevels, HashAt(look, kWear)) + OverFrames(look, kWearDrift, age);
    const std::int32_t draw = HashAt(look, kBreakLength);
    Noise breaks = AlongFilm(look, kBreaks, age,
                             Between(4, 32, static_cast<std::int32_t>(std::int64_t{draw} * draw >> 16)));
    Noise flaws = AlongFilm(look, kFlaws, age, 3);
    const std::int32_t unevenness = Between(300, 800, HashAt(look, kUnevenness));  // of 256
    const Onset onset(scratch, frame);
    for (std::int32_t k = 0; k <= kSegments; ++k) {
        const std::int32_t level = mean + (breaks.Next() * unevenness >> 8) + flaws.Next() - onset.LackAt(k);
        line.knots[static_cast<std::size_t>(k)].level = std::clamp(level, -kOne, kMostLevel);
    }
}

constexpr std::int32_t kMostTexture = 22 * 1024;

constexpr std::int32_t kTextureMask = ScratchTexture::kRows - 1;
using RoughRows = std::array<std::int32_t, ScratchTexture::kRows>;

// Octaves of 1 to 32 rows.
constexpr RoughRows MakeRoughRows() {
    constexpr std::int32_t kWeights[6] = {110, 120, 130, 140, 140, 120};  // of 256
    RoughRows rough{};
    for (int bits = 0; bits < 6; ++bits) {
        const auto lane = static_cast<Lane>(kTexture + 100u * static_cast<std::uint32_t>(bits));
        for (std::int32_t cell = 0; cell <= kTextureMask >> bits; ++cell) {
            const std::int32_t from = HashAt(0x5EEDu, lane, cell);
            const std::int32_t to = HashAt(0x5EEDu, lane, (cell + 1) & (kTextureMask >> bits));
            for (std::int32_t row = 0; row < 1 << bits; ++row) {
                const std::int32_t value = from + ((to - from) * Eased(row * 256 >> bits) >> 8) - 32768;
                const std::int32_t place = (cell << bits) + row;
                rough[static_cast<std::size_t>(place)] += value * kWeights[bits] / 256;
            }
        }
    }
    return rough;
}

constexpr RoughRows Softened(const RoughRows& rows) {
    RoughRows soft{};
    for (std::int32_t row = 0; row <= kTextureMask; ++row) {
        const std::int32_t sum = rows[static_cast<std::size_t>((row - 1) & kTextureMask)] +
                                 2 * rows[static_cast<std::size_t>(row)] +
                                 rows[static_cast<std::size_t>((row + 1) & kTextureMask)];
        soft[static_cast<std::size_t>(row)] = sum / 4;
    }
    return soft;
}

constexpr ScratchTexture MakeTexture(int softenings) {
    RoughRows rows = MakeRoughRows();
    for (int i = 0; i < softenings; ++i) rows = Softened(rows);
    ScratchTexture texture;
    for (std::size_t row = 0; row < texture.values.size(); ++row) {
        texture.values[row] =
            static_cast<std::int16_t>(std::clamp(rows[row % rows.size()], -kMostTexture, kMostTexture));
    }
    return texture;
}

// A fleck is about as long as it is wide: one-row breaks across a wide scratch would look like a bar code.
constinit const ScratchTexture kThinTexture = MakeTexture(1);
constinit const ScratchTexture kThickTexture = MakeTexture(8);
constexpr std::int32_t kThickFrom = 5;  // pixels

}  // namespace

ScratchStray::ScratchStray(std::int32_t width, std::int32_t height) noexcept
    : sway(std::int64_t{std::min(width, 16384)} * 256 * 26 / 10000),
      shiver(sway / 14),
      tilt(std::int64_t{std::min(height, 16384)} * 256 * 9 / 1000) {}

void LayScratch(const ScratchState& scratch, const ScratchView& view, const ScratchStray& stray,
                ScratchLine& line) noexcept {
    const std::int32_t age = view.frame - scratch.firstFrame;
    line.isWhite = scratch.isWhite;
    const std::int32_t section = HashAt(scratch.look, kSection) * kScratchSections >> 16;
    line.shapes = &ScratchShapesOf(scratch.isWhite, scratch.profileIndex, section);
    line.pixels = line.shapes->pixels;
    line.strength = StrengthOf(scratch, view);
    line.roughness = Between(kOne / 4, kOne * 7 / 8, HashAt(scratch.look, kRoughness));
    line.absentLevel = -(line.roughness * (kMostTexture >> 10) >> 5);
    line.texture = HashAt(scratch.look, kTexture, age);
    line.rows = scratch.width < kThickFrom ? &kThinTexture : &kThickTexture;
    line.shake = scratch.width < kThickFrom ? 60 : 190;
    LayCourse(scratch, age, stray, line);
    LayLevels(scratch, view.frame, line);
}

}  // namespace velmora::render
