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

    // The times of the input's frames in order, in the picture's time base, as its packets carry them. Only
    // their count means something where two have the same time or one has none. Reads through the input, but for
    // image sequences, without decoding it. Throws Failure (kExitInput), also for an input that can be read only once.
    static std::vector<std::int64_t> FrameTimes(const InputOptions& options);

    Item Next();

    // Goes on reading somewhere before `seconds` if the input can jump; else from where it is. The caller
    // skips what comes too early.
    void SeekBefore(double seconds);
    enum class Landing {
        kStayed,     // the input cannot jump
        kBefore,     // at the frame or one before it
        kElsewhere,  // the input jumps badly
    };
    // Jumps to the frame of the time `pts`, in the picture's time base, or not far before it.
    Landing SeekToFrame(std::int64_t pts);
    // Back to the first frame, by opening the input anew. Throws Failure (kExitInput).
    void Rewind();

    // The picture is not decoded any more; packets of other streams still come.
    void StopPicture() { m_pictureStopped = true; }

    [[nodiscard]] AVFormatContext& Container() const { return *m_container; }
    [[nodiscard]] AVStream& Picture() const { return *m_stream; }
    // Size, pixel format and colours are those of the first frame.
    [[nodiscard]] const AVFrame& FirstFrame() const { return *m_firstFrame; }
    [[nodiscard]] double SecondsOf(std::int64_t pts) const;
    // Time of a packet of any stream, for cutting; nothing when it carries none.
    [[nodiscard]] std::optional<double> SecondsOf(const AVPacket& packet) const;
    [[nodiscard]] AVRational FrameRateGuess() const;
    // Frames in the clip as far as the container tells; 0 when it does not.
    [[nodiscard]] std::int64_t FrameCountGuess() const;
    [[nodiscard]] const std::string& Name() const { return m_name; }
    // Packets that could not be decoded and were left out.
    [[nodiscard]] std::int64_t DamagedPackets() const { return m_damaged; }
    // Seconds that the container promises but does not hold; 0 as far as it is known to be whole.
    [[nodiscard]] double MissingSeconds() const;
    // Why reading ended before the clip did: the file is cut off or went away. Empty when it is whole as far as known.
    [[nodiscard]] const std::string& BreakOff() const { return m_breakOff; }

  private:
    struct CloseInput {
        void operator()(AVFormatContext* container) const { avformat_close_input(&container); }
    };

    struct Closed {};
    MediaReader(const InputOptions& options, Closed);  // nothing is opened yet

    void Open(const InputOptions& options);
    bool Jump(std::int64_t pts);
    // The next frame, which stays the next one; null at the end.
    const AVFrame* Peek();
    [[noreturn]] void FailReading(const std::string& text, int error = 0) const;
    [[nodiscard]] std::string BreakOffAt(int error) const;
    void OpenDecoder();
    void ReadMore();  // moves at least one packet on
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
    std::int64_t m_packetsEnd = 0;  // in the file: behind the last packet
    double m_secondsEnd = 0.0;      // by the container's clock: of the last packet
    bool m_isLastPartial = false;
    bool m_pictureStopped = false;
    bool m_ended = false;
};

}  // namespace velmora::hosts
