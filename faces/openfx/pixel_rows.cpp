#include "faces/openfx/pixel_rows.h"

#include <algorithm>
#include <cstring>
#include <limits>

#include "render/deep/light.h"

namespace velmora::hosts::openfx {
namespace {

// Samples need not be aligned.
template <typename Sample>
Sample Get(const std::byte* at) noexcept {
    Sample sample;
    std::memcpy(&sample, at, sizeof sample);
    return sample;
}
template <typename Sample>
void Put(std::byte* at, Sample sample) noexcept {
    std::memcpy(at, &sample, sizeof sample);
}

template <typename Sample>
constexpr float kWhite = std::numeric_limits<Sample>::max();
template <>
constexpr float kWhite<float> = 1.0f;

template <typename Sample>
float ToUnit(Sample sample) noexcept {
    return static_cast<float>(sample) / kWhite<Sample>;
}
template <typename Sample>
Sample FromUnit(float value) noexcept {
    // Not a number counts as 0.
    const float scaled = value > 0.0f ? std::min(value, 1.0f) * kWhite<Sample> : 0.0f;
    return static_cast<Sample>(scaled + 0.5f);
}
template <>
float FromUnit<float>(float value) noexcept {
    return value;
}

bool IsLinear(WorkingSpace space) noexcept {
    return space == WorkingSpace::kLinearSrgb || space == WorkingSpace::kLinear24;
}

using Curve = void (*)(render::LightCurve curve, float* numbers, std::int32_t count,
                       render::SimdLevel level) noexcept;

// The colours of `count` pixels of floats from light to display values, or back, in parts that stay in the first-level
// cache.
void Convert(Curve convert, const PixelFormat& format, std::byte* pixels, int count) noexcept {
    constexpr int kPart = 512;
    float colours[3 * kPart];
    const auto curve =
        format.space == WorkingSpace::kLinear24 ? render::LightCurve::kGamma : render::LightCurve::kSrgb;
    const render::SimdLevel level = render::BestSimdLevel();
    const std::size_t step = static_cast<std::size_t>(format.channels) * sizeof(float);
    constexpr std::size_t kColours = 3 * sizeof(float);
    for (int done = 0; done < count; done += kPart) {
        const int part = std::min(kPart, count - done);
        for (int i = 0; i < part; ++i)
            std::memcpy(colours + 3 * i, pixels + step * static_cast<std::size_t>(i), kColours);
        convert(curve, colours, 3 * part, level);
        for (int i = 0; i < part; ++i)
            std::memcpy(pixels + step * static_cast<std::size_t>(i), colours + 3 * i, kColours);
        pixels += step * static_cast<std::size_t>(part);
    }
}

int DividedByte(int colour, int alpha) noexcept {
    return alpha == 0 ? 0 : std::min((colour * 255 + alpha / 2) / alpha, 255);
}
int MultipliedByte(int colour, int alpha) noexcept {
    return (colour * alpha + 127) / 255;
}

// The working bytes are in the order of the library's pixels.
void LoadBytes(const PixelFormat& format, const std::byte* host, std::byte* work, int count) noexcept {
    for (int i = 0; i < count; ++i, host += format.channels, work += 4) {
        const auto alpha = format.channels == 4 ? host[3] : std::byte{255};
        work[0] = host[2];
        work[1] = host[1];
        work[2] = host[0];
        work[3] = alpha;
        if (!format.isDividedHere || alpha == std::byte{255}) continue;
        for (int c = 0; c < 3; ++c) {
            work[c] = static_cast<std::byte>(
                DividedByte(std::to_integer<int>(work[c]), std::to_integer<int>(alpha)));
        }
    }
}

template <typename Sample>
void LoadFloats(const PixelFormat& format, const std::byte* host, std::byte* work, int count) noexcept {
    for (int i = 0; i < count; ++i, host += format.HostBytes(), work += format.WorkBytes()) {
        const float alpha = format.channels == 4 ? ToUnit(Get<Sample>(host + 3 * sizeof(Sample))) : 1.0f;
        for (int c = 0; c < 3; ++c) {
            float value = ToUnit(Get<Sample>(host + static_cast<std::size_t>(c) * sizeof(Sample)));
            if (format.isDividedHere) value = alpha > 0.0f ? value / alpha : 0.0f;
            Put(work + static_cast<std::size_t>(c) * sizeof(float), value);
        }
        if (format.channels == 4) Put(work + 3 * sizeof(float), alpha);
    }
}

// One pixel as the host codes it. A shifted picture and its border bring their own alpha.
void FinishBytes(const PixelFormat& format, const std::byte* work, std::uint8_t (&out)[4]) noexcept {
    const int alpha = std::to_integer<int>(work[3]);
    for (int c = 0; c < 3; ++c) {
        const int value = std::to_integer<int>(work[2 - c]);
        out[c] = static_cast<std::uint8_t>(format.isDividedHere && alpha != 255 ? MultipliedByte(value, alpha)
                                                                                : value);
    }
    out[3] = static_cast<std::uint8_t>(alpha);
}
template <typename Sample>
void FinishFloats(const PixelFormat& format, const std::byte* work, Sample (&out)[4]) noexcept {
    const float alpha = format.channels == 4 ? Get<float>(work + 3 * sizeof(float)) : 1.0f;
    for (int c = 0; c < 3; ++c) {
        const float value = Get<float>(work + static_cast<std::size_t>(c) * sizeof(float));
        out[c] = FromUnit<Sample>(format.isDividedHere ? value * alpha : value);
    }
    out[3] = FromUnit<Sample>(alpha);
}

template <typename Sample>
Sample Mixed(Sample original, Sample result, float share) noexcept {
    const float mixed =
        static_cast<float>(original) + (static_cast<float>(result) - static_cast<float>(original)) * share;
    return static_cast<Sample>(mixed + 0.5f);
}
template <>
float Mixed<float>(float original, float result, float share) noexcept {
    return original + (result - original) * share;
}

// `finish(work, pixel)` gives a pixel in the host's samples, always with alpha.
template <typename Sample, typename Finish>
void Store(const PixelFormat& format, const std::byte* work, const std::byte* original, const float* share,
           std::byte* host, int count, Finish finish) noexcept {
    const std::size_t hostBytes = format.HostBytes(), workBytes = format.WorkBytes();
    const auto channels = static_cast<std::size_t>(format.channels);
    for (int i = 0; i < count; ++i, work += workBytes, original += hostBytes, host += hostBytes) {
        const float part = share == nullptr ? 1.0f : share[i];
        if (part <= 0.0f) {
            std::memmove(host, original, hostBytes);
            continue;
        }
        Sample pixel[4];
        finish(work, pixel);
        for (std::size_t c = 0; c < channels; ++c) {
            const std::size_t at = c * sizeof(Sample);
            Put(host + at, part >= 1.0f ? pixel[c] : Mixed(Get<Sample>(original + at), pixel[c], part));
        }
    }
}

}  // namespace

PixelFormat::PixelFormat(const HostImage& image, WorkingSpace workingSpace) noexcept
    : depth(image.Depth()), channels(image.Channels()), space(workingSpace) {
    const bool isDivided = image.IsPremultiplied() && space != WorkingSpace::kNone;
    if (!IsLinear(space) && depth == Depth::kByte) work = WorkKind::kBytes;
    if (!IsLinear(space) && depth == Depth::kShort) work = WorkKind::kShorts;
    isDividedHere = isDivided && (IsLinear(space) || work == WorkKind::kBytes);
    isDividedByRenderer = isDivided && !isDividedHere;
}

void LoadRow(const PixelFormat& format, const std::byte* host, std::byte* work, int count) noexcept {
    const bool isCopied = !IsLinear(format.space) && !format.isDividedHere;
    if (format.work == WorkKind::kBytes) {
        LoadBytes(format, host, work, count);
    } else if (isCopied) {
        std::memcpy(work, host, static_cast<std::size_t>(count) * format.HostBytes());
    } else if (format.depth == Depth::kByte) {
        LoadFloats<std::uint8_t>(format, host, work, count);
    } else if (format.depth == Depth::kShort) {
        LoadFloats<std::uint16_t>(format, host, work, count);
    } else {
        LoadFloats<float>(format, host, work, count);
    }
    if (IsLinear(format.space)) Convert(render::LightToDisplay, format, work, count);
}

void StoreRow(const PixelFormat& format, std::byte* work, const std::byte* original, const float* share,
              std::byte* host, int count) noexcept {
    if (IsLinear(format.space)) Convert(render::DisplayToLight, format, work, count);
    const auto floats = [&format](const std::byte* pixel, auto& out) { FinishFloats(format, pixel, out); };
    if (format.work == WorkKind::kBytes) {
        Store<std::uint8_t>(
            format, work, original, share, host, count,
            [&format](const std::byte* pixel, auto& out) { FinishBytes(format, pixel, out); });
    } else if (format.work == WorkKind::kShorts) {
        Store<std::uint16_t>(
            format, work, original, share, host, count,
            [&format](const std::byte* pixel, auto& out) { std::memcpy(out, pixel, format.WorkBytes()); });
    } else if (format.depth == Depth::kByte) {
        Store<std::uint8_t>(format, work, original, share, host, count, floats);
    } else if (format.depth == Depth::kShort) {
        Store<std::uint16_t>(format, work, original, share, host, count, floats);
    } else {
        Store<float>(format, work, original, share, host, count, floats);
    }
}

void AlphaRow(const HostImage& mask, const std::byte* host, float times, float* out, int count) noexcept {
    const auto size = static_cast<std::size_t>(SampleBytes(mask.Depth()));
    const auto channels = static_cast<std::size_t>(mask.Channels());
    host += (channels - 1) * size;
    for (int i = 0; i < count; ++i, host += channels * size) {
        float alpha = 0.0f;
        if (mask.Depth() == Depth::kByte) alpha = ToUnit(Get<std::uint8_t>(host));
        if (mask.Depth() == Depth::kShort) alpha = ToUnit(Get<std::uint16_t>(host));
        if (mask.Depth() == Depth::kFloat) alpha = Get<float>(host);
        out[i] = alpha > 0.0f ? std::min(alpha, 1.0f) * times : 0.0f;
    }
}

}  // namespace velmora::hosts::openfx
