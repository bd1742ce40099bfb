#include "programs/reelfx/pictures/pictures.h"

#include <filesystem>
#include <fstream>

#include "text/number_text.h"
#include "programs/reelfx/common/failure.h"
#include "programs/reelfx/common/output_place.h"
#include "programs/reelfx/media/pixel_converter.h"
#include "text/names.h"

namespace velmora::hosts {
namespace {

struct StillFormat {
    const char* ending;
    AVCodecID codec;
    AVPixelFormat pixels;
};
constexpr StillFormat kFormats[] = {
    {".png", AV_CODEC_ID_PNG, AV_PIX_FMT_RGB24},
    {".jpg", AV_CODEC_ID_MJPEG, AV_PIX_FMT_YUVJ444P},
    {".jpeg", AV_CODEC_ID_MJPEG, AV_PIX_FMT_YUVJ444P},
};
constexpr int kJpegQuantiser = 4;  // 1 is best, 31 worst

const StillFormat& FormatOf(const std::string& path) {
    const std::string ending = std::filesystem::path(path).extension().string();
    for (const StillFormat& format : kFormats) {
        if (IsSameButForCase(ending, format.ending)) return format;
    }
    throw UsageError(path + ": pictures must end in .png or .jpg");
}

PacketPtr Encode(const BgraPicture& picture, const StillFormat& format) {
    const AVCodec* codec = avcodec_find_encoder(format.codec);
    if (!codec) throw Failure(kExitInternal, "the installed FFmpeg cannot write PNG or JPEG");
    const CodecPtr encoder = Allocated<CodecPtr>(avcodec_alloc_context3(codec));
    encoder->width = picture.Width();
    encoder->height = picture.Height();
    encoder->pix_fmt = format.pixels;
    encoder->time_base = {1, 25};
    encoder->color_range = AVCOL_RANGE_JPEG;
    encoder->flags |= AV_CODEC_FLAG_QSCALE;
    encoder->global_quality = FF_QP2LAMBDA * kJpegQuantiser;
    int error = avcodec_open2(encoder.get(), codec, nullptr);
    const FramePtr frame = NewFrame();
    frame->width = encoder->width;
    frame->height = encoder->height;
    frame->format = encoder->pix_fmt;
    frame->color_range = AVCOL_RANGE_JPEG;
    frame->colorspace = AVCOL_SPC_SMPTE170M;  // what JPEG files mean
    frame->quality = encoder->global_quality;
    frame->pts = 0;
    if (error >= 0) error = av_frame_get_buffer(frame.get(), 0);
    PacketPtr packet = NewPacket();
    if (error >= 0) {
        PixelConverter().FromBgra(picture, *frame);
        error = avcodec_send_frame(encoder.get(), frame.get());
    }
    if (error >= 0) error = avcodec_send_frame(encoder.get(), nullptr);
    if (error >= 0) error = avcodec_receive_packet(encoder.get(), packet.get());
    ThrowIfNoMemory(error);
    if (error < 0) throw Failure(kExitOutput, "the picture cannot be encoded: " + AvText(error));
    return packet;
}

}  // namespace

void CheckStillName(const std::string& path) {
    FormatOf(path);
}

void WriteStill(const BgraPicture& picture, const std::string& path, bool mayOverwrite) {
    OutputPlace place(path, mayOverwrite);
    const PacketPtr packet = Encode(picture, FormatOf(path));
    errno = 0;
    std::ofstream file(place.Address(), std::ios::binary);
    file.write(reinterpret_cast<const char*>(packet->data), packet->size);
    file.close();
    if (!file) throw Failure(kExitOutput, path + ": cannot be written" + SystemReason());
    place.Keep();
}

}  // namespace velmora::hosts
