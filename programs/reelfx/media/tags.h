// Names, dates and other text that containers hold, and chapters, as they go from a source to an output.
#pragma once

#include <cstdint>
#include <optional>

#include "programs/reelfx/media/av_handles.h"

namespace velmora::hosts {

// Without what describes the source's own file.
void CopyContainerTags(const AVFormatContext& from, AVFormatContext& to);
// `isEncodedAnew`: without what describes the source's own encoding.
void CopyStreamTags(const AVStream& from, AVStream& to, bool isEncodedAnew);

// The part of the source that is written, in seconds of the source's clock.
struct TagSpan {
    double origin = 0.0;        // becomes 0
    double begin = 0.0;         // chapters that end before are left out
    std::optional<double> end;  // the end of the source if not given
};
void CopyChapters(const AVFormatContext& from, const TagSpan& span, AVFormatContext& to);

// Moves the time code in `tags`, if there is one, by a number of frames.
void MoveTimecode(AVDictionary*& tags, AVRational rate, std::int64_t frames);

}  // namespace velmora::hosts
