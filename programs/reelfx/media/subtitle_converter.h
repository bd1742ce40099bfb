// Converts text subtitles from the format of one container to that of another.
#pragma once

#include <functional>

#include "programs/reelfx/media/av_handles.h"

namespace velmora::hosts {

class SubtitleConverter {
  public:
    using Sink = std::function<void(AVPacket&)>;  // times in TimeBase

    // The text format that `format` holds for this source; AV_CODEC_ID_NONE if there is none or the subtitles are
    // pictures.
    static AVCodecID TargetOf(const AVStream& source, const AVOutputFormat& format);

    // Throws Failure (kExitOutput) when a codec cannot be opened.
    SubtitleConverter(const AVStream& source, AVCodecID target);

    [[nodiscard]] const AVCodecContext& Encoder() const { return *m_encoder; }
    void Send(const AVPacket& packet, const Sink& sink);

    static constexpr AVRational kTimeBase = {1, 1000};

  private:
    AVRational m_sourceBase;
    CodecPtr m_decoder, m_encoder;
};

}  // namespace velmora::hosts
