// Whether a file ends before what it holds: some decoders fill what is missing with grey or black and report nothing.
#pragma once

#include <string>

struct AVFormatContext;
struct AVPacket;

namespace velmora::hosts {

// True if a file ends before the length that its own header gives, or inside a packet of a format whose packets have
// one size. Only for formats whose readers do not report it: Matroska, AVI and MPEG-TS.
bool EndsEarly(const std::string& path, const std::string& format);

bool LacksEnd(const AVFormatContext& container, const AVPacket& packet);

}  // namespace velmora::hosts
