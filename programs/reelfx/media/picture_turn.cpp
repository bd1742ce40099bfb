#include "programs/reelfx/media/picture_turn.h"

#include <cmath>
#include <cstring>
#include <utility>

extern "C" {
#include <libavutil/display.h>
}

namespace velmora::hosts {

int QuarterTurnsOf(const AVStream& stream) {
    const std::uint8_t* data = av_stream_get_side_data(&stream, AV_PKT_DATA_DISPLAYMATRIX, nullptr);
    if (!data) return 0;
    std::int32_t matrix[9];
    std::memcpy(matrix, data, sizeof matrix);
    const double counterClockwise = av_display_rotation_get(matrix);
    if (std::isnan(counterClockwise)) return 0;
    return static_cast<int>((4 - std::lround(counterClockwise / 90.0) % 4) % 4);
}

void TurnPicture(const BgraPicture& from, int quarterTurns, BgraPicture& to) {
    const std::int32_t width = from.Width(), height = from.Height();
    if (quarterTurns % 2 != 0) {
        to.ResizeLike(from, height, width);  // NOLINT(readability-suspicious-call-argument): on its side
    } else {
        to.ResizeLike(from, width, height);
    }
    const std::ptrdiff_t bytes = from.PixelBytes();
    for (std::int32_t y = 0; y < height; ++y) {
        const std::uint8_t* pixel = from.Row(y);
        for (std::int32_t x = 0; x < width; ++x, pixel += bytes) {
            std::int32_t toX = x, toY = y;
            if (quarterTurns == 1) toX = height - 1 - y, toY = x;
            if (quarterTurns == 2) toX = width - 1 - x, toY = height - 1 - y;
            if (quarterTurns == 3) toX = y, toY = width - 1 - x;
            std::memcpy(to.Row(toY) + toX * bytes, pixel, static_cast<std::size_t>(bytes));
        }
    }
}

}  // namespace velmora::hosts
