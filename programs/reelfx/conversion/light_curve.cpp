#include "programs/reelfx/conversion/picture_view.h"

#include <algorithm>
#include <cstddef>
#include <vector>

#include "render/deep/light.h"

namespace velmora::hosts {
namespace {

template <typename Sample>
Sample Stored(float value, float white) {
    return static_cast<Sample>(value > 0.0f ? std::min(value, 1.0f) * white + 0.5f : 0.0f);
}

// Where red, green, blue and alpha lie in a pixel of bytes.
constexpr int kBytePlaces[4] = {2, 1, 0, 3};

void Put(SampleType type, std::uint8_t* row, std::ptrdiff_t pixel, int channel, float value) {
    const std::ptrdiff_t at = pixel * 4 + channel;
    if (type == SampleType::kFloats) reinterpret_cast<float*>(row)[at] = value;
    if (type == SampleType::kWords)
        reinterpret_cast<std::uint16_t*>(row)[at] = Stored<std::uint16_t>(value, 65535.0f);
    if (type == SampleType::kBytes)
        row[pixel * 4 + kBytePlaces[channel]] = Stored<std::uint8_t>(value, 255.0f);
}

float Get(SampleType type, const std::uint8_t* row, std::ptrdiff_t pixel, int channel) {
    const std::ptrdiff_t at = pixel * 4 + channel;
    if (type == SampleType::kFloats) return reinterpret_cast<const float*>(row)[at];
    if (type == SampleType::kWords)
        return static_cast<float>(reinterpret_cast<const std::uint16_t*>(row)[at]) / 65535.0f;
    return static_cast<float>(row[pixel * 4 + kBytePlaces[channel]]) / 255.0f;
}

using Curve = decltype(render::LightToDisplay);

void Convert(const ConstPictureView& from, const PictureView& to, Curve& curve) {
    std::vector<float> colours(static_cast<std::size_t>(to.width) * 3);
    for (std::int32_t y = 0; y < to.height; ++y) {
        const std::uint8_t* const in = from.Row(y);
        std::uint8_t* const out = to.Row(y);
        auto colour = colours.begin();
        for (std::ptrdiff_t x = 0; x < to.width; ++x) {
            for (int c = 0; c < 3; ++c) *colour++ = Get(from.samples, in, x, c);
        }
        curve(render::LightCurve::kSrgb, colours.data(), to.width * 3, render::BestSimdLevel());
        colour = colours.begin();
        for (std::ptrdiff_t x = 0; x < to.width; ++x) {
            for (int c = 0; c < 3; ++c) Put(to.samples, out, x, c, *colour++);
            Put(to.samples, out, x, 3, Get(from.samples, in, x, 3));
        }
    }
}

}  // namespace

void DisplayOfLight(const ConstPictureView& light, const PictureView& display) {
    Convert(light, display, render::LightToDisplay);
}

void LightOfDisplay(const ConstPictureView& display, const PictureView& light) {
    Convert(display, light, render::DisplayToLight);
}

}  // namespace velmora::hosts
