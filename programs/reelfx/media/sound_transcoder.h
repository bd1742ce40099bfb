// Encodes the sound of a source stream with another codec when the output's container does not support its
// own.
#pragma once

#include <functional>

#include "programs/reelfx/media/av_handles.h"

struct AVAudioFifo;

namespace velmora::hosts {

class SoundTranscoder {
  public:
    using Sink = std::function<void(AVPacket&)>;  // times in the encoder's time base

    // Throws Failure when either codec cannot be opened.
    SoundTranscoder(const AVStream& source, const AVCodec& target, bool globalHeader);
    ~SoundTranscoder();
    SoundTranscoder(const SoundTranscoder&) = delete;
    SoundTranscoder& operator=(const SoundTranscoder&) = delete;

    [[nodiscard]] const AVCodecContext& Encoder() const { return *m_encoder; }

    // A null `packet` ends the stream: the rest goes to the sink.
    void Send(const AVPacket* packet, const Sink& sink);

  private:
    void TakeDecoded(const Sink& sink);
    void Resample(AVFrame& frame);
    void Encode(int samples, const Sink& sink);
    void TakeEncoded(const Sink& sink);

    AVRational m_sourceBase;
    CodecPtr m_decoder, m_encoder;
    ResamplerPtr m_resampler;
    AVAudioFifo* m_fifo = nullptr;
    std::int64_t m_nextPts = AV_NOPTS_VALUE;  // of the oldest sample in the queue, in samples
};

}  // namespace velmora::hosts
