// The conversion between YCbCr and RGB in double precision, straight from the definitions: the yardstick for what
// reelfx's conversion loses. Nothing is rounded and nothing limited.
#pragma once

#include <array>
#include <vector>

namespace velmora::bench {

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
