#include "render/scratch_shape.h"

namespace velmora::render {
namespace {

constexpr std::int32_t kKnots = 9;

// Strength from the middle (first) to the edge (last), 0..256. A thick scratch is a furrow: its core lies
// between two rims that the emulsion was pushed into, and the picture is hardly touched between them.
constexpr std::int32_t kThinSection[kKnots] = {256, 248, 222, 178, 124, 72, 32, 9, 0};
constexpr std::int32_t kThickSection[kKnots] = {256, 253, 236, 186, 102, 52, 78, 56, 0};

// At `offset` from the left edge; offset and width in the same unit.
constexpr std::int32_t SectionAt(const std::int32_t (&section)[kKnots], std::int32_t offset,
                                 std::int32_t width) {
    if (offset < 0 || offset > width) return 0;
    const std::int32_t fromMiddle = 2 * offset > width ? 2 * offset - width : width - 2 * offset;
    const std::int32_t scaled = fromMiddle * (kKnots - 1);
    const std::int32_t knot = scaled / width;
    if (knot >= kKnots - 1) return section[kKnots - 1];
    return section[knot] + (section[knot + 1] - section[knot]) * (scaled % width) / width;
}

// Each pixel takes the mean of the section over its width, so that a drifting scratch does not shimmer.
constexpr ScratchShape MakeShape(const ScratchProfile& profile, const std::int32_t (&section)[kKnots]) {
    constexpr std::int32_t kSamples = 2 * kScratchPhases;  // per pixel, between the phase steps
    ScratchShape shape;
    shape.pixels = (profile.width + 1 + 3) / 4 * 4;
    for (std::int32_t phase = 0; phase < kScratchPhases; ++phase) {
        for (std::int32_t pixel = 0; pixel <= profile.width; ++pixel) {
            std::int32_t sum = 0;
            for (std::int32_t sample = 0; sample < kSamples; ++sample) {
                const std::int32_t offset = 2 * (pixel * kSamples + sample - 2 * phase) + 1;
                sum += SectionAt(section, offset, 2 * profile.width * kSamples);
            }
            shape.weights[static_cast<std::size_t>(phase)][static_cast<std::size_t>(pixel)] =
                static_cast<std::uint16_t>(sum * 255 / kSamples);
        }
    }
    return shape;
}

using ShapeTable = std::array<ScratchShape, kScratchProfiles>;

constexpr ShapeTable MakeShapes(const ScratchProfile (&profiles)[kScratchProfiles]) {
    ShapeTable shapes;
    for (int i = 0; i < kScratchProfiles; ++i) {
        shapes[static_cast<std::size_t>(i)] = i < kThinScratchProfiles
                                                  ? MakeShape(profiles[i], kThinSection)
                                                  : MakeShape(profiles[i], kThickSection);
    }
    return shapes;
}

constexpr ShapeTable kBlackShapes = MakeShapes(kBlackScratchProfiles);
constexpr ShapeTable kWhiteShapes = MakeShapes(kWhiteScratchProfiles);

}  // namespace

const ScratchShape& ScratchShapeOf(bool isWhite, std::int32_t index) noexcept {
    return (isWhite ? kWhiteShapes : kBlackShapes)[static_cast<std::size_t>(index)];
}

}  // namespace velmora::render
