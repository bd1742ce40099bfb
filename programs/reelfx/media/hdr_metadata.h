// What a display needs to know of high dynamic range: the mastering display and the light level.
#pragma once

#include "programs/reelfx/media/av_handles.h"

namespace velmora::hosts {

// Gives them to encoders that write them into the stream. Before the encoder is opened; `first` is the source's first
// frame. Also keeps the encoder's library from writing to standard error by itself.
void SetHdrMetadata(const AVStream& source, const AVFrame& first, const AVCodec& codec,
                    AVCodecContext& encoder);

// Gives them to the container, if only the source's frames have them.
void DescribeHdrMetadata(const AVFrame& first, AVStream& stream);

}  // namespace velmora::hosts
