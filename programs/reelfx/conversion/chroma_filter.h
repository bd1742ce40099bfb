// The weights by which chroma is interpolated to the size of luma, and reduced again: cubic interpolation with a
// slope of -0.6 one sample away, for reduction stretched over the samples that become one.
#pragma once

#include <vector>

namespace velmora::hosts {

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

}  // namespace velmora::hosts
