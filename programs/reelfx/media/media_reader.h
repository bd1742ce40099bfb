// Reads a clip: the frames of its picture in order of presentation, decoded, and the packets of its other
// streams as they come. Reads whatever the media libraries read: files, image sequences ("frames-%03d.png"),
// stills, addresses; "-" is YUV4MPEG2 on standard input; raw BGRA where a size is given.
//
// Times count in seconds from the presentation of the clip's first frame.
#pragma once

#include <deque>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "text/number_text.h"
#include "programs/reelfx/media/av_handles.h"
#include "programs/reelfx/media/standard_input.h"

namespace velmora::hosts {

struct InputOptions {
    std::string path;
    std::optional<FrameSize> rawSize;  // the input is raw BGRA of this size
    std::optional<FrameRate> rate;     // of raw input and image sequences
};

class MediaReader {
  public:
    // One of the two is set; neither at the end.
    struct Item {
        FramePtr frame;    // of the picture; pts in the stream's time base, strictly increasing
        PacketPtr packet;  // of another stream
    };

    // Opens the input and decodes its first frame. Throws Failure (kExitInput) when it cannot be read or has
    // no frame.
    explicit MediaReader(const InputOptions& options);

    // The times of the input's frames in order, in the picture's time base, as its packets give them. If two
    // have the same time or one has none, only their count is meaningful. Reads the whole input without
    // decoding it, except for image sequences. Throws Failure (kExitInput), also for an input that can be
    // read only once.
    static std::vector<std::int64_t> FrameTimes(const InputOptions& options);

    Item Next();

    // Continues reading somewhere before `seconds` if the input can jump, otherwise from the current
    // position. The caller skips frames that are too early.
    void SeekBefore(double seconds);
    enum class Landing {
        kStayed,     // the input cannot jump
        kBefore,     // at the frame or one before it
        kElsewhere,  // the jump went elsewhere
    };
    // Jumps to the frame at time `pts`, in the picture's time base, or to a little before it.
    Landing SeekToFrame(std::int64_t pts);
    // Goes back to the first frame by reopening the input. Throws Failure (kExitInput).
    void Rewind();

    // Stops decoding the picture; packets of other streams still come.
    void StopPicture() { m_pictureStopped = true; }

    [[nodiscard]] AVFormatContext& Container() const { return *m_container; }
    [[nodiscard]] AVStream& Picture() const { return *m_stream; }
    // Size, pixel format and colours are those of the first frame.
    [[nodiscard]] const AVFrame& FirstFrame() const { return *m_firstFrame; }
    [[nodiscard]] double SecondsOf(std::int64_t pts) const;
    // The time of a packet of any stream, for cutting; nothing if it has none.
    [[nodiscard]] std::optional<double> SecondsOf(const AVPacket& packet) const;
    [[nodiscard]] AVRational FrameRateGuess() const;
    // The number of frames according to the container; 0 if unknown.
    [[nodiscard]] std::int64_t FrameCountGuess() const;
    [[nodiscard]] const std::string& Name() const { return m_name; }
    // The number of packets that could not be decoded and were skipped.
    [[nodiscard]] std::int64_t DamagedPackets() const { return m_damaged; }
    // Seconds that are missing compared with the length in the container's header; 0 if nothing is known to
    // be missing.
    [[nodiscard]] double MissingSeconds() const;
    // Why reading stopped early: the file is cut off or was removed. Empty if the clip is complete as far as
    // known.
    [[nodiscard]] const std::string& BreakOff() const { return m_breakOff; }

  private:
    struct CloseInput {
        void operator()(AVFormatContext* container) const { avformat_close_input(&container); }
    };

    struct Closed {};
    MediaReader(const InputOptions& options, Closed);  // nothing is opened yet

    void Open(const InputOptions& options);
    bool Jump(std::int64_t pts);
    // Looks at the next frame without consuming it; null at the end.
    const AVFrame* Peek();
    [[noreturn]] void FailReading(const std::string& text, int error = 0) const;
    [[nodiscard]] std::string BreakOffAt(int error) const;
    void OpenDecoder();
    void ReadMore();  // advances by at least one packet
    void Decode(const AVPacket* packet);
    void TakeFrames();

    InputOptions m_options;
    std::string m_name;
    std::string m_breakOff;
    InputStreamPtr m_standardInput;  // outlives the container
    std::unique_ptr<AVFormatContext, CloseInput> m_container;
    AVStream* m_stream = nullptr;
    CodecPtr m_decoder;
    std::deque<Item> m_items;  // read ahead
    FramePtr m_firstFrame;
    std::int64_t m_lastPts = AV_NOPTS_VALUE;
    std::int64_t m_damaged = 0;
    std::int64_t m_packetsEnd = 0;  // position in the file after the last packet
    double m_secondsEnd = 0.0;      // end of the last packet, in the container's time
    bool m_isLastPartial = false;
    bool m_pictureStopped = false;
    bool m_ended = false;
};

}  // namespace velmora::hosts
