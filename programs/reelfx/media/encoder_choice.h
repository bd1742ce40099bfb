// Chooses the container, codec and pixel format of an output: what the user asks for, otherwise what suits
// the file name and is closest to the source.
#pragma once

#include <optional>
#include <string>

#include "text/number_text.h"
#include "programs/reelfx/media/av_handles.h"

namespace velmora::hosts {

struct OutputOptions {
    std::string path;                   // "-": standard output
    std::optional<std::string> format;  // container, by FFmpeg's name
    std::optional<std::string> codec;   // "libx264", "ffv1", ...
    std::optional<double> crf;          // constant quality, in the codec's own scale
    std::optional<std::string> pixelFormat;
    std::optional<FrameRate> fps;  // constant; by default the source's times
    std::string audio = "auto";    // or "copy", "none", or a codec
    bool isUpright = false;        // turned pixels instead of a tag
    bool isRawBgra = false;        // only frames of raw BGRA
    bool needsAlpha = false;       // the pixel format must support transparency
};

// The picture that is encoded.
struct PictureSource {
    AVCodecID codec;
    int width, height;  // as written
    AVPixelFormat format;
    bool isInterlaced;
    bool hasAlpha;  // which should be kept if the container can
};

// For the help: the codecs of the usual containers, and each codec's quality, if none is asked for.
std::string UsualCodecs();
std::string UsualQualities();

// Each throws Failure (kExitUsage) with one line when there is no match.
const AVOutputFormat& ChooseContainer(const OutputOptions& options);
// The source's own codec if there is no loss in that, otherwise the container's usual one.
const AVCodec& ChooseCodec(const OutputOptions& options, const AVOutputFormat& container,
                           const PictureSource& source);
AVPixelFormat ChoosePixelFormat(const OutputOptions& options, const AVCodec& codec,
                                const AVOutputFormat& container, const PictureSource& source);

// Straight alpha, not a palette's.
bool CarriesAlpha(AVPixelFormat format);

// Sets quality, threads and the codec's own options, before it is opened.
void SetQuality(const OutputOptions& options, const AVCodec& codec, AVCodecContext& encoder);

// True for codecs that count frames at a constant rate instead of storing times.
bool NeedsConstantRate(const AVCodec& codec);

}  // namespace velmora::hosts
