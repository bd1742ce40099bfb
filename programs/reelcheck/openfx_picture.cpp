// Pictures of our OpenFX host.

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <cstring>
#include <string_view>

#include "programs/reelcheck/openfx_objects.h"

namespace velmora::reelcheck {
namespace {

int RowBytes(const PictureShape& shape) {
    const int bytes = shape.Width() * shape.Channels() * shape.SampleBytes() + shape.padding;
    return shape.isTopDown ? -bytes : bytes;
}

std::size_t MemorySize(const PictureShape& shape) {
    // The last row has no padding.
    return static_cast<std::size_t>(std::abs(RowBytes(shape)) * shape.Height() - shape.padding);
}

}  // namespace

int PictureShape::Channels() const {
    const std::string_view name = components;
    return name == kOfxImageComponentAlpha ? 1 : name == kOfxImageComponentRGB ? 3 : 4;
}

int PictureShape::SampleBytes() const {
    const std::string_view name = depth;
    return name == kOfxBitDepthByte ? 1 : name == kOfxBitDepthShort ? 2 : 4;
}

OfxRectI PictureShape::Region() const {
    const bool isGiven = region.x1 != region.x2;
    return isGiven ? region : bounds;
}

HostPicture::HostPicture(const PictureShape& own)
    : shape(own), rowBytes(RowBytes(own)), memory(MemorySize(own), own.edge) {}

std::uint8_t* HostPicture::Pixel(int x, int y) const {
    const int row = shape.isTopDown ? shape.bounds.y2 - 1 - y : y - shape.bounds.y1;
    return memory.Data() + std::ptrdiff_t{row} * std::abs(rowBytes) +
           std::ptrdiff_t{x - shape.bounds.x1} * PixelBytes();
}

double HostPicture::Sample(int x, int y, int channel) const {
    const std::uint8_t* const at = Pixel(x, y) + std::ptrdiff_t{channel} * shape.SampleBytes();
    std::uint16_t whole = 0;
    float number = 0.0f;
    switch (shape.SampleBytes()) {
        case 1:
            return *at / 255.0;
        case 2:
            std::memcpy(&whole, at, sizeof whole);
            return whole / 65535.0;
        default:
            std::memcpy(&number, at, sizeof number);
            return number;
    }
}

void HostPicture::SetSample(int x, int y, int channel, double value) {
    std::uint8_t* const at = Pixel(x, y) + std::ptrdiff_t{channel} * shape.SampleBytes();
    const auto whole = static_cast<std::uint16_t>(std::lround(std::clamp(value, 0.0, 1.0) * 65535.0));
    const auto number = static_cast<float>(value);
    switch (shape.SampleBytes()) {
        case 1:
            *at = static_cast<std::uint8_t>(std::lround(std::clamp(value, 0.0, 1.0) * 255.0));
            break;
        case 2:
            std::memcpy(at, &whole, sizeof whole);
            break;
        default:
            std::memcpy(at, &number, sizeof number);
            break;
    }
}

void HostPicture::Paint(Dice& dice, bool isWide) {
    const int channels = shape.Channels();
    for (int y = shape.bounds.y1; y < shape.bounds.y2; ++y) {
        for (int x = shape.bounds.x1; x < shape.bounds.x2; ++x) {
            const double across = double(x - shape.bounds.x1) / shape.Width();
            const double up = double(y - shape.bounds.y1) / shape.Height();
            const double noise = dice.Unit();
            double colours[3] = {across, up, 0.5 * across + 0.5 * noise};
            if (dice.OneIn(16)) std::ranges::fill(colours, dice.OneIn(2) ? 1.0 : 0.0);
            double alpha = channels == 3 || x % 5 != 0 ? 1.0 : noise;
            for (int c = 0; c < std::min(channels, 3); ++c) {
                double value = isWide ? colours[c] * 2.5 - 0.5 : colours[c];
                if (shape.isPremultiplied) value *= alpha;
                SetSample(x, y, c, channels == 1 ? noise : value);
            }
            if (channels == 4) SetSample(x, y, 3, alpha);
        }
    }
}

void HostPicture::Fill(std::uint8_t byte) const {
    std::memset(memory.Data(), byte, memory.Size());
}

bool HostPicture::IsSameAs(const HostPicture& other) const {
    const auto width = static_cast<std::size_t>(shape.Width()) * static_cast<std::size_t>(PixelBytes());
    for (int y = shape.bounds.y1; y < shape.bounds.y2; ++y) {
        if (std::memcmp(Pixel(shape.bounds.x1, y), other.Pixel(shape.bounds.x1, y), width) != 0) return false;
    }
    return true;
}

}  // namespace velmora::reelcheck
