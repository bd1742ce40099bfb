// Containers, the formats of media files: what they can hold, and the texts and chapters that they carry.
#pragma once

#include <cstdint>
#include <optional>
#include <string>

#include "programs/reelfx/media/av_handles.h"

namespace velmora::hosts {

// What a container can hold (container_contents.cpp): as the libraries say, and where they do not, as an attempt to write a
// header shows.

// The format of a name such as "matroska", or of a file name extension such as "mkv"; null if there is none.
const AVOutputFormat* FormatNamed(const std::string& name);

// True if streams of the codec can be stored, as far as that depends on the codec alone.
bool CanHold(const AVOutputFormat& format, AVCodecID codec);

// A stream that is not in the container yet.
struct NewStream {
    const AVCodecParameters& parameters;
    AVRational timeBase;
    int disposition;
};

// True if a file can begin with the streams of `container` and another one. Formats limit their number too.
bool CanBegin(const AVFormatContext& container, const NewStream& other);

// True for containers that can say how players must turn the picture.
bool HoldsTurn(const AVOutputFormat& format);

// True if players learn from the container or the codec that values have full range.
bool HoldsRange(const AVOutputFormat& format, AVCodecID codec);

bool IsMovFamily(const AVOutputFormat& format);

// False for formats that hold only pictures.
bool HoldsOtherStreams(const AVOutputFormat& format);

// Names, dates and other text that containers hold, and chapters, as they go from a source to an output (tags.cpp).

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
