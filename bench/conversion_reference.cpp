#include "bench/conversion.h"

#include <algorithm>
#include <cmath>

namespace velmora::bench {
namespace {

// The cubic of the family with value 1 at 0, 0 at the other whole numbers, and slope -0.6 at 1.
double Weight(double x) {
    x = std::abs(x);
    if (x <= 1.0) return 1.4 * x * x * x - 2.4 * x * x + 1.0;
    return x < 2.0 ? -0.6 * x * x * x + 3.0 * x * x - 4.8 * x + 2.4 : 0.0;
}

// The plane's value at a place between its samples. The cubic is stretched over so many of them.
double Filtered(const Plane& plane, double x, double y, int stretchX, int stretchY) {
    double sum = 0.0, weights = 0.0;
    const int left = static_cast<int>(std::floor(x)), top = static_cast<int>(std::floor(y));
    for (int v = top - 2 * stretchY; v <= top + 2 * stretchY + 1; ++v) {
        const double down = Weight((v - y) / stretchY);
        for (int u = left - 2 * stretchX; u <= left + 2 * stretchX + 1; ++u) {
            const double weight = down * Weight((u - x) / stretchX);
            if (weight == 0.0) continue;
            sum += weight * plane.Near(u, v);
            weights += weight;
        }
    }
    return sum / weights;
}

struct Scale {
    double black, luma, middle, chroma;
};

Scale ScaleOf(const YcbcrCoding& coding) {
    const double unit = std::pow(2.0, coding.depth - 8), highest = std::pow(2.0, coding.depth) - 1.0;
    if (coding.isFull) return {0.0, highest, 128.0 * unit, highest};
    return {16.0 * unit, 219.0 * unit, 128.0 * unit, 224.0 * unit};
}

}  // namespace

double Plane::Near(int x, int y) const {
    const int u = std::clamp(x, 0, width - 1), v = std::clamp(y, 0, height - 1);
    return samples[static_cast<std::size_t>(v) * static_cast<std::size_t>(width) +
                   static_cast<std::size_t>(u)];
}

Planes ExactRgb(const YcbcrCoding& coding, const Planes& codes) {
    const Scale scale = ScaleOf(coding);
    const int width = codes[0].width, height = codes[0].height;
    const double green = 1.0 - coding.red - coding.blue;
    Planes rgb = {Plane(width, height), Plane(width, height), Plane(width, height)};
    for (int y = 0; y < height; ++y) {
        for (int x = 0; x < width; ++x) {
            const double u = (x - coding.chromaX) / (1 << coding.chromaWidthShift);
            const double v = (y - coding.chromaY) / (1 << coding.chromaHeightShift);
            const double luma = (codes[0].Near(x, y) - scale.black) / scale.luma;
            const double cb = (Filtered(codes[1], u, v, 1, 1) - scale.middle) / scale.chroma;
            const double cr = (Filtered(codes[2], u, v, 1, 1) - scale.middle) / scale.chroma;
            const double r = luma + 2.0 * (1.0 - coding.red) * cr, b = luma + 2.0 * (1.0 - coding.blue) * cb;
            rgb[0].At(x, y) = r;
            rgb[1].At(x, y) = (luma - coding.red * r - coding.blue * b) / green;
            rgb[2].At(x, y) = b;
        }
    }
    return rgb;
}

Planes ExactCodes(const YcbcrCoding& coding, const Planes& rgb) {
    const Scale scale = ScaleOf(coding);
    const int width = rgb[0].width, height = rgb[0].height;
    const int stretchX = 1 << coding.chromaWidthShift, stretchY = 1 << coding.chromaHeightShift;
    const int chromaWidth = (width + stretchX - 1) / stretchX,
              chromaHeight = (height + stretchY - 1) / stretchY;
    Planes full = {Plane(width, height), Plane(width, height), Plane(width, height)};
    for (int y = 0; y < height; ++y) {
        for (int x = 0; x < width; ++x) {
            const double r = rgb[0].Near(x, y), g = rgb[1].Near(x, y), b = rgb[2].Near(x, y);
            const double luma = coding.red * r + (1.0 - coding.red - coding.blue) * g + coding.blue * b;
            full[0].At(x, y) = scale.black + scale.luma * luma;
            full[1].At(x, y) = scale.middle + scale.chroma * (b - luma) / (2.0 * (1.0 - coding.blue));
            full[2].At(x, y) = scale.middle + scale.chroma * (r - luma) / (2.0 * (1.0 - coding.red));
        }
    }
    Planes codes = {full[0], Plane(chromaWidth, chromaHeight), Plane(chromaWidth, chromaHeight)};
    for (int i = 1; i < 3; ++i) {
        const auto plane = static_cast<std::size_t>(i);
        for (int y = 0; y < chromaHeight; ++y) {
            for (int x = 0; x < chromaWidth; ++x) {
                codes[plane].At(x, y) = Filtered(full[plane], x * stretchX + coding.chromaX,
                                                 y * stretchY + coding.chromaY, stretchX, stretchY);
            }
        }
    }
    return codes;
}

}  // namespace velmora::bench
