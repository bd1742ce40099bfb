#include "programs/reelfx/media/picture_metadata.h"

#include <cmath>
#include <cstring>
#include <string>

extern "C" {
#include <libavutil/mastering_display_metadata.h>
#include <libavutil/opt.h>
}

namespace velmora::hosts {
namespace {

template <class Data>
const Data* Find(const AVStream& stream, const AVFrame& first, AVPacketSideDataType ofStream,
                 AVFrameSideDataType ofFrame) {
    if (const AVFrameSideData* data = av_frame_get_side_data(&first, ofFrame))
        return reinterpret_cast<const Data*>(data->data);
    return reinterpret_cast<const Data*>(av_stream_get_side_data(&stream, ofStream, nullptr));
}

// In the units of the bitstream.
std::string Units(AVRational value, int perOne) {
    return std::to_string(std::llround(av_q2d(value) * perOne));
}

std::string MasteringText(const AVMasteringDisplayMetadata& data) {
    constexpr int kChroma = 50000, kLuminance = 10000;
    const auto point = [](const AVRational* at) {
        return "(" + Units(at[0], kChroma) + "," + Units(at[1], kChroma) + ")";
    };
    return "G" + point(data.display_primaries[1]) + "B" + point(data.display_primaries[2]) + "R" +
           point(data.display_primaries[0]) + "WP" + point(data.white_point) + "L(" +
           Units(data.max_luminance, kLuminance) + "," + Units(data.min_luminance, kLuminance) + ")";
}

void CopyToStream(const AVFrame& first, AVFrameSideDataType ofFrame, AVStream& stream,
                  AVPacketSideDataType ofStream) {
    const AVFrameSideData* data = av_frame_get_side_data(&first, ofFrame);
    if (!data || av_stream_get_side_data(&stream, ofStream, nullptr)) return;
    std::uint8_t* copy = av_stream_new_side_data(&stream, ofStream, data->size);
    if (!copy) throw std::bad_alloc();
    std::memcpy(copy, data->data, data->size);
}

}  // namespace

void SetHdrMetadata(const AVStream& source, const AVFrame& first, const AVCodec& codec,
                    AVCodecContext& encoder) {
    if (std::string(codec.name) != "libx265") return;
    std::string parameters = "log-level=warning";
    constexpr int kLeastHeight = 720;  // of what the encoder divides into slices; it warns about others
    if (encoder.height < kLeastHeight) parameters += ":lookahead-slices=0";
    const auto* mastering = Find<AVMasteringDisplayMetadata>(
        source, first, AV_PKT_DATA_MASTERING_DISPLAY_METADATA, AV_FRAME_DATA_MASTERING_DISPLAY_METADATA);
    const auto* light = Find<AVContentLightMetadata>(source, first, AV_PKT_DATA_CONTENT_LIGHT_LEVEL,
                                                     AV_FRAME_DATA_CONTENT_LIGHT_LEVEL);
    if (mastering && mastering->has_primaries != 0 && mastering->has_luminance != 0)
        parameters += ":master-display=" + MasteringText(*mastering);
    if (light)
        parameters += ":max-cll=" + std::to_string(light->MaxCLL) + "," + std::to_string(light->MaxFALL);
    if (mastering || light) parameters += ":hdr10=1:repeat-headers=1";
    av_opt_set(encoder.priv_data, "x265-params", parameters.c_str(), 0);
}

void DescribeHdrMetadata(const AVFrame& first, AVStream& stream) {
    CopyToStream(first, AV_FRAME_DATA_MASTERING_DISPLAY_METADATA, stream,
                 AV_PKT_DATA_MASTERING_DISPLAY_METADATA);
    CopyToStream(first, AV_FRAME_DATA_CONTENT_LIGHT_LEVEL, stream, AV_PKT_DATA_CONTENT_LIGHT_LEVEL);
}

}  // namespace velmora::hosts
