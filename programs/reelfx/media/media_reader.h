// Reads a clip: the frames of its picture in order of presentation, decoded, and the packets of its other
// streams as they come. Reads whatever the media libraries read: files, image sequences (see input_address.h),
// stills, addresses; "-" is standard input; raw BGRA where a size is given.
//
// Times count in seconds from the presentation of the clip's first frame.
#pragma once

#include <algorithm>
#include <deque>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "programs/reelfx/media/av_handles.h"
#include "programs/reelfx/media/input_address.h"
#include "programs/reelfx/media/bgra_picture.h"
#include "programs/reelfx/media/frame_times.h"

namespace velmora::hosts {

// The times of a clip's frames in order, in its picture's time base, as its packets give them.
struct FrameTimes {
    std::vector<std::int64_t> pts;
    bool isContinuous = true;  // false: the clock jumps, so that no frame can be found by its time
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

    // If two frames have the same time or one has none, only their count is meaningful. Reads the whole input
    // without decoding it, except for image sequences; with `frames` and `seconds`, only until the clip has more
    // frames and has lasted longer. Throws Failure (kExitInput), also for an input that can be read only once.
    static FrameTimes TimesOf(const InputOptions& options, std::optional<std::int64_t> frames = {},
                              double seconds = 0.0);

    Item Next();

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
    // Size, pixel format and colours are those of the first frame. Without its pixels, which would take memory to the
    // end.
    [[nodiscard]] const AVFrame& FirstFrame() const { return *m_firstFrame; }
    // Every picture of GIF and of raw BGRA has an alpha channel, and few are transparent: of such ones, the first frame is
    // not.
    [[nodiscard]] bool IsOpaque() const { return m_isOpaque; }
    // How players turn the picture.
    [[nodiscard]] PictureTurn Turn() const { return TurnOf(*m_stream, *m_firstFrame); }
    [[nodiscard]] AVRational PixelShape() const;  // 0/1 if unknown
    [[nodiscard]] double SecondsOf(std::int64_t pts) const;
    // The time of a packet of any stream, for cutting; nothing if it has none.
    [[nodiscard]] std::optional<double> SecondsOf(const AVPacket& packet) const;
    [[nodiscard]] AVRational FrameRateGuess() const;
    // The number of frames according to the container; 0 if unknown.
    [[nodiscard]] std::int64_t FrameCountGuess() const;
    // The picture's length according to the container; 0 if unknown.
    [[nodiscard]] double PictureSeconds() const;
    // Linear light is converted to display values for the effects, and back for formats that have it.
    [[nodiscard]] bool ConvertsLight() const { return !m_options.keepsLight; }
    [[nodiscard]] const std::string& Name() const { return m_name; }
    // The number of packets that could not be decoded and were skipped, and of pictures of a sequence that are cut off.
    [[nodiscard]] std::int64_t DamagedPackets() const;
    // True for a frame from a picture file that is cut off; part of it is grey or black.
    [[nodiscard]] bool IsCutOff(const AVFrame& frame) const {
        return std::ranges::find(m_cutOff, frame.pts) != m_cutOff.end();
    }
    // Seconds that are missing compared with the length in the container's header; 0 if nothing is known to
    // be missing.
    [[nodiscard]] double MissingSeconds() const;
    // Of numbered images that were read to the end: the first one that is missing while later ones are there.
    [[nodiscard]] std::string MissingImage() const;
    // "128x96" if a later frame has another size than the first; it was scaled. Otherwise empty.
    [[nodiscard]] const std::string& OtherSize() const { return m_otherSize; }
    // The EXIF block of a photograph, without its marker; empty if there is none.
    [[nodiscard]] const std::string& Exif() const { return m_exif; }
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
    [[nodiscard]] double ContainerEnd() const;
    void NoteExif(const AVPacket& packet);
    void OpenDecoder();
    void ReadMore();  // advances by at least one packet
    void Decode(const AVPacket* packet);
    void TakeFrames();
    void TakeUntimed(std::int64_t next);
    void TakeFrame(FramePtr frame);
    void KeepFirst(const AVFrame& frame);
    [[nodiscard]] std::int64_t TicksPerFrame() const;

    InputOptions m_options;
    std::string m_name;
    std::string m_breakOff;
    InputStreamPtr m_standardInput;  // outlives the container
    std::unique_ptr<AVFormatContext, CloseInput> m_container;
    AVStream* m_stream = nullptr;
    CodecPtr m_decoder;
    std::deque<Item> m_items;        // read ahead
    std::deque<FramePtr> m_untimed;  // decoded before any that has a time
    FramePtr m_firstFrame;
    bool m_isOpaque = false;
    TimeLine m_timeLine;
    std::string m_otherSize;
    std::string m_exif;
    std::int64_t m_lastPts = AV_NOPTS_VALUE;
    std::int64_t m_damaged = 0;
    std::vector<std::int64_t> m_cutOff;  // times of picture files that are cut off
    std::int64_t m_packetsEnd = 0;       // position in the file after the last packet
    double m_secondsEnd = 0.0;           // end of the last packet, in the container's time
    bool m_isLastPartial = false;
    bool m_pictureStopped = false;
    bool m_ended = false;
};

}  // namespace velmora::hosts
