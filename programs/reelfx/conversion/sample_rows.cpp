#include "programs/reelfx/conversion/sample_rows.h"

#include <algorithm>
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

}  // namespace velmora::hosts
