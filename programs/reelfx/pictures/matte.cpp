#include "programs/reelfx/pictures/pictures.h"

#include <algorithm>
#include <cmath>
#include <string>

#include "text/number_text.h"

namespace velmora::hosts {
namespace {

// Evenly spaced around the middle, and away from the darkest and brightest values, which scratches change
// differently.
constexpr int kLow = 12, kMiddle = 128, kHigh = 244;

std::uint8_t Byte(double value) {
    return static_cast<std::uint8_t>(std::lround(std::clamp(value, 0.0, 255.0)));
}

void ReadPixel(std::uint8_t* pixel) {
    const int low = pixel[0], middle = pixel[1], high = pixel[2];
    // The best straight line through the three values.
    const double slope = static_cast<double>(high - low) / (kHigh - kLow);
    const std::uint8_t alpha = Byte(255.0 * (1.0 - slope));
    std::uint8_t grey = 0;
    if (alpha > 0) {
        // With the rounded alpha, exact in the middle.
        const double share = alpha / 255.0;
        grey = Byte(((low + middle + high) / 3.0 - (1.0 - share) * kMiddle) / share);
    }
    pixel[0] = pixel[1] = pixel[2] = grey;
    pixel[3] = alpha;
}

bool HasDamage(const EffectInfo& info) {
    return std::ranges::any_of(info.params, [](const ParamInfo& param) { return param.name == "Wear"; });
}

// Wear in one channel only would need an opacity for each channel.
void CheckChannels(const EffectChoice& choice) {
    for (std::uint32_t i = 0; i < choice.Info().params.size(); ++i) {
        const ParamInfo& param = choice.Info().params[i];
        if (param.name != "Blue Channel Only") continue;
        const std::vector<ValueWord> values = choice.ValuesOf(i);
        if (std::ranges::any_of(values, [](ValueWord value) { return value.flag != 0; })) {
            throw UsageError("--matte cannot show wear in one channel only; add --set \"" + param.name +
                             "=off\"");
        }
    }
}

}  // namespace

void CheckMatte(const std::vector<EffectChoice>& choices) {
    bool hasDamage = false;
    std::string names;
    for (const EffectChoice& choice : choices) {
        CheckChannels(choice);
        hasDamage = hasDamage || HasDamage(choice.Info());
        names += (names.empty() ? "\"" : ", \"") + choice.Info().name + '"';
    }
    if (hasDamage) return;
    throw UsageError("--matte needs damage, and " + names +
                     (choices.size() == 1 ? " has none" : " have none"));
}

void FillMatteGround(BgraPicture& picture) {
    for (std::int32_t y = 0; y < picture.Height(); ++y) {
        std::uint8_t* pixel = picture.Row(y);
        for (std::int32_t x = 0; x < picture.Width(); ++x, pixel += 4) {
            pixel[0] = kLow, pixel[1] = kMiddle, pixel[2] = kHigh, pixel[3] = 255;
        }
    }
}

void ReadMatte(BgraPicture& picture) {
    for (std::int32_t y = 0; y < picture.Height(); ++y) {
        std::uint8_t* pixel = picture.Row(y);
        for (std::int32_t x = 0; x < picture.Width(); ++x, pixel += 4) ReadPixel(pixel);
    }
}

}  // namespace velmora::hosts
