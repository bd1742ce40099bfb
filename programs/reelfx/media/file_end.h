// Whether a file ends before what it holds: some decoders fill what is missing with grey or black and report nothing.
#pragma once

#include <cstdint>
#include <span>
#include <string>

extern "C" {
#include <libavcodec/codec_id.h>
}

namespace velmora::hosts {

// True when the file states a greater length than it has, or lacks the end that its format has. `format` is the name of
// the demuxer. False for what is no file or cannot be read.
bool EndsEarly(const std::string& path, const std::string& format);

// True for a picture in a file of its own that is cut off: JPEG, OpenEXR, QOI and Sun raster. `data` is the whole file.
bool LacksEnd(AVCodecID codec, std::span<const std::uint8_t> data);

}  // namespace velmora::hosts
