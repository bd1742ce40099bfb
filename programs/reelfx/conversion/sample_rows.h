// Rows of samples as floats, with padding on both sides, their transfer from and to frames, and the filter that gives
// chroma the size of luma and back.
#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "programs/reelfx/conversion/frame_coding.h"
#include "programs/reelfx/conversion/row_kernels.h"

namespace velmora::hosts {

class FloatRow {
  public:
    static constexpr int kPadding = 32;  // samples on each side; more than the taps reach

    explicit FloatRow(int width = 0)
        : m_samples(static_cast<std::size_t>(width) + 2 * static_cast<std::size_t>(kPadding)) {}
    [[nodiscard]] float* Samples() { return m_samples.data() + kPadding; }
    [[nodiscard]] const float* Samples() const { return m_samples.data() + kPadding; }
    // Repeats the first and the last of `count` samples into the padding.
    void ExtendEnds(int count);

  private:
    std::vector<float> m_samples;
};

// `y` counts rows of the component's own plane.
void ReadRow(const RowKernels& kernels, const AVFrame& frame, const ComponentLayout& layout, int y, int count,
             float* out);
// Adds `zero`, rounds to the nearest code number and limits to those that there are.
void WriteRow(const RowKernels& kernels, const float* in, const ComponentLayout& layout, float zero, int y,
              int count, AVFrame& frame);

// The rows or columns of chroma for so many of luma, of which one in 2^shift has chroma.
constexpr int ChromaSize(int lumaSize, int shift) {
    return (lumaSize + (1 << shift) - 1) >> shift;
}

// The weights by which chroma is interpolated to the size of luma, and reduced again: cubic interpolation with a
// slope of -0.6 one sample away, for reduction stretched over the samples that become one.

struct FilterTap {
    int place;  // of the sample; see below
    float weight;
};
using FilterTaps = std::vector<FilterTap>;  // their weights add up to 1

// One set of taps for each of `factor` luma samples: sample `factor` * i + p is the sum of the chroma samples
// i + place by the taps of p. `position` is that of the first chroma sample, in luma samples.
std::vector<FilterTaps> EnlargingTaps(int factor, double position);

// Chroma sample i is the sum of the luma samples `factor` * i + place.
FilterTaps ReducingTaps(int factor, double position);

// The sum of rows by their taps; row(place) gives the row for a tap, in which sample i is the one for output i.
template <class RowAt>
void SumRows(const RowKernels& kernels, const FilterTaps& taps, int count, float* out, const RowAt& row) {
    const float* rows[kMostTaps];
    float weights[kMostTaps];
    std::size_t used = 0;
    for (const FilterTap& tap : taps) {
        rows[used] = row(tap.place);
        weights[used++] = tap.weight;
    }
    kernels.weightedSums[used - 1](rows, weights, out, count);
}

}  // namespace velmora::hosts
