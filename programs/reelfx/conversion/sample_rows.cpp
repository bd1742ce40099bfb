#include "programs/reelfx/conversion/sample_rows.h"

#include <algorithm>
#include <cmath>
#include <cstring>
#include <type_traits>

namespace velmora::hosts {
namespace {

using Storage = ComponentLayout::Storage;

constexpr std::uint16_t Swapped(std::uint16_t word) {
    return static_cast<std::uint16_t>(word << 8 | word >> 8);
}

// For samples that do not lie side by side.
template <class Sample, class Code>
void ReadApart(const std::uint8_t* in, int step, int count, float* out, const Code& code) {
    for (int i = 0; i < count; ++i, in += step) {
        Sample sample;
        std::memcpy(&sample, in, sizeof sample);
        out[i] = static_cast<float>(code(sample));
    }
}

template <class Sample, class Code>
void WriteApart(const float* in, int step, int count, std::uint8_t* out, const Code& code) {
    for (int i = 0; i < count; ++i, out += step) {
        const Sample sample = code(in[i]);
        std::memcpy(out, &sample, sizeof sample);
    }
}

double Cubic(double distance) {
    constexpr double kSlope = -0.6;
    const double d = std::abs(distance);
    if (d >= 2.0) return 0.0;
    if (d >= 1.0) return kSlope * (((d - 5.0) * d + 8.0) * d - 4.0);
    return ((kSlope + 2.0) * d - (kSlope + 3.0)) * d * d + 1.0;
}

// The taps around `centre`, for a cubic that is stretched by `stretch` samples.
FilterTaps TapsAround(double centre, int stretch) {
    constexpr double kNothing = 1e-9;
    const int first = static_cast<int>(std::floor(centre)) - 2 * stretch + 1;
    const int last = static_cast<int>(std::floor(centre)) + 2 * stretch;
    double sum = 0.0;
    for (int place = first; place <= last; ++place) sum += Cubic((place - centre) / stretch);
    FilterTaps taps;
    for (int place = first; place <= last; ++place) {
        const double weight = Cubic((place - centre) / stretch) / sum;
        if (std::abs(weight) > kNothing) taps.push_back({place, static_cast<float>(weight)});
    }
    return taps;
}

}  // namespace

void FloatRow::ExtendEnds(int count) {
    float* const samples = Samples();
    std::fill(samples - kPadding, samples, samples[0]);
    std::fill(m_samples.begin() + kPadding + count, m_samples.end(), samples[count - 1]);
}

void ReadRow(const RowKernels& kernels, const AVFrame& frame, const ComponentLayout& layout, int y, int count,
             float* out) {
    const std::uint8_t* const in =
        frame.data[layout.plane] + std::ptrdiff_t{y} * frame.linesize[layout.plane] + layout.offset;
    const int shift = layout.shift;
    switch (layout.storage) {
        case Storage::kByte:
            if (layout.step == 1) return kernels.readBytes(in, out, count);
            return ReadApart<std::uint8_t>(in, layout.step, count, out, [](auto x) { return x; });
        case Storage::kWord:
            if (layout.step == 2 && shift == 0)
                return kernels.readWords(reinterpret_cast<const std::uint16_t*>(in), out, count);
            return ReadApart<std::uint16_t>(in, layout.step, count, out, [&](auto x) { return x >> shift; });
        case Storage::kSwappedWord:
            return ReadApart<std::uint16_t>(in, layout.step, count, out,
                                            [&](auto x) { return Swapped(x) >> shift; });
        case Storage::kFloat:
            return ReadApart<float>(in, layout.step, count, out, [](auto x) { return x; });
    }
}

void WriteRow(const RowKernels& kernels, const float* in, const ComponentLayout& layout, float zero, int y,
              int count, AVFrame& frame) {
    std::uint8_t* const out =
        frame.data[layout.plane] + std::ptrdiff_t{y} * frame.linesize[layout.plane] + layout.offset;
    const float plus = zero + 0.5f;
    const auto highest = static_cast<float>((std::uint64_t{1} << layout.depth) - 1);
    const auto word = [&](float x) {
        const float code = x + plus > 0.0f ? std::min(x + plus, highest) : 0.0f;
        return static_cast<std::uint16_t>(static_cast<int>(code) << layout.shift);
    };
    switch (layout.storage) {
        case Storage::kByte:
            if (layout.step == 1) return kernels.writeBytes(in, out, count, plus, highest);
            return WriteApart<std::uint8_t>(in, layout.step, count, out,
                                            [&](float x) { return static_cast<std::uint8_t>(word(x)); });
        case Storage::kWord:
            if (layout.step == 2 && layout.shift == 0) {
                return kernels.writeWords(in, reinterpret_cast<std::uint16_t*>(out), count, plus, highest);
            }
            return WriteApart<std::uint16_t>(in, layout.step, count, out, word);
        case Storage::kSwappedWord:
            return WriteApart<std::uint16_t>(in, layout.step, count, out,
                                             [&](float x) { return Swapped(word(x)); });
        case Storage::kFloat:
            return WriteApart<float>(in, layout.step, count, out, [](float x) { return x; });
    }
}

std::vector<FilterTaps> EnlargingTaps(int factor, double position) {
    std::vector<FilterTaps> result;
    result.reserve(static_cast<std::size_t>(factor));
    for (int p = 0; p < factor; ++p) result.push_back(TapsAround((p - position) / factor, 1));
    return result;
}

FilterTaps ReducingTaps(int factor, double position) {
    return TapsAround(position, factor);
}

}  // namespace velmora::hosts
