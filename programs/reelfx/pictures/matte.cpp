#include "programs/reelfx/pictures/matte.h"

#include <algorithm>
#include <cmath>
#include <string_view>

#include "programs/common/usage_error.h"

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

}  // namespace

void CheckMatte(const EffectChoice& choice) {
    const auto session = choice.NewSession();
    bool hasDamage = false;
    for (std::uint32_t i = 0; i < choice.Info().params.size(); ++i) {
        const ParamInfo& param = choice.Info().params[i];
        hasDamage = hasDamage || param.name == std::string_view("Wear");
        if (param.name == std::string_view("Blue Channel Only") && session->Value(i).flag != 0) {
            throw UsageError("--matte cannot show wear in one channel only; add --set \"" + param.name + "=off\"");
        }
    }
    if (!hasDamage) throw UsageError("--matte needs damage, and \"" + choice.Info().name + "\" has none");
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
