// Turns the master settings' values into the settings of the stages.

#include "effects/master_settings.h"
#include "render/rounding.h"

namespace velmora {
namespace {

using render::Narrow;
using render::StageSettings;

float NormalisedOr(const MasterSettingsList& list, Master setting, float value) noexcept {
    list.GetPercentNormalised(setting, value);
    return value;
}

// Brightness and contrast: -1..1 with the slider's middle as 0. The slider holds 100 times the host's 0..1,
// so the signed getter gives 2 * host - 1 only after this second centring.
float CentredOr(const MasterSettingsList& list, Master setting, float value) noexcept {
    if (list.Find(setting, kClassPercentSlider) == nullptr) return value;
    list.GetPercentSigned(setting, value);
    return Narrow(2.0 * value - 1.0);
}

bool IsTicked(const MasterSettingsList& list, Master setting) noexcept {
    bool ticked = false;
    list.GetCheckBox(setting, ticked);
    return ticked;
}

void ReadTint(const MasterSettingsList& list, StageSettings& settings) noexcept {
    std::uint32_t colour = 0;
    float amount = 0.0f;
    if (list.Find(Master::kTintColour, kClassColourPicker) == nullptr ||
        list.Find(Master::kTint, kClassPercentSlider) == nullptr)
        return;
    list.GetColour(Master::kTintColour, colour);
    list.GetPercentNormalised(Master::kTint, amount);
    const double strength = 4.0 * amount - 3.0;
    const auto channel = [&](int shift) {
        const double value = (colour >> shift) & 0xFFu;
        return Narrow(0.5 + 0.5 * (value / 255.0 - 0.5) * strength);
    };
    settings.tintRed = channel(16);
    settings.tintGreen = channel(8);
    settings.tintBlue = channel(0);
}

// Amount and depth count only when a kind of scratch is on; their sum serves only as a seed.
void ReadScratches(const MasterSettingsList& list, StageSettings& settings) noexcept {
    constexpr double kLeast = 0.00001;
    settings.scratchKinds = (IsTicked(list, Master::kBlack) ? render::kScratchBlack : 0u) |
                            (IsTicked(list, Master::kWhite) ? render::kScratchWhite : 0u) |
                            (IsTicked(list, Master::kThick) ? render::kScratchThick : 0u);
    if (settings.scratchKinds == 0) return;
    settings.scratchConstant = 35;
    float amount = 0.0f;
    list.GetPercentRaw(Master::kScratches, amount);
    settings.scratchDepth = NormalisedOr(list, Master::kDepth, 0.0f);
    if (amount < kLeast || settings.scratchDepth < kLeast) return;
    const std::uint32_t count = render::RoundToUnsigned(amount / 6.25);
    settings.scratchCount = count == 0 ? 1 : count;
    settings.scratchSeed = Narrow(35.0 + settings.scratchDepth + amount);
}

}  // namespace

StageSettings ReadStageSettings(const MasterSettingsList& list) noexcept {
    StageSettings settings;
    list.GetInteger(Master::kYJitter, settings.yJitter);
    list.GetInteger(Master::kXJitter, settings.xJitter);
    list.GetColour(Master::kBorder, settings.borderColour);
    settings.glow = NormalisedOr(list, Master::kGlow, settings.glow);
    if (list.Find(Master::kSaturation, kClassPercentSlider) != nullptr) {
        settings.saturation = Narrow(4.0 * NormalisedOr(list, Master::kSaturation, 0.0f) - 3.0);
    }
    settings.flicker = NormalisedOr(list, Master::kFlicker, settings.flicker);
    settings.flickerRate = render::RoundToUnsigned(double{NormalisedOr(list, Master::kFlickerSpeed, 0.0f)} *
                                                   render::kFramesPerSecond);
    settings.brightness = CentredOr(list, Master::kBrightness, settings.brightness);
    settings.contrast = CentredOr(list, Master::kContrast, settings.contrast);
    settings.filmGamma = NormalisedOr(list, Master::kFilmGamma, settings.filmGamma);
    ReadTint(list, settings);
    settings.wear = NormalisedOr(list, Master::kWear, settings.wear);
    list.GetMenu(Master::kPattern, settings.wearPattern);
    settings.wearChannels =
        IsTicked(list, Master::kBlueChannelOnly) ? render::kWearBlueOnly : render::kWearAllChannels;
    ReadScratches(list, settings);
    list.GetPercentRaw(Master::kSpots, settings.spots);
    return settings;
}

}  // namespace velmora
