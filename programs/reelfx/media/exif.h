// The EXIF block of photographs: kept when a photograph becomes another one.
#pragma once

#include <string>

#include "programs/reelfx/media/av_handles.h"

namespace velmora::hosts {

// The block for a picture whose pixels are upright.
std::string UprightExif(std::string exif);

// The JPEG in `packet` with the block in it; the same packet if the block does not fit.
PacketPtr WithExif(const AVPacket& packet, const std::string& exif);

}  // namespace velmora::hosts
