// What a container can hold: by what the libraries say, and where they do not say it by trying to write a header.
#pragma once

#include <string>

#include "programs/reelfx/media/av_handles.h"

namespace velmora::hosts {

// True if streams of the codec can be stored, as far as that depends on the codec alone.
bool CanHold(const AVOutputFormat& format, AVCodecID codec);

// True if a file of the format can begin with this picture and this other stream.
bool CanBegin(const AVOutputFormat& format, const AVCodecParameters& picture, const AVStream& other);

// True for containers that can say how players must turn the picture.
bool HoldsTurn(const AVOutputFormat& format);

// True if players learn from the container or the codec that values have full range.
bool HoldsRange(const AVOutputFormat& format, AVCodecID codec);

bool IsMovFamily(const AVOutputFormat& format);

// False for formats of nothing but pictures.
bool HoldsOtherStreams(const AVOutputFormat& format);

}  // namespace velmora::hosts
