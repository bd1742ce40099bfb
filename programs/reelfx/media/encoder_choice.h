// Chooses the container, codec and pixel format of an output: what the user asks for, otherwise what suits
// the file name and is closest to the source.
#pragma once

#include <optional>
#include <string>

#include "programs/reelfx/media/av_handles.h"

namespace velmora::hosts {

struct OutputOptions {
    std::string path;                   // "-": standard output
    std::optional<std::string> format;  // container, by FFmpeg's name
    std::optional<std::string> codec;   // "libx264", "ffv1", ...
    std::optional<double> crf;          // constant quality, in the codec's own scale
    std::optional<std::string> pixelFormat;
    bool isRawBgra = false;   // only frames of raw BGRA
    bool needsAlpha = false;  // the pixel format must support transparency
};

// For the help: the codecs of the usual containers, and each codec's quality, if none is asked for.
std::string UsualCodecs();
std::string UsualQualities();

// Each throws Failure (kExitUsage) with one line when there is no match.
const AVOutputFormat& ChooseContainer(const OutputOptions& options);
const AVCodec& ChooseCodec(const OutputOptions& options, const AVOutputFormat& container);
AVPixelFormat ChoosePixelFormat(const OutputOptions& options, const AVCodec& codec,
                                const AVOutputFormat& container, const AVFrame& source);

// Sets quality, threads and the codec's own options, before it is opened.
void SetQuality(const OutputOptions& options, const AVCodec& codec, AVCodecContext& encoder);

// True for codecs that count frames at a constant rate instead of storing times.
bool NeedsConstantRate(const AVCodec& codec);

}  // namespace velmora::hosts
