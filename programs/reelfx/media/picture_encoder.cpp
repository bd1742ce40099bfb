#include "programs/reelfx/media/picture_encoder.h"

#include <algorithm>
#include <cmath>
#include <cstring>
#include <iterator>
#include <string_view>
#include <utility>

#include "programs/reelfx/common/failure.h"
#include "programs/reelfx/media/container.h"
#include "programs/reelfx/media/picture_metadata.h"
#include "programs/reelfx/media/av_handles.h"
#include "programs/reelfx/media/pixel_converter.h"

extern "C" {
#include <libavutil/imgutils.h>
#include <libavutil/opt.h>
#include <libavutil/pixdesc.h>
}

namespace velmora::hosts {
namespace {

bool IsOldFullRangeFormat(AVPixelFormat format) {
    const char* name = av_get_pix_fmt_name(format);
    return name && std::strncmp(name, "yuvj", 4) == 0;
}

const AVPixFmtDescriptor& DescriptorOf(AVPixelFormat format) {
    return *av_pix_fmt_desc_get(format);
}

bool IsGrey(AVPixelFormat format) {
    return DescriptorOf(format).nb_components <= 2 && !IsRgb(format);
}

bool HasAlpha(const MediaReader& source) {
    return !source.IsOpaque() && CarriesAlpha(static_cast<AVPixelFormat>(source.FirstFrame().format));
}

// Encoders' vector code reads whole vectors and blocks of 32 rows.
constexpr int kRowAlignment = 64;
int PaddedHeight(const AVCodecContext& encoder) {
    return FFALIGN(encoder.height, 32);
}

// Memory for all planes of a frame. Results are made by one thread and freed by another: the system's allocator would
// either ask for new pages for each frame or keep those of many.
BufferPoolPtr FramesFor(const AVCodecContext& encoder) {
    const int size =
        av_image_get_buffer_size(encoder.pix_fmt, encoder.width, PaddedHeight(encoder), kRowAlignment);
    if (size < 0) throw std::bad_alloc();
    return Allocated<BufferPoolPtr>(
        av_buffer_pool_init(static_cast<std::size_t>(size) + kRowAlignment, nullptr));
}

// Side data that still holds for a picture that is encoded anew. Others describe the source's own stream.
constexpr AVPacketSideDataType kKeptSideData[] = {
    AV_PKT_DATA_DISPLAYMATRIX,
    AV_PKT_DATA_STEREO3D,
    AV_PKT_DATA_SPHERICAL,
    AV_PKT_DATA_ICC_PROFILE,
    AV_PKT_DATA_MASTERING_DISPLAY_METADATA,
    AV_PKT_DATA_CONTENT_LIGHT_LEVEL,
};

}  // namespace

PictureEncoder::PictureEncoder(const OutputOptions& options, const AVOutputFormat& container,
                               const MediaReader& source, const std::string& name)
    : m_source(source), m_isMovFamily(IsMovFamily(container)) {
    ChooseTurn(options, container);
    const AVCodec& codec = ChooseCodec(options, container, SourceOf(container));
    m_encoder = Allocated<CodecPtr>(avcodec_alloc_context3(&codec));
    SetUp(options, container, codec);
    std::string said;
    int error = 0;
    {
        const StandardErrorCapture capture;
        error = avcodec_open2(m_encoder.get(), &codec, nullptr);
        said = capture.Warning();
    }
    ThrowIfNoMemory(error);
    if (error < 0) {
        throw Failure(kExitOutput, name + ": codec " + codec.name + " does not take frames of " +
                                       std::to_string(m_encoder->width) + "x" +
                                       std::to_string(m_encoder->height) + " " +
                                       av_get_pix_fmt_name(m_encoder->pix_fmt) + ErrorWords(error));
    }
    m_buffers = FramesFor(*m_encoder);
    if (!said.empty()) m_notes.push_back(std::string(codec.name) + ": " + said);
    if (!options.needsAlpha) NoteLosses(container);
}

// The threads of this encoder end only when they have been given a frame and then the end of the stream.
PictureEncoder::~PictureEncoder() {
    AVCodecContext* const encoder = m_encoder.get();
    const bool isOpen = encoder && avcodec_is_open(encoder) != 0;
    if (!isOpen || std::string_view(encoder->codec->name) != "libsvtav1") return;
    const FramePtr frame(av_frame_alloc());
    const PacketPtr packet(av_packet_alloc());
    if (!frame || !packet) return;
    frame->width = encoder->width;
    frame->height = encoder->height;
    frame->format = encoder->pix_fmt;
    if (av_frame_get_buffer(frame.get(), 0) < 0) return;
    for (const AVBufferRef* buffer : frame->buf) {
        if (buffer) std::memset(buffer->data, 0, buffer->size);
    }
    // Refused when the stream has ended.
    if (avcodec_send_frame(encoder, frame.get()) < 0) return;
    avcodec_send_frame(encoder, nullptr);
    while (avcodec_receive_packet(encoder, packet.get()) >= 0) av_packet_unref(packet.get());
}

PictureSource PictureEncoder::SourceOf(const AVOutputFormat&) const {
    const AVFrame& first = m_source.FirstFrame();
    PictureSource picture = {.codec = m_source.Picture().codecpar->codec_id,
                             .width = first.width,
                             .height = first.height,
                             .format = static_cast<AVPixelFormat>(first.format),
                             .isInterlaced = first.interlaced_frame != 0,
                             .hasAlpha = HasAlpha(m_source)};
    if (m_isUpright && m_source.Turn().SwapsSides()) std::swap(picture.width, picture.height);
    return picture;
}

void PictureEncoder::ChooseTurn(const OutputOptions& options, const AVOutputFormat& container) {
    const PictureTurn turn = m_source.Turn();
    if (turn.IsNone()) return;
    const bool isTagged =
        av_stream_get_side_data(&m_source.Picture(), AV_PKT_DATA_DISPLAYMATRIX, nullptr) != nullptr;
    m_isUpright = options.isUpright || !isTagged || !HoldsTurn(container);
    if (m_isUpright) m_notes.push_back("the pixels are turned (" + turn.Words() + ")");
}

void PictureEncoder::SetUp(const OutputOptions& options, const AVOutputFormat& container,
                           const AVCodec& codec) {
    const AVFrame& first = m_source.FirstFrame();
    const PictureSource picture = SourceOf(container);
    AVCodecContext& encoder = *m_encoder;
    encoder.width = picture.width;
    encoder.height = picture.height;
    encoder.pix_fmt = ChoosePixelFormat(options, codec, container, picture);
    encoder.sample_aspect_ratio = m_source.PixelShape();
    if (picture.width != first.width && encoder.sample_aspect_ratio.num > 0)
        encoder.sample_aspect_ratio = av_inv_q(encoder.sample_aspect_ratio);
    SetRate(options, container, codec);
    DescribeColours(container);
    if (first.interlaced_frame != 0 && !m_isUpright) {
        encoder.flags |= AV_CODEC_FLAG_INTERLACED_DCT | AV_CODEC_FLAG_INTERLACED_ME;
        encoder.field_order = first.top_field_first != 0 ? AV_FIELD_TT : AV_FIELD_BB;
    }
    if ((container.flags & AVFMT_GLOBALHEADER) != 0) encoder.flags |= AV_CODEC_FLAG_GLOBAL_HEADER;
    // For full-range YCbCr in still pictures and for YUV4MPEG2's rarer formats.
    encoder.strict_std_compliance = FF_COMPLIANCE_UNOFFICIAL;
    SetQuality(options, codec, encoder);
    const int profile = m_source.Picture().codecpar->profile;
    if (codec.id == AV_CODEC_ID_PRORES && picture.codec == codec.id && profile >= 0)
        av_opt_set_int(encoder.priv_data, "profile", profile, 0);
    SetHdrMetadata(m_source.Picture(), first, codec, encoder);
}

void PictureEncoder::SetRate(const OutputOptions& options, const AVOutputFormat& container,
                             const AVCodec& codec) {
    AVCodecContext& encoder = *m_encoder;
    encoder.framerate = options.fps ? AVRational{options.fps->numerator, options.fps->denominator}
                                    : m_source.FrameRateGuess();
    if (codec.supported_framerates) {
        encoder.framerate =
            codec.supported_framerates[av_find_nearest_q_idx(encoder.framerate, codec.supported_framerates)];
    }
    if (codec.id == AV_CODEC_ID_MPEG4) {
        // The codec divides a second into at most 65535 parts.
        av_reduce(&encoder.framerate.num, &encoder.framerate.den, encoder.framerate.num,
                  encoder.framerate.den, 65535);
    }
    const bool isTimeless = (container.flags & AVFMT_NOTIMESTAMPS) != 0;
    // Raw BGRA is for programs that count frames: each is written once.
    const bool isTold = isTimeless && !options.isRawBgra;
    m_hasConstantRate =
        options.fps || isTold || NeedsConstantRate(codec) || std::string(container.name) == "avi";
    if (options.isRawBgra) m_hasConstantRate = options.fps.has_value();
    encoder.time_base = m_hasConstantRate ? av_inv_q(encoder.framerate) : m_source.Picture().time_base;
}

void PictureEncoder::DescribeColours(const AVOutputFormat& container) {
    const AVFrame& first = m_source.FirstFrame();
    AVCodecContext& encoder = *m_encoder;
    const auto format = static_cast<AVPixelFormat>(first.format);
    encoder.color_primaries = first.color_primaries;
    encoder.color_trc = first.color_trc;
    if (encoder.codec_id == AV_CODEC_ID_EXR && m_source.ConvertsLight()) {
        encoder.color_trc = AVCOL_TRC_LINEAR;
    } else if (IsLinearLight(first)) {
        encoder.color_trc = AVCOL_TRC_IEC61966_2_1;
    }
    encoder.chroma_sample_location = first.chroma_location;
    if (IsRgb(encoder.pix_fmt)) {
        encoder.colorspace = AVCOL_SPC_RGB;
        encoder.color_range = AVCOL_RANGE_JPEG;
    } else if (IsRgb(format) || IsGrey(format)) {
        // There are no tags to keep: write the values in use, so that no player has to guess.
        encoder.colorspace = EffectiveMatrix(AVCOL_SPC_UNSPECIFIED, first.width, first.height);
        encoder.color_range = AVCOL_RANGE_MPEG;
    } else {
        encoder.colorspace = first.colorspace;
        encoder.color_range = first.color_range;
    }
    if (IsOldFullRangeFormat(encoder.pix_fmt) || encoder.codec_id == AV_CODEC_ID_MJPEG)
        encoder.color_range = AVCOL_RANGE_JPEG;
    const bool isFull = encoder.color_range == AVCOL_RANGE_JPEG && !IsRgb(encoder.pix_fmt);
    if (!isFull || HoldsRange(container, encoder.codec_id)) return;
    encoder.color_range = AVCOL_RANGE_MPEG;
    m_notes.push_back("full range is converted to limited range, as " + std::string(container.name) +
                      " with " + encoder.codec->name + " has no tag for it");
}

// Depth, chroma and transparency that the output's pixels do not have.
void PictureEncoder::NoteLosses(const AVOutputFormat& container) {
    const auto from = static_cast<AVPixelFormat>(m_source.FirstFrame().format);
    const AVPixelFormat to = m_encoder->pix_fmt;
    const AVPixFmtDescriptor &had = DescriptorOf(from), &has = DescriptorOf(to);
    const std::string change = std::string(av_get_pix_fmt_name(from)) + " becomes " + av_get_pix_fmt_name(to);
    const bool isCoarser = has.log2_chroma_w > had.log2_chroma_w || has.log2_chroma_h > had.log2_chroma_h;
    const bool isShallower = has.comp[0].depth < had.comp[0].depth;
    const bool isFromRgb = IsRgb(from) && !IsRgb(to);
    // Chroma that a grey picture does not have cannot be lost.
    if (isShallower || (!IsGrey(from) && (isCoarser || isFromRgb))) m_notes.push_back(change);
    const bool isMatteFormat = CarriesAlpha(to);
    if (HasAlpha(m_source) && !isMatteFormat) {
        m_notes.push_back("transparency is left out: " + std::string(container.name) + " with " +
                          m_encoder->codec->name + " has none");
    }
}

void PictureEncoder::Describe(AVStream& stream) const {
    const AVStream& from = m_source.Picture();
    avcodec_parameters_from_context(stream.codecpar, m_encoder.get());
    // Players of this family recognise HEVC with its headers in the container only by this tag.
    if (m_isMovFamily && m_encoder->codec_id == AV_CODEC_ID_HEVC)
        stream.codecpar->codec_tag = MKTAG('h', 'v', 'c', '1');
    stream.time_base = m_encoder->time_base;
    stream.avg_frame_rate = m_encoder->framerate;
    stream.sample_aspect_ratio = m_encoder->sample_aspect_ratio;
    stream.disposition = from.disposition;
    for (int i = 0; i < from.nb_side_data; ++i) {
        const AVPacketSideData& data = from.side_data[i];
        if (std::ranges::find(kKeptSideData, data.type) == std::end(kKeptSideData)) continue;
        if (data.type == AV_PKT_DATA_DISPLAYMATRIX && m_isUpright) continue;
        std::uint8_t* copy = av_stream_new_side_data(&stream, data.type, data.size);
        if (!copy) throw std::bad_alloc();
        std::memcpy(copy, data.data, data.size);
    }
    DescribeHdrMetadata(m_source.FirstFrame(), stream);
}

FramePtr PictureEncoder::NewResult(const AVFrame& source) const {
    FramePtr frame = NewFrame();
    if (av_frame_copy_props(frame.get(), &source) < 0) throw std::bad_alloc();
    frame->width = m_encoder->width;
    frame->height = m_encoder->height;
    frame->format = m_encoder->pix_fmt;
    frame->buf[0] = av_buffer_pool_get(m_buffers.get());
    if (!frame->buf[0]) throw std::bad_alloc();
    av_image_fill_arrays(frame->data, frame->linesize, frame->buf[0]->data, m_encoder->pix_fmt, frame->width,
                         PaddedHeight(*m_encoder), kRowAlignment);
    frame->color_range = m_encoder->color_range;
    frame->colorspace = m_encoder->colorspace;
    frame->chroma_location = m_encoder->chroma_sample_location;
    frame->color_trc = m_encoder->color_trc;
    if (m_isUpright) {
        av_frame_remove_side_data(frame.get(), AV_FRAME_DATA_DISPLAYMATRIX);
        frame->sample_aspect_ratio = m_encoder->sample_aspect_ratio;
        frame->interlaced_frame = 0;
    }
    return frame;
}

bool PictureEncoder::TakesAsItIs(const AVFrame& source) const {
    const bool isSameSize = source.width == m_encoder->width && source.height == m_encoder->height;
    // RGB has one range and no matrix, whatever its tags say or leave out.
    const bool isSameCoding = IsRgb(m_encoder->pix_fmt) || (source.color_range == m_encoder->color_range &&
                                                            source.colorspace == m_encoder->colorspace);
    return !m_isUpright && source.format == m_encoder->pix_fmt && isSameSize && isSameCoding &&
           source.color_trc == m_encoder->color_trc;
}

}  // namespace velmora::hosts
