#include "render/tint.h"

#include <cmath>
#include <cstddef>
#include <numbers>

#include "render/rounding.h"

namespace velmora::render {
namespace {

std::uint8_t RoundToByte(float value) noexcept {
    const double shifted = value + 0.5;
    if (shifted < 0.0) return 0;
    return static_cast<std::uint8_t>(shifted > 255.0 ? 255 : Truncate(shifted));
}

ByteTable Chain(const ByteTable& gamma, const ByteTable& tint) noexcept {
    ByteTable table;
    for (std::size_t i = 0; i < table.size(); ++i) table[i] = gamma[tint[gamma[i]]];
    return table;
}

}  // namespace

std::int32_t TintOffset(float tint) noexcept {
    const float centred = Narrow((tint - 0.5) * 0.5 + 0.5);
    const double scaled = Narrow(centred * 510.0) + 0.5;
    if (scaled < 0.0) return -255;
    if (scaled >= 4294967296.0) return -256;
    return static_cast<std::int32_t>(static_cast<std::uint32_t>(scaled) - 255u);
}

// The value grows by a step from entry to entry, in single precision: the curve is defined by the running sum, not by
// a product.
ByteTable TintTable(std::int32_t offset) noexcept {
    ByteTable table{};
    const std::int32_t black = offset > 0 ? -1 : -offset;  // last entry that stays black
    const float step = Narrow(offset > 0 ? (256 - offset) / 255.0 : 255.0 / (256 + offset));
    float value = offset > 0 ? static_cast<float>(offset) : step;
    for (std::int32_t i = black + 1; i < 256; ++i) {
        table[static_cast<std::size_t>(i)] = RoundToByte(value);
        value = Narrow(double{value} + step);
    }
    return table;
}

ByteTable FilmGammaTable(float gamma) noexcept {
    ByteTable table;
    for (std::size_t i = 0; i < table.size(); ++i) {
        const float x = static_cast<float>(i) * 0.00390625f;
        const float angle = Narrow(x * std::numbers::pi - std::numbers::pi / 2.0);
        const float sine = Narrow(std::sin(double{angle}));
        const float curve = Narrow((sine + 1.0) * 0.5);
        const float y = Narrow(double{curve} * gamma + x * (1.0 - gamma));
        table[i] = static_cast<std::uint8_t>(Truncate(y * 256.0));
    }
    return table;
}

TintStage PrepareTint(const StageSettings& settings) noexcept {
    const TintOffsets offsets = {TintOffset(settings.tintRed), TintOffset(settings.tintGreen),
                                 TintOffset(settings.tintBlue)};
    TintStage stage;
    stage.m_offsets = offsets;
    stage.m_gamma = settings.filmGamma;
    stage.m_active =
        offsets.red != 0 || offsets.green != 0 || offsets.blue != 0 || settings.filmGamma != 0.0f;
    if (!stage.m_active) return stage;
    const ByteTable gamma = FilmGammaTable(settings.filmGamma);
    stage.m_red = Chain(gamma, TintTable(offsets.red));
    stage.m_green = Chain(gamma, TintTable(offsets.green));
    stage.m_blue = Chain(gamma, TintTable(offsets.blue));
    return stage;
}

}  // namespace velmora::render
