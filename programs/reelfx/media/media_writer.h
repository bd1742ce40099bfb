// Writes a clip: encodes the picture and copies the source's other streams if the container supports them;
// otherwise sound is encoded with another codec. Rate, times, pixel shape, colours, rotation, names and dates
// are those of the source.
#pragma once

#include <map>
#include <memory>
#include <string>

#include "programs/reelfx/media/av_handles.h"
#include "programs/reelfx/media/encoder_choice.h"
#include "programs/reelfx/media/media_reader.h"
#include "programs/reelfx/media/sound_transcoder.h"

namespace velmora::hosts {

class MediaWriter {
  public:
    // `address` is what to open (OutputPlace). Throws Failure: kExitUsage for unsuitable options, otherwise
    // kExitOutput. `source` must outlive the writer.
    MediaWriter(const OutputOptions& options, const std::string& address, const MediaReader& source,
                bool withSound);
    MediaWriter(const MediaWriter&) = delete;
    MediaWriter& operator=(const MediaWriter&) = delete;

    // The number of the first file if the output is an image pattern; 1 if not called.
    void NumberImagesFrom(std::int64_t number) { m_options.Set("start_number", std::to_string(number)); }
    // Checks, without writing, what can be checked: that the container supports the streams and can hold
    // `frames` frames (0: unknown). Nothing can be written afterwards.
    void Rehearse(std::int64_t frames);
    // "out.mp4: mp4, libx264 yuv420p, audio aac (copied)"
    [[nodiscard]] std::string Description() const;
    // Opens the output and writes its header.
    void Begin();

    // The source's time that becomes 0 in the output, in the time base of its picture. Before the first
    // frame or packet; by default the start of the source's container, so that times stay as they are.
    void StartAt(std::int64_t pts) { m_origin = pts; }

    // A frame with planes of its own for the pixels of `source`'s result. Safe to call from many threads.
    [[nodiscard]] FramePtr NewResult(const AVFrame& source) const;

    // True when the encoder accepts the source's own samples.
    [[nodiscard]] bool TakesAsItIs(const AVFrame& source) const;

    void WriteFrame(FramePtr frame);           // times as in the source's picture
    void WritePacket(const AVPacket& packet);  // of another stream of the source
    // Completes the file. Without this call the file is damaged.
    void Finish();

  private:
    struct FreeContainer {
        void operator()(AVFormatContext* container) const;
    };
    struct OtherStream {
        AVStream* stream;
        std::unique_ptr<SoundTranscoder> transcoder;  // null: packets are copied
    };

    void AddPicture(const OutputOptions& options);
    void SetUpEncoder(const OutputOptions& options, const AVCodec& codec);
    void DescribeColours(AVCodecContext& encoder) const;
    void AddOtherStreams();
    void AddOtherStream(const AVStream& source);
    void Encode(const AVFrame* frame);  // null: flush
    void Mux(AVPacket& packet, const AVStream& stream, AVRational timeBase);
    [[noreturn]] void Fail(int error) const;
    [[noreturn]] void FailOnePicture() const;

    std::string m_name;
    const MediaReader& m_source;
    int m_closeError = 0;  // from files that the container closes itself; outlives the container
    std::unique_ptr<AVFormatContext, FreeContainer> m_container;
    AVStream* m_stream = nullptr;
    CodecPtr m_encoder;
    std::map<int, OtherStream> m_others;  // by the source's stream index
    AvOptions m_options;                  // of the container
    std::int64_t m_origin;
    bool m_holdsOnePicture = false;
    // By time, for the frames inside the encoder, which passes on only their times.
    std::map<std::int64_t, std::int64_t> m_durations;
    std::int64_t m_lastPts = AV_NOPTS_VALUE;
};

}  // namespace velmora::hosts
