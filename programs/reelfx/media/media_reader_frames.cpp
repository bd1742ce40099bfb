#include "programs/reelfx/media/media_reader.h"

#include <algorithm>
#include <cstring>
#include <string>
#include <thread>

#include "programs/reelfx/common/failure.h"
#include "programs/reelfx/media/av_handles.h"

extern "C" {
#include <libavutil/pixdesc.h>
}

namespace velmora::hosts {
namespace {

// More frames without times than a decoder holds back have none at all.
constexpr std::size_t kMostUntimed = 64;

// Converts what the rest of the program does not handle: palettes become RGB, and untagged grey counts as full range,
// as in players.
FramePtr Plain(FramePtr frame) {
    const auto format = static_cast<AVPixelFormat>(frame->format);
    const AVPixFmtDescriptor* descriptor = av_pix_fmt_desc_get(format);
    if (descriptor && descriptor->nb_components <= 2 && (descriptor->flags & AV_PIX_FMT_FLAG_PAL) == 0 &&
        frame->color_range == AVCOL_RANGE_UNSPECIFIED) {
        frame->color_range = AVCOL_RANGE_JPEG;
    }
    if (format != AV_PIX_FMT_PAL8) return frame;
    std::uint32_t palette[AVPALETTE_COUNT];
    std::memcpy(palette, frame->data[1], sizeof palette);
    const bool isOpaque =
        std::ranges::all_of(palette, [](std::uint32_t entry) { return entry >> 24 == 0xFF; });
    FramePtr plain = NewFrame();
    plain->width = frame->width;
    plain->height = frame->height;
    plain->format = isOpaque ? AV_PIX_FMT_RGB24 : AV_PIX_FMT_RGBA;
    if (av_frame_get_buffer(plain.get(), 0) < 0 || av_frame_copy_props(plain.get(), frame.get()) < 0)
        throw std::bad_alloc();
    const int bytes = isOpaque ? 3 : 4;
    for (int y = 0; y < frame->height; ++y) {
        const std::uint8_t* from = frame->data[0] + std::ptrdiff_t{y} * frame->linesize[0];
        std::uint8_t* to = plain->data[0] + std::ptrdiff_t{y} * plain->linesize[0];
        for (int x = 0; x < frame->width; ++x, to += bytes) {
            const std::uint32_t colour = palette[from[x]];
            const std::uint8_t parts[4] = {
                static_cast<std::uint8_t>(colour >> 16), static_cast<std::uint8_t>(colour >> 8),
                static_cast<std::uint8_t>(colour), static_cast<std::uint8_t>(colour >> 24)};
            std::memcpy(to, parts, static_cast<std::size_t>(bytes));
        }
    }
    return plain;
}

bool IsOpaqueBgra(const AVFrame& frame) {
    if (frame.format != AV_PIX_FMT_BGRA) return false;
    for (int y = 0; y < frame.height; ++y) {
        const std::uint8_t* row = frame.data[0] + std::ptrdiff_t{y} * frame.linesize[0];
        for (int x = 0; x < frame.width; ++x) {
            if (row[x * 4 + 3] != 0xFF) return false;
        }
    }
    return true;
}

// The libraries' own decoders of VP8 and VP9 leave out transparency, which these have.
const AVCodec* DecoderOf(const AVStream& stream) {
    const AVDictionaryEntry* alpha = av_dict_get(stream.metadata, "alpha_mode", nullptr, 0);
    if (!alpha || std::string(alpha->value) != "1") return nullptr;
    if (stream.codecpar->codec_id == AV_CODEC_ID_VP8) return avcodec_find_decoder_by_name("libvpx");
    if (stream.codecpar->codec_id == AV_CODEC_ID_VP9) return avcodec_find_decoder_by_name("libvpx-vp9");
    return nullptr;
}

}  // namespace

void MediaReader::OpenDecoder() {
    const AVCodec* codec = nullptr;
    const int index = av_find_best_stream(m_container.get(), AVMEDIA_TYPE_VIDEO, -1, -1, &codec, 0);
    if (index < 0 || !codec) throw Failure(kExitInput, m_name + ": contains no video that can be decoded");
    m_stream = m_container->streams[index];
    if (const AVCodec* other = DecoderOf(*m_stream)) codec = other;
    m_decoder = Allocated<CodecPtr>(avcodec_alloc_context3(codec));
    int error = avcodec_parameters_to_context(m_decoder.get(), m_stream->codecpar);
    m_decoder->pkt_timebase = m_stream->time_base;
    // The decoded frames do not depend on it. Left to itself, the decoder takes one more, and each holds a frame.
    m_decoder->thread_count = static_cast<int>(std::clamp(std::thread::hardware_concurrency(), 1U, 16U));
    if (error >= 0) error = avcodec_open2(m_decoder.get(), codec, nullptr);
    if (error < 0) FailReading("cannot be decoded" + ErrorWords(error), error);
}

void MediaReader::Decode(const AVPacket* packet) {
    int error = avcodec_send_packet(m_decoder.get(), packet);
    while (error == AVERROR(EAGAIN)) {
        TakeFrames();
        error = avcodec_send_packet(m_decoder.get(), packet);
    }
    ThrowIfNoMemory(error);
    if (error < 0 && error != AVERROR_EOF) ++m_damaged;
    TakeFrames();
}

void MediaReader::TakeFrames() {
    for (;;) {
        FramePtr frame = NewFrame();
        const int error = avcodec_receive_frame(m_decoder.get(), frame.get());
        if (error == AVERROR(EAGAIN) || error == AVERROR_EOF) return;
        ThrowIfNoMemory(error);
        if (error < 0) {
            ++m_damaged;
            return;
        }
        frame = Plain(std::move(frame));
        // OpenEXR has no tag for it: its values are proportional to light.
        const bool isUntagged = frame->color_trc == AVCOL_TRC_UNSPECIFIED;
        if (m_decoder->codec_id == AV_CODEC_ID_EXR && isUntagged && ConvertsLight())
            frame->color_trc = AVCOL_TRC_LINEAR;
        if (m_lastPts == AV_NOPTS_VALUE && frame->best_effort_timestamp == AV_NOPTS_VALUE &&
            m_untimed.size() < kMostUntimed) {
            m_untimed.push_back(std::move(frame));
            continue;
        }
        TakeUntimed(frame->best_effort_timestamp);
        TakeFrame(std::move(frame));
    }
}

std::int64_t MediaReader::TicksPerFrame() const {
    const std::int64_t step = av_rescale_q(1, av_inv_q(FrameRateGuess()), m_stream->time_base);
    return std::max<std::int64_t>(step, 1);
}

// Frames at the start without times come at the clip's rate before the first that has one.
void MediaReader::TakeUntimed(std::int64_t next) {
    std::deque<FramePtr> frames;
    frames.swap(m_untimed);
    const std::int64_t step = TicksPerFrame();
    std::int64_t pts = next == AV_NOPTS_VALUE ? 0 : next - step * static_cast<std::int64_t>(frames.size());
    for (FramePtr& frame : frames) {
        frame->best_effort_timestamp = pts;
        pts += step;
        TakeFrame(std::move(frame));
    }
}

void MediaReader::TakeFrame(FramePtr frame) {
    std::int64_t pts = frame->best_effort_timestamp;
    if (pts == AV_NOPTS_VALUE || (m_lastPts != AV_NOPTS_VALUE && pts <= m_lastPts)) {
        // The time is missing or does not advance: go one frame on by the rate.
        pts = m_lastPts == AV_NOPTS_VALUE ? 0 : m_lastPts + TicksPerFrame();
    }
    frame->pts = m_lastPts = pts;
    if (m_firstFrame && (frame->width != m_firstFrame->width || frame->height != m_firstFrame->height))
        m_otherSize = std::to_string(frame->width) + "x" + std::to_string(frame->height);
    if (!m_firstFrame) KeepFirst(*frame);
    m_items.push_back({std::move(frame), nullptr});
}

void MediaReader::KeepFirst(const AVFrame& frame) {
    m_isOpaque = IsOpaqueBgra(frame);
    FramePtr first = NewFrame();
    if (av_frame_copy_props(first.get(), &frame) < 0) throw std::bad_alloc();
    first->width = frame.width;
    first->height = frame.height;
    first->format = frame.format;
    m_firstFrame = std::move(first);
}

}  // namespace velmora::hosts
