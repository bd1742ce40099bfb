// The source's streams beside its picture, as they go to the output: copied where the container can hold them, sound
// and text subtitles converted where it cannot, others left out.
#pragma once

#include <functional>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "programs/reelfx/media/av_handles.h"
#include "programs/reelfx/media/media_reader.h"
#include "programs/reelfx/media/transcoders.h"

namespace velmora::hosts {

class OtherStreams {
  public:
    // Takes a packet for a stream of the output, with times in a time base.
    using Sink = std::function<void(AVPacket&, const AVStream&, AVRational)>;

    // Adds the streams to `container`, which has the encoded picture; `audio` is the user's wish, "auto", "copy",
    // "none" or a codec. Throws Failure. `source` must outlive the object.
    OtherStreams(AVFormatContext& container, const MediaReader& source, std::string audio);

    // The pictures of covers, which come before all else.
    void WriteCovers(const Sink& sink) const;
    // `packet` is of the source and has the output's times, and the picture has come to `pictureSeconds`.
    void Write(const AVPacket& packet, double pictureSeconds, const Sink& sink);
    void Finish(const Sink& sink);

    // ", audio aac (copied)" for each
    [[nodiscard]] std::string Description() const;
    // What is left out or converted, a phrase each.
    [[nodiscard]] std::vector<std::string> Notes() const;
    // The same, after the last packet.
    [[nodiscard]] std::vector<std::string> LateNotes() const;

  private:
    struct Stream {
        AVStream* stream = nullptr;
        std::unique_ptr<SoundTranscoder> transcoder;
        std::unique_ptr<SubtitleConverter> converter;  // neither: packets are copied
        bool hasBegun = false;                         // copied pictures begin with a key frame
    };

    void Add(const AVStream& source);
    void AddSound(const AVStream& source);
    void AddSubtitle(const AVStream& source);
    [[nodiscard]] bool CanCopy(const AVStream& source) const;
    // The same for a stream that is encoded anew.
    [[nodiscard]] bool CanBegin(const AVStream& source, const AVCodecContext& encoder) const;
    [[nodiscard]] std::unique_ptr<SoundTranscoder> TranscoderFor(const AVStream& source) const;
    void AddStream(const AVStream& source, Stream stream);
    void LeaveOut(const AVStream& source);

    AVFormatContext& m_container;
    const MediaReader& m_source;
    std::string m_audio;
    std::map<int, Stream> m_streams;       // by the source's stream index
    std::map<std::string, int> m_leftOut;  // how many of what
    std::vector<std::string> m_conversions;
};

}  // namespace velmora::hosts
