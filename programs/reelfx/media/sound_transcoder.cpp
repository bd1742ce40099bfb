#include "programs/reelfx/media/transcoders.h"

#include <algorithm>

#include "programs/reelfx/common/failure.h"

extern "C" {
#include <libavutil/audio_fifo.h>
#include <libavutil/channel_layout.h>
}

namespace velmora::hosts {
namespace {

constexpr std::int64_t kBitRatePerChannel = 96000;
constexpr int kMxfRate = 48000;  // the only one that the library writes
constexpr int kQueuePiece = 1024;
// Containers round times, some to milliseconds. What is missing for longer than this is filled with silence, in seconds.
constexpr double kLeastGap = 0.05;
// A longer gap is real only if the picture goes about as far.
constexpr double kLongGap = 60.0;
constexpr double kBehindPicture = 5.0;

int NearestRate(const AVCodec& codec, int wanted) {
    if (!codec.supported_samplerates) return wanted;
    int best = *codec.supported_samplerates;
    for (const int* rate = codec.supported_samplerates; *rate != 0; ++rate) {
        if (std::abs(*rate - wanted) < std::abs(best - wanted)) best = *rate;
    }
    return best;
}

CodecPtr OpenDecoder(const AVStream& source) {
    const AVCodec* codec = avcodec_find_decoder(source.codecpar->codec_id);
    if (!codec) throw Failure(kExitInput, "the sound cannot be decoded; use --no-sound to leave it out");
    CodecPtr decoder = Allocated<CodecPtr>(avcodec_alloc_context3(codec));
    avcodec_parameters_to_context(decoder.get(), source.codecpar);
    decoder->pkt_timebase = source.time_base;
    const int error = avcodec_open2(decoder.get(), codec, nullptr);
    ThrowIfNoMemory(error);
    if (error < 0) {
        throw Failure(kExitInput, "the sound cannot be decoded; use --no-sound to leave it out");
    }
    return decoder;
}

// The source's channels if the codec takes as many, otherwise the most that it takes.
void ChooseLayout(const AVCodec& codec, const AVCodecContext& decoder, AVCodecContext& encoder) {
    constexpr int kMostChannels = 8;
    const int channels = std::min(decoder.ch_layout.nb_channels, kMostChannels);
    const AVChannelLayout* chosen = nullptr;
    for (const AVChannelLayout* layout = codec.ch_layouts; layout && layout->nb_channels > 0; ++layout) {
        const bool isSame = av_channel_layout_compare(layout, &decoder.ch_layout) == 0;
        const bool isCloser =
            layout->nb_channels <= channels && (!chosen || layout->nb_channels > chosen->nb_channels);
        if (isSame || isCloser) chosen = layout;
        if (isSame) break;
    }
    if (chosen) {
        av_channel_layout_copy(&encoder.ch_layout, chosen);
    } else {
        av_channel_layout_default(&encoder.ch_layout, channels);
    }
}

// Lossless codecs keep the depth that the source has.
AVSampleFormat ClosestFormat(const AVCodec& codec, AVSampleFormat wanted) {
    if (!codec.sample_fmts) return wanted;
    for (const AVSampleFormat* format = codec.sample_fmts; *format != AV_SAMPLE_FMT_NONE; ++format) {
        if (av_get_packed_sample_fmt(*format) == av_get_packed_sample_fmt(wanted)) return *format;
    }
    return codec.sample_fmts[0];
}

}  // namespace

SoundTranscoder::SoundTranscoder(const AVStream& source, const AVCodec& target,
                                 const AVOutputFormat& container)
    : m_sourceBase(source.time_base), m_decoder(OpenDecoder(source)) {
    m_encoder = Allocated<CodecPtr>(avcodec_alloc_context3(&target));
    ChooseLayout(target, *m_decoder, *m_encoder);
    const int channels = m_encoder->ch_layout.nb_channels;
    const bool isMxf = std::string(container.name).starts_with("mxf");
    m_encoder->sample_rate = NearestRate(target, isMxf ? kMxfRate : m_decoder->sample_rate);
    m_encoder->sample_fmt = ClosestFormat(target, m_decoder->sample_fmt);
    m_encoder->bit_rate = kBitRatePerChannel * channels;
    m_encoder->time_base = {1, m_encoder->sample_rate};
    m_encoder->thread_count = 1;
    if ((container.flags & AVFMT_GLOBALHEADER) != 0) m_encoder->flags |= AV_CODEC_FLAG_GLOBAL_HEADER;
    const int error = avcodec_open2(m_encoder.get(), &target, nullptr);
    ThrowIfNoMemory(error);
    if (error < 0) {
        throw Failure(kExitOutput, "the sound cannot be encoded; use --no-sound to leave it out");
    }
    m_resampler = Allocated<ResamplerPtr>(swr_alloc());
    m_fifo = av_audio_fifo_alloc(m_encoder->sample_fmt, channels, 4096);
    if (!m_fifo) throw std::bad_alloc();
}

SoundTranscoder::~SoundTranscoder() {
    if (m_fifo) av_audio_fifo_free(m_fifo);
}

void SoundTranscoder::Send(const AVPacket* packet, const Sink& sink) {
    // A damaged packet leaves a gap in the sound; that is no reason to stop.
    avcodec_send_packet(m_decoder.get(), packet);
    TakeDecoded(sink);
    if (packet) return;
    FlushResampler();
    Encode(av_audio_fifo_size(m_fifo), sink);
    avcodec_send_frame(m_encoder.get(), nullptr);
    TakeEncoded(sink);
}

void SoundTranscoder::TakeDecoded(const Sink& sink) {
    const FramePtr frame = NewFrame();
    while (avcodec_receive_frame(m_decoder.get(), frame.get()) >= 0) {
        const std::int64_t time = frame->best_effort_timestamp;
        const bool hasTime = time != AV_NOPTS_VALUE;
        const std::int64_t pts = hasTime ? av_rescale_q(time, m_sourceBase, m_encoder->time_base) : 0;
        if (m_nextPts == AV_NOPTS_VALUE) {
            m_nextPts = pts;
        } else if (hasTime) {
            FillGap(pts, sink);
        }
        Resample(*frame);
        EncodeBlocks(sink);
    }
}

// What follows a gap must not come early: silence takes its place.
void SoundTranscoder::FillGap(std::int64_t pts, const Sink& sink) {
    const std::int64_t delay = swr_is_initialized(m_resampler.get()) != 0
                                   ? swr_get_delay(m_resampler.get(), m_encoder->sample_rate)
                                   : 0;
    std::int64_t missing = pts - (m_nextPts + av_audio_fifo_size(m_fifo) + delay);
    if (static_cast<double>(missing) < kLeastGap * m_encoder->sample_rate) return;
    if (IsWrong(pts, missing)) {
        m_hasWrongTimes = true;
        return;
    }
    FlushResampler();
    const FramePtr silence = NewSamples(kQueuePiece);
    av_samples_set_silence(silence->extended_data, 0, kQueuePiece, m_encoder->ch_layout.nb_channels,
                           m_encoder->sample_fmt);
    for (; missing > 0; missing -= kQueuePiece) {
        Queue(*silence, static_cast<int>(std::min<std::int64_t>(missing, kQueuePiece)));
        EncodeBlocks(sink);
    }
}

bool SoundTranscoder::IsWrong(std::int64_t pts, std::int64_t missing) const {
    const double rate = m_encoder->sample_rate;
    return static_cast<double>(missing) > kLongGap * rate &&
           static_cast<double>(pts) > (m_pictureEnd + kBehindPicture) * rate;
}

FramePtr SoundTranscoder::NewSamples(int samples) const {
    FramePtr frame = NewFrame();
    frame->nb_samples = samples;
    frame->format = m_encoder->sample_fmt;
    frame->sample_rate = m_encoder->sample_rate;
    av_channel_layout_copy(&frame->ch_layout, &m_encoder->ch_layout);
    if (samples > 0 && av_frame_get_buffer(frame.get(), 0) < 0) throw std::bad_alloc();
    return frame;
}

void SoundTranscoder::Queue(const AVFrame& frame, int samples) {
    void** const data = reinterpret_cast<void**>(frame.extended_data);
    if (av_audio_fifo_write(m_fifo, data, samples) < 0) throw std::bad_alloc();
}

void SoundTranscoder::Resample(AVFrame& frame) {
    if (frame.ch_layout.order == AV_CHANNEL_ORDER_UNSPEC) {
        av_channel_layout_default(&frame.ch_layout, frame.ch_layout.nb_channels);
    }
    const FramePtr converted = NewSamples(0);
    // Converters are set up for the first frame and for any frame whose format differs from the one before.
    int error = swr_convert_frame(m_resampler.get(), converted.get(), &frame);
    if (error == AVERROR_INPUT_CHANGED) {
        swr_close(m_resampler.get());
        error = swr_convert_frame(m_resampler.get(), converted.get(), &frame);
    }
    ThrowIfNoMemory(error);
    if (error < 0) throw Failure(kExitInput, "the sound cannot be converted; use --no-sound to leave it out");
    Queue(*converted, converted->nb_samples);
}

// Moves what a change of rate still holds back into the queue; the next frame sets the converter up again.
void SoundTranscoder::FlushResampler() {
    if (swr_is_initialized(m_resampler.get()) == 0) return;
    const std::int64_t held = swr_get_delay(m_resampler.get(), m_encoder->sample_rate);
    if (held > 0) {
        const FramePtr rest = NewSamples(static_cast<int>(held) + 1);
        const int count = swr_convert(m_resampler.get(), rest->extended_data, rest->nb_samples, nullptr, 0);
        ThrowIfNoMemory(count);
        if (count > 0) Queue(*rest, count);
    }
    swr_close(m_resampler.get());
}

void SoundTranscoder::EncodeBlocks(const Sink& sink) {
    const int block = m_encoder->frame_size > 0 ? m_encoder->frame_size : kQueuePiece;
    while (av_audio_fifo_size(m_fifo) >= block) Encode(block, sink);
}

void SoundTranscoder::Encode(int samples, const Sink& sink) {
    if (samples <= 0) return;
    const FramePtr frame = NewSamples(samples);
    av_audio_fifo_read(m_fifo, reinterpret_cast<void**>(frame->extended_data), samples);
    frame->pts = m_nextPts;
    m_nextPts += samples;
    avcodec_send_frame(m_encoder.get(), frame.get());
    TakeEncoded(sink);
}

void SoundTranscoder::TakeEncoded(const Sink& sink) {
    const PacketPtr packet = NewPacket();
    while (avcodec_receive_packet(m_encoder.get(), packet.get()) >= 0) sink(*packet);
}

}  // namespace velmora::hosts
