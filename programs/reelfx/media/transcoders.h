// Streams that change their codec because the output's container does not hold their own: sound and text subtitles. The
// picture has an encoder of its own (picture_encoder.h).
#pragma once

#include <cstdint>
#include <functional>

#include "programs/reelfx/media/av_handles.h"

struct AVAudioFifo;

namespace velmora::hosts {

// Sound, from the source's codec to another.
class SoundTranscoder {
  public:
    using Sink = std::function<void(AVPacket&)>;  // times in the encoder's time base

    // Throws Failure when either codec cannot be opened.
    SoundTranscoder(const AVStream& source, const AVCodec& target, const AVOutputFormat& container);
    ~SoundTranscoder();
    SoundTranscoder(const SoundTranscoder&) = delete;
    SoundTranscoder& operator=(const SoundTranscoder&) = delete;

    [[nodiscard]] const AVCodecContext& Encoder() const { return *m_encoder; }

    // How far the picture goes as far as known, in seconds of the output. Sound that is much later after a long gap has a
    // damaged time, and no silence is put before it.
    void SetPictureEnd(double seconds) { m_pictureEnd = seconds; }
    // A null `packet` ends the stream: the rest goes to the sink.
    void Send(const AVPacket* packet, const Sink& sink);
    // True when there were damaged times.
    [[nodiscard]] bool HasWrongTimes() const { return m_hasWrongTimes; }

  private:
    void TakeDecoded(const Sink& sink);
    void FillGap(std::int64_t pts, const Sink& sink);
    [[nodiscard]] bool IsWrong(std::int64_t pts, std::int64_t missing) const;
    void Resample(AVFrame& frame);
    void FlushResampler();
    [[nodiscard]] FramePtr NewSamples(int samples) const;  // in the encoder's format; not set
    void Queue(const AVFrame& frame, int samples);
    void EncodeBlocks(const Sink& sink);
    void Encode(int samples, const Sink& sink);
    void TakeEncoded(const Sink& sink);

    AVRational m_sourceBase;
    CodecPtr m_decoder, m_encoder;
    ResamplerPtr m_resampler;
    AVAudioFifo* m_fifo = nullptr;
    std::int64_t m_nextPts = AV_NOPTS_VALUE;  // of the oldest sample in the queue, in samples
    double m_pictureEnd = 0.0;
    bool m_hasWrongTimes = false;
};

// Text subtitles, from the format of one container to that of another.
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
