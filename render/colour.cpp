#include "render/colour.h"

#include <algorithm>
#include <bit>
#include <cmath>
#include <iterator>
#include <limits>

#include "render/random.h"
#include "render/rounding.h"

namespace velmora::render {
namespace {

bool IsNearZero(float value) noexcept {
    constexpr float kEpsilon = 0.00001f;
    return value > -kEpsilon && value < kEpsilon;
}

// The gain grows in steps with the contrast. The sliders reach 0.5 at most, so only the first step is used; the others
// continue the curve.
double ContrastGain(float contrast) noexcept {
    if (contrast < 0.0f) return 1.0 + contrast;
    struct Step {
        float below;
        double factor;
    };
    constexpr Step kSteps[] = {{0.6f, 10},  {0.7f, 12}, {0.75f, 15}, {0.8f, 19},
                               {0.85f, 24}, {0.9f, 30}, {0.95f, 40}};
    const auto step = std::find_if(std::begin(kSteps), std::end(kSteps),
                                   [contrast](const Step& s) { return contrast < s.below; });
    const double factor = step == std::end(kSteps) ? 254.0 : step->factor;
    return factor * contrast * contrast + 1.0;
}

std::uint8_t Saturate(std::int32_t value) noexcept {
    return static_cast<std::uint8_t>(std::clamp(value, 0, 255));
}

// The line with these factors that satisfies the bounds set by each entry; black and white set only one bound.
std::optional<ToneLine> LineBy(std::int32_t times, std::int32_t shift, const ByteTable& table) noexcept {
    std::int32_t least = -65535, most = 65535;
    for (std::size_t i = 0; i < table.size(); ++i) {
        const auto product = static_cast<std::int32_t>(
            (static_cast<std::uint32_t>(i) << 8) * static_cast<std::uint32_t>(times) >> 16);
        const std::int32_t from = (table[i] << shift) - product, to = from + (1 << shift) - 1;
        least = std::max(least, table[i] > 0 ? from : least);
        most = std::min(most, table[i] < 255 ? to : most);
    }
    if (least > most) return std::nullopt;
    const std::int32_t offset = (least + most) / 2;
    return ToneLine{static_cast<std::uint16_t>(times), static_cast<std::uint16_t>(std::max(offset, 0)),
                    static_cast<std::uint16_t>(std::max(-offset, 0)), static_cast<std::uint16_t>(shift)};
}

}  // namespace

std::optional<ToneLine> LineOf(const ByteTable& table, double slope) noexcept {
    constexpr std::int32_t kMostShift = 8, kFarthest = 8;
    if (!(slope >= 0.0 && slope <= 8.0)) return std::nullopt;
    std::int32_t shift = kMostShift;
    while (slope * 255.0 * (1 << shift) > 65535.0) --shift;
    const auto nearest = static_cast<std::int32_t>(slope * (256 << shift));
    for (std::int32_t step = 0; step <= 2 * kFarthest; ++step) {
        const std::int32_t times = nearest + (step % 2 == 0 ? -step / 2 : step / 2 + 1);
        if (times < 0 || times > 65535) continue;
        if (const auto line = LineBy(times, shift, table)) return line;
    }
    return std::nullopt;
}

float FlickerOffset(float seed, float flicker, std::uint32_t rate, double seconds,
                    std::uint32_t hostSeed) noexcept {
    // Much less than one draw, so it only absorbs the rounding error of the product.
    constexpr double kTolerance = 1e-9;
    constexpr double kPeriod = 4294967296.0;  // of the generator; only the count modulo this matters
    double draws = std::ceil(seconds * rate - kTolerance);
    draws = draws >= 1.0 ? std::min(draws, std::numeric_limits<double>::max()) : 1.0;
    Random random(SeedFor(std::bit_cast<std::uint32_t>(seed), hostSeed));
    random.Skip(static_cast<std::uint32_t>(std::fmod(draws, kPeriod)) - 1u);
    return Narrow(random.DrawDecimal(0.0f, flicker, 2) - 0.5 * flicker);
}

ByteTable BrightnessTable(float offset) noexcept {
    ByteTable table;
    for (std::int32_t i = 0; i < 256; ++i) {
        const double distance = offset > 0.0f ? 255 - i : i;
        table[static_cast<std::size_t>(i)] =
            static_cast<std::uint8_t>(i + RoundHalfAway(Narrow(distance * offset)));
    }
    return table;
}

ByteTable ContrastTable(float contrast) noexcept {
    const double gain = ContrastGain(contrast);
    ByteTable table;
    for (std::int32_t i = 0; i < 256; ++i) {
        const float x = Narrow(((i / 255.0 - 0.5) * gain + 0.5) * 255.0);
        table[static_cast<std::size_t>(i)] = static_cast<std::uint8_t>(x > 255.0f ? 255
                                                                       : x < 0.0f ? 0
                                                                                  : Truncate(x));
    }
    return table;
}

ColourStage PrepareColour(const StageSettings& settings, double seconds, ContrastCache& cache) noexcept {
    const float brightness = 0.5f * settings.brightness;
    const float contrast = 0.5f * settings.contrast;
    ColourStage stage;
    stage.m_mixes = !IsNearZero(settings.saturation);
    stage.m_active =
        stage.m_mixes || !IsNearZero(settings.flicker) || !IsNearZero(brightness) || !IsNearZero(contrast);
    if (!stage.m_active) return stage;

    float offset = 0.0f;
    if (!IsNearZero(settings.flicker)) {
        const Arrangement arrangement = settings.arrangement.value_or(OwnArrangement(settings));
        offset = FlickerOffset(arrangement.flickerSeed, settings.flicker, settings.flickerRate, seconds,
                               settings.hostSeed);
    }
    if (!IsNearZero(brightness)) {
        offset = std::clamp(Narrow(double{offset} + brightness), -1.0f, 1.0f);
    }
    stage.m_offset = offset;
    stage.m_tone = BrightnessTable(offset);
    if (offset != 0.0f) stage.AddLine(stage.m_tone, 1.0 - std::abs(double{offset}));
    if (!IsNearZero(contrast)) {
        if (cache.contrast != contrast) {
            cache.contrast = contrast;
            cache.table = ContrastTable(contrast);
        }
        stage.m_gain = ContrastGain(contrast);
        stage.AddLine(cache.table, *stage.m_gain);
        for (std::uint8_t& entry : stage.m_tone) entry = cache.table[entry];
    }
    stage.m_weight = static_cast<std::int16_t>(Truncate((0.0f - settings.saturation) * 127.0));
    return stage;
}

void ColourStage::AddLine(const ByteTable& table, double slope) noexcept {
    const std::optional<ToneLine> line = LineOf(table, slope);
    m_isLines = m_isLines && line;
    if (m_isLines) m_lines[m_lineCount++] = *line;
}

Bgra MixWithGrey(Bgra pixel, std::int32_t weight) noexcept {
    const std::int32_t luma = (76 * pixel.red + 149 * pixel.green + 30 * pixel.blue) >> 8;
    const std::int32_t grey = static_cast<std::int16_t>(luma * weight);
    const auto mix = [=](std::int32_t channel) { return Saturate(((127 - weight) * channel + grey) >> 7); };
    return {mix(pixel.blue), mix(pixel.green), mix(pixel.red), pixel.alpha};
}

}  // namespace velmora::render
