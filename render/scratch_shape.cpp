#include "render/scratch_state.h"

#include <algorithm>

namespace velmora::render {
namespace {

// A scratch is one or two hairlines about a pixel wide, within a faint graze as wide as the profile.
struct Hair {
    std::int32_t place;     // of its middle, 0..256; at 0 and 256 the hairline touches the profile's edge
    std::int32_t half;      // half its width at the base, 1/64 pixels; at most half the profile's width
    std::int32_t strength;  // 0..256
};

struct Section {
    Hair hairs[2];
    std::int32_t graze;  // 0..256
};

// A furrow in the middle; one towards the side; a soft rub without a sharp core.
constexpr Section kThinSections[kScratchSections] = {
    {{{128, 76, 256}, {128, 1, 0}}, 60},
    {{{70, 66, 256}, {128, 1, 0}}, 70},
    {{{128, 128, 200}, {128, 1, 0}}, 60},
};

// A furrow with a finer one beside it; a close pair; a wide rub with one sharp edge.
constexpr Section kThickSections[kScratchSections] = {
    {{{120, 140, 256}, {240, 64, 90}}, 50},
    {{{40, 90, 246}, {200, 110, 150}}, 56},
    {{{24, 80, 256}, {110, 230, 110}}, 80},
};

constexpr std::int32_t kUnits = 64;  // per pixel

// (1 − d²)² of `strength`, at the middle of a unit.
constexpr std::int32_t BumpAt(std::int32_t unit, std::int32_t doubleMiddle, std::int32_t half,
                              std::int32_t strength) {
    const std::int32_t distance = 2 * unit + 1 - doubleMiddle;
    const std::int32_t left = 4096 - distance * distance * 1024 / (half * half);
    return left <= 0 ? 0 : (left * left >> 12) * strength >> 12;
}

constexpr std::int32_t SectionAt(const Section& section, std::int32_t unit, std::int32_t width) {
    std::int32_t covered = BumpAt(unit, width, width / 2, section.graze);
    for (const Hair& hair : section.hairs) {
        const std::int32_t half = std::min(hair.half, width / 2);
        const std::int32_t doubleMiddle = 2 * half + (width - 2 * half) * hair.place / 128;
        covered = std::max(covered, BumpAt(unit, doubleMiddle, half, hair.strength));
    }
    return covered;
}

// Each pixel takes the mean of the section over its width, so that a drifting scratch does not shimmer.
constexpr ScratchShape MakeShape(const ScratchProfile& profile, const Section& section) {
    ScratchShape shape{};
    const std::int32_t width = profile.width * kUnits;
    std::array<std::int32_t, kMostScratchPixels * kUnits + 1> sums{};  // of all preceding units
    for (std::int32_t unit = 0; unit < kMostScratchPixels * kUnits; ++unit) {
        const std::int32_t covered = unit < width ? SectionAt(section, unit, width) : 0;
        const auto index = static_cast<std::size_t>(unit);
        sums[index + 1] = sums[index] + covered;
    }
    for (std::int32_t phase = 0; phase < kScratchPhases; ++phase) {
        for (std::int32_t pixel = 0; pixel <= profile.width; ++pixel) {
            const std::int32_t from = pixel * kUnits - phase * kUnits / kScratchPhases;
            const std::int32_t sum = sums[static_cast<std::size_t>(std::min(from + kUnits, width))] -
                                     sums[static_cast<std::size_t>(std::clamp(from, 0, width))];
            shape[static_cast<std::size_t>(phase)][static_cast<std::size_t>(pixel)] =
                static_cast<std::uint16_t>(sum * 255 / kUnits);
        }
    }
    return shape;
}

constexpr Section Narrowed(const Section& whole) {
    const Hair &hair = whole.hairs[0], &other = whole.hairs[1];
    return {{{hair.place, hair.half * 7 / 8, hair.strength},
             {other.place, other.half * 3 / 4 + 1, other.strength / 2}},
            whole.graze / 2};
}

constexpr Section Worn(const Section& whole) {
    const Hair& hair = whole.hairs[0];
    return {{{hair.place, hair.half * 2 / 3, hair.strength}, {128, 1, 0}}, 0};
}

using ShapeTable = std::array<std::array<ScratchShapes, kScratchSections>, kScratchProfiles>;

constexpr ShapeTable MakeShapes(const ScratchProfile (&profiles)[kScratchProfiles]) {
    ShapeTable shapes;
    for (int i = 0; i < kScratchProfiles; ++i) {
        for (int section = 0; section < kScratchSections; ++section) {
            const Section& whole = (i < kThinScratchProfiles ? kThinSections : kThickSections)[section];
            shapes[static_cast<std::size_t>(i)][static_cast<std::size_t>(section)] = {
                (profiles[i].width + 1 + 3) / 4 * 4,
                {MakeShape(profiles[i], whole), MakeShape(profiles[i], Narrowed(whole)),
                 MakeShape(profiles[i], Worn(whole))}};
        }
    }
    return shapes;
}

constexpr ShapeTable kBlackShapes = MakeShapes(kBlackScratchProfiles);
constexpr ShapeTable kWhiteShapes = MakeShapes(kWhiteScratchProfiles);

}  // namespace

const ScratchShapes& ScratchShapesOf(bool isWhite, std::int32_t profile, std::int32_t section) noexcept {
    const ShapeTable& shapes = isWhite ? kWhiteShapes : kBlackShapes;
    return shapes[static_cast<std::size_t>(profile)][static_cast<std::size_t>(section)];
}

}  // namespace velmora::render
