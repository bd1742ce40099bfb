// Which container, codec and pixel format an output gets: what the user asks for, else what suits the file's
// name and stays closest to the source.
#pragma once

#include <optional>
#include <string>

#include "programs/reelfx/media/av_handles.h"

namespace velmora::hosts {

struct OutputOptions {
    std::string path;                   // "-": standard output
    std::optional<std::string> format;  // container, by the media library's name
    std::optional<std::string> codec;   // "libx264", "ffv1", ...
    std::optional<double> crf;          // constant quality, in the codec's own scale
    std::optional<std::string> pixelFormat;
    bool isRawBgra = false;   // frames of raw BGRA and nothing else
    bool needsAlpha = false;  // the pixel format must carry transparency
};

// Each throws Failure (kExitUsage) with one line when there is no such thing.
const AVOutputFormat& ChooseContainer(const OutputOptions& options);
const AVCodec& ChooseCodec(const OutputOptions& options, const AVOutputFormat& container);
AVPixelFormat ChoosePixelFormat(const OutputOptions& options, const AVCodec& codec,
                                const AVOutputFormat& container, const AVFrame& source);

// Quality, threads and the codec's own options; before it is opened.
void SetQuality(const OutputOptions& options, const AVCodec& codec, AVCodecContext& encoder);

// Codecs that count frames at a constant rate instead of carrying times.
bool NeedsConstantRate(const AVCodec& codec);

}  // namespace velmora::hosts
