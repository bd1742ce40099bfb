// What conversion_bench compares: the ways to convert a frame to BGRA and back, and the exact conversion as the yardstick.
#pragma once

#include <array>
#include <functional>
#include <string>
#include <vector>

#include "programs/reelfx/media/av_handles.h"
#include "programs/reelfx/media/bgra_picture.h"

namespace velmora::bench {

// The ways to convert (conversion_candidates.cpp, zimg_candidate.cpp).

struct Candidate {
    std::string name;
    std::function<void(const AVFrame&, hosts::BgraPicture&)> toBgra;
    std::function<void(const hosts::BgraPicture&, AVFrame&)> fromBgra;
};

// The library's scaler with these flags.
Candidate ScalerCandidate(const std::string& name, int flags);
// reelfx's own conversion, at the SIMD level that the environment selects.
Candidate OwnCandidate(const std::string& name);
// The zimg library at one of its levels (zimg_cpu_type_e); nothing if it was not there to build with.
std::vector<Candidate> ZimgCandidates();

// The conversion between YCbCr and RGB in double precision, straight from the definitions: the yardstick for what
// reelfx's conversion loses (conversion_reference.cpp). Nothing is rounded and nothing limited.

struct Plane {
    int width = 0, height = 0;
    std::vector<double> samples = {};

    Plane() = default;
    Plane(int w, int h)
        : width(w), height(h), samples(static_cast<std::size_t>(w) * static_cast<std::size_t>(h)) {}
    [[nodiscard]] double& At(int x, int y) {
        return samples[static_cast<std::size_t>(y) * static_cast<std::size_t>(width) +
                       static_cast<std::size_t>(x)];
    }
    // Beyond the plane its last samples go on.
    [[nodiscard]] double Near(int x, int y) const;
};
using Planes = std::array<Plane, 3>;  // red, green, blue from 0 to 1; or the code numbers of Y, Cb, Cr

struct YcbcrCoding {
    int depth;  // bits
    int chromaWidthShift, chromaHeightShift;
    double red, blue;  // of luma
    bool isFull;
    double chromaX, chromaY;  // of the first chroma sample, in luma samples
};

Planes ExactRgb(const YcbcrCoding& coding, const Planes& codes);
Planes ExactCodes(const YcbcrCoding& coding, const Planes& rgb);

}  // namespace velmora::bench
