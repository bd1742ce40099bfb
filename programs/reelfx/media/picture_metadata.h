// Data that lie inside a picture or its stream, beside the pixels: the EXIF block of photographs, and what displays use to
// show high dynamic range (HDR10: the mastering display and the content's light level). Both are kept when the picture
// is encoded anew.
#pragma once

#include <string>

#include "programs/reelfx/media/av_handles.h"

namespace velmora::hosts {

// The EXIF block for a picture whose pixels are upright.
std::string UprightExif(std::string exif);

// The JPEG in `packet` with the block in it; the same packet if the block does not fit.
PacketPtr WithExif(const AVPacket& packet, const std::string& exif);

// Passes the HDR metadata to encoders that write it into the stream. Called before the encoder is opened; `first` is the
// source's first frame. Also keeps the encoder's library from writing to standard error by itself.
void SetHdrMetadata(const AVStream& source, const AVFrame& first, const AVCodec& codec,
                    AVCodecContext& encoder);

// Passes the HDR metadata to the container, if only the source's frames have it.
void DescribeHdrMetadata(const AVFrame& first, AVStream& stream);

}  // namespace velmora::hosts
