// Writes a clip: encodes the picture and takes along the source's other streams, chapters and tags. Times, pixel shape,
// colours, rotation, names and dates are those of the source, as far as the container can hold them.
#pragma once

#include <map>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "programs/reelfx/media/av_handles.h"
#include "programs/reelfx/media/encoder_choice.h"
#include "programs/reelfx/media/frame_times.h"
#include "programs/reelfx/media/media_reader.h"
#include "programs/reelfx/media/other_streams.h"
#include "programs/reelfx/media/picture_encoder.h"

namespace velmora::hosts {

class MediaWriter {
  public:
    // `address` is what to open (OutputPlace). Throws Failure: kExitUsage for unsuitable options, otherwise
    // kExitOutput. `source` must outlive the writer.
    MediaWriter(const OutputOptions& options, const std::string& address, const MediaReader& source,
                bool withOthers);
    MediaWriter(const MediaWriter&) = delete;
    MediaWriter& operator=(const MediaWriter&) = delete;

    // The number of the first file if the output is an image pattern; 1 if not called.
    void NumberImagesFrom(std::int64_t number) { m_options.Set("start_number", std::to_string(number)); }
    // Throws Failure (kExitUsage) if the output cannot hold so many frames (0: unknown).
    void CheckFrameCount(std::int64_t frames) const;
    // Checks, without writing, what can be checked: that the container supports the streams and can hold
    // `frames` frames (0: unknown). Nothing can be written afterwards.
    void Rehearse(std::int64_t frames);
    // "out.mp4: mp4, libx264 yuv420p, audio aac (copied)"
    [[nodiscard]] std::string Description() const;
    // What is left out or changed on purpose, a phrase each.
    [[nodiscard]] std::vector<std::string> Notes() const;
    // The same, as far as it is known only at the end.
    [[nodiscard]] std::vector<std::string> LateNotes() const;
    // Opens the output. Its header is written with the first frame or packet.
    void Begin();

    // The part of the source that is written, if it is not all of it.
    struct Section {
        std::int64_t pts;                  // of its first frame, in the time base of the source's picture
        std::int64_t index;                // of its first frame
        std::optional<double> endSeconds;  // since the source's first frame; nothing: its end
    };
    // The section's first frame gets the time 0. Before the first frame or packet; by default the start of the source's
    // container becomes 0, so that times stay as they are.
    void StartAt(const Section& section);

    // See PictureEncoder.
    [[nodiscard]] FramePtr NewResult(const AVFrame& source) const { return m_picture->NewResult(source); }
    [[nodiscard]] bool TakesAsItIs(const AVFrame& source) const { return m_picture->TakesAsItIs(source); }
    [[nodiscard]] bool IsUpright() const { return m_picture->IsUpright(); }
    // Frames of an output with a constant rate, per second; 0/1 if frames keep their times.
    [[nodiscard]] AVRational ConstantRate() const;

    void WriteFrame(FramePtr frame);           // times as in the source's picture
    void WritePacket(const AVPacket& packet);  // of another stream of the source
    // Completes the file. Without this call the file is damaged. `endSeconds` is when the frame after the last one
    // comes, since the source's first frame.
    void Finish(std::optional<double> endSeconds = {});

  private:
    struct FreeContainer {
        void operator()(AVFormatContext* container) const;
    };

    void WriteHeader();
    void Repeat(std::int64_t times);
    void EncodeAt(AVFrame& frame, std::int64_t pts, std::int64_t duration);
    void Encode(const AVFrame* frame);  // null: flush
    void Mux(AVPacket& packet, const AVStream& stream, AVRational timeBase);
    [[nodiscard]] double SecondsInOutput(std::int64_t pts) const;
    [[noreturn]] void Fail(int error) const;
    [[noreturn]] void FailOnePicture() const;

    std::string m_name;
    const MediaReader& m_source;
    int m_closeError = 0;  // from files that the container closes itself; outlives the container
    std::unique_ptr<AVFormatContext, FreeContainer> m_container;
    std::optional<PictureEncoder> m_picture;
    AVStream* m_stream = nullptr;
    std::optional<OtherStreams> m_others;
    AvOptions m_options;  // of the container
    std::int64_t m_origin;
    std::optional<FrameClock> m_clock;  // of a constant rate
    FramePtr m_previous;                // for repeating it
    std::string m_exif;
    bool m_holdsOnePicture = false;
    bool m_isSection = false;
    bool m_hasHeader = false;
    std::map<std::int64_t, std::int64_t>
        m_durations;  // by time, for the frames inside the encoder, which passes on only their times
    std::int64_t m_lastPts = AV_NOPTS_VALUE;
    std::map<int, std::int64_t> m_lastDts;  // by the output's stream index
};

}  // namespace velmora::hosts
