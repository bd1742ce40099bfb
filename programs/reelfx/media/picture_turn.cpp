#include "programs/reelfx/media/bgra_picture.h"

#include <cstdlib>
#include <cstring>
#include <string>

#include "programs/reelfx/media/av_handles.h"

namespace velmora::hosts {
namespace {

int SignOf(std::int32_t value) {
    return value > 0 ? 1 : value < 0 ? -1 : 0;
}

}  // namespace

int PictureTurn::Degrees() const {
    const int right = IsMirrored() ? -xx : xx, down = IsMirrored() ? -yx : yx;
    if (right != 0) return right > 0 ? 0 : 180;
    return down > 0 ? 90 : 270;
}

std::string PictureTurn::Words() const {
    std::string rotated = Degrees() == 0 ? "" : "rotated by " + std::to_string(Degrees()) + " degrees";
    if (!IsMirrored()) return rotated;
    return rotated.empty() ? "mirrored" : "mirrored and " + rotated;
}

PictureTurn TurnOf(const AVStream& stream, const AVFrame& first) {
    const std::uint8_t* data = av_stream_get_side_data(&stream, AV_PKT_DATA_DISPLAYMATRIX, nullptr);
    if (const AVFrameSideData* own = av_frame_get_side_data(&first, AV_FRAME_DATA_DISPLAYMATRIX))
        data = own->data;
    if (!data) return {};
    std::int32_t matrix[9];
    std::memcpy(matrix, data, sizeof matrix);
    // Turns by other angles are taken as the nearest quarter.
    const bool isUpright = std::abs(std::int64_t{matrix[0]}) >= std::abs(std::int64_t{matrix[3]});
    const PictureTurn turn = isUpright ? PictureTurn{SignOf(matrix[0]), 0, 0, SignOf(matrix[4])}
                                       : PictureTurn{0, SignOf(matrix[3]), SignOf(matrix[1]), 0};
    const bool isWhole = isUpright ? turn.xx * turn.yy != 0 : turn.xy * turn.yx != 0;
    return isWhole ? turn : PictureTurn{};
}

void TurnPicture(const BgraPicture& from, const PictureTurn& turn, BgraPicture& to) {
    const std::int32_t width = from.Width(), height = from.Height();
    if (turn.SwapsSides()) {
        to.ResizeLike(from, height, width);  // NOLINT(readability-suspicious-call-argument): on its side
    } else {
        to.ResizeLike(from, width, height);
    }
    const std::ptrdiff_t bytes = from.PixelBytes();
    // Where the first pixel goes, and how far its neighbours lie from there.
    const std::int32_t left = turn.xx + turn.xy < 0 ? to.Width() - 1 : 0;
    const std::int32_t top = turn.yx + turn.yy < 0 ? to.Height() - 1 : 0;
    const std::ptrdiff_t right = turn.xx * bytes + turn.yx * to.Stride();
    const std::ptrdiff_t down = turn.xy * bytes + turn.yy * to.Stride();
    std::uint8_t* const corner = to.Row(0) + top * to.Stride() + left * bytes;
    for (std::int32_t y = 0; y < height; ++y) {
        const std::uint8_t* pixel = from.Row(y);
        std::uint8_t* target = corner + y * down;
        for (std::int32_t x = 0; x < width; ++x, pixel += bytes, target += right)
            std::memcpy(target, pixel, static_cast<std::size_t>(bytes));
    }
}

}  // namespace velmora::hosts
