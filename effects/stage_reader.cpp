// How the master settings' values become what the stages are to do.

#include "effects/master_settings.h"
#include "render/rounding.h"

namespace velmora {
namespace {

using render::Narrow;
using render::StageSettings;

float NormalisedOr(const MasterSettingsList& list, std::uint32_t id, float value) noexcept {
    list.GetPercentNormalised(id, value);
    return value;
}

// Brightness and contrast: -1..1 with the slider's middle as 0. The slider holds 100 times the host's 0..1,
// so the signed getter gives 2 * host - 1 only after this second centring.
float CentredOr(const MasterSettingsList& list, std::uint32_t id, float value) noexcept {
    if (list.Find(id, kClassPercentSlider) == nullptr) return value;
    list.GetPercentSigned(id, value);
    return Narrow(2.0 * value - 1.0);
}

bool IsTicked(const MasterSettingsList& list, std::uint32_t id) noexcept {
    bool ticked = false;
    list.GetCheckBox(id, ticked);
    return ticked;
}

void ReadTint(const MasterSettingsList& list, StageSettings& settings) noexcept {
    std::uint32_t colour = 0;
    float amount = 0.0f;
    if (list.Find(502, kClassColourPicker) == nullptr || list.Find(503, kClassPercentSlider) == nullptr)
        return;
    list.GetColour(502, colour);
    list.GetPercentNormalised(503, amount);
    const double strength = 4.0 * amount - 3.0;
    const auto channel = [&](int shift) {
        const double value = (colour >> shift) & 0xFFu;
        return Narrow(0.5 + 0.5 * (value / 255.0 - 0.5) * strength);
    };
    settings.tintRed = channel(16);
    settings.tintGreen = channel(8);
    settings.tintBlue = channel(0);
}

// Amount and depth count only when a kind of scratch is on; the sum of the two is a seed and nothing else.
void ReadScratches(const MasterSettingsList& list, StageSettings& settings) noexcept {
    constexpr double kLeast = 0.00001;
    settings.scratchKinds = (IsTicked(list, 704) ? render::kScratchBlack : 0u) |
                            (IsTicked(list, 705) ? render::kScratchWhite : 0u) |
                            (IsTicked(list, 706) ? render::kScratchThick : 0u);
    if (settings.scratchKinds == 0) return;
    settings.scratchConstant = 35;
    float amount = 0.0f;
    list.GetPercentRaw(701, amount);
    settings.scratchDepth = NormalisedOr(list, 702, 0.0f);
    if (amount < kLeast || settings.scratchDepth < kLeast) return;
    const std::uint32_t count = render::RoundToUnsigned(amount / 6.25);
    settings.scratchCount = count == 0 ? 1 : count;
    settings.scratchSeed = Narrow(35.0 + settings.scratchDepth + amount);
}

}  // namespace

StageSettings ReadStageSettings(const MasterSettingsList& list) noexcept {
    StageSettings settings;
    list.GetInteger(101, settings.yJitter);
    list.GetInteger(102, settings.xJitter);
    list.GetColour(103, settings.borderColour);
    settings.glow = NormalisedOr(list, 201, settings.glow);
    if (list.Find(301, kClassPercentSlider) != nullptr) {
        settings.saturation = Narrow(4.0 * NormalisedOr(list, 301, 0.0f) - 3.0);
    }
    settings.flicker = NormalisedOr(list, 302, settings.flicker);
    settings.flickerRate =
        render::RoundToUnsigned(double{NormalisedOr(list, 303, 0.0f)} * render::kFramesPerSecond);
    settings.brightness = CentredOr(list, 304, settings.brightness);
    settings.contrast = CentredOr(list, 305, settings.contrast);
    settings.filmGamma = NormalisedOr(list, 501, settings.filmGamma);
    ReadTint(list, settings);
    settings.wear = NormalisedOr(list, 601, settings.wear);
    list.GetMenu(602, settings.wearPattern);
    settings.wearChannels = IsTicked(list, 603) ? render::kWearBlueOnly : render::kWearAllChannels;
    ReadScratches(list, settings);
    list.GetPercentRaw(707, settings.spots);
    return settings;
}

}  // namespace velmora
