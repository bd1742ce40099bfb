// What the samples of the media libraries' frames mean: where they lie in memory, and which colour they stand for.
#pragma once

#include <array>
#include <cstdint>
#include <optional>

extern "C" {
#include <libavutil/frame.h>
#include <libavutil/pixfmt.h>
}

namespace velmora::hosts {

// If a stream has no matrix tag, players assume BT.709 for high definition and BT.601 below.
AVColorSpace EffectiveMatrix(AVColorSpace space, int width, int height);

bool IsRgb(AVPixelFormat format);

struct FrameCoding {
    int width, height;
    AVPixelFormat format;
    AVColorSpace space;
    AVColorRange range;
    AVChromaLocation chroma;
    bool operator==(const FrameCoding&) const = default;
};
FrameCoding CodingOf(const AVFrame& frame);

// Floating-point samples proportional to light. The tags of other formats are not to be trusted in this.
bool IsLinearLight(const AVFrame& frame);

// RGB, grey and the old formats named "yuvj" have full range whatever their tag says.
bool IsFullRange(const FrameCoding& coding);

// Where the samples of one component lie. The first of a row is `offset` bytes after the start of the row, the next
// one `step` bytes further.
struct ComponentLayout {
    enum class Storage : std::uint8_t { kByte, kWord, kSwappedWord, kFloat };
    int plane, step, offset;
    int shift;  // unused bits below the sample
    int depth;  // bits; 32 if it is a float
    Storage storage;
};

struct SampleLayout {
    enum class Colours : std::uint8_t { kYcbcr, kGrey, kRgb };
    Colours colours;
    bool hasAlpha;
    int chromaWidthShift, chromaHeightShift;
    std::array<ComponentLayout, 4> components;  // Y, Cb, Cr or red, green, blue; the last is alpha

    [[nodiscard]] int ColourCount() const { return colours == Colours::kGrey ? 1 : 3; }
};

// Nothing for palettes, samples of less than 8 bits, samples that are no whole bytes and the like.
std::optional<SampleLayout> LayoutOf(AVPixelFormat format);

// The colours of samples, as their code numbers: rgb[i] = sum of toRgb[i][k] * (code[k] - zero[k]), where 0 is black
// and 1 is white; code[k] = sum of fromRgb[k][i] * rgb[i] + zero[k].
struct CodeMatrix {
    std::array<std::array<double, 3>, 3> toRgb, fromRgb;
    std::array<double, 3> zero;
};
CodeMatrix MatrixOf(const FrameCoding& coding, const SampleLayout& layout);

// The position of the first chroma sample, in luma samples from the first of them.
struct ChromaPosition {
    double x, y;
};
ChromaPosition ChromaPositionOf(const FrameCoding& coding, const SampleLayout& layout);

}  // namespace velmora::hosts
