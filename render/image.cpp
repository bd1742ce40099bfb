#include "render/image.h"

#include <algorithm>
#include <bit>
#include <cstddef>
#include <cstring>
#include <limits>

namespace velmora::render {
static_assert(std::endian::native == std::endian::little, "border words are written as bytes");

void FillPixels(Bgra* pixels, std::int32_t count, std::uint32_t colour) noexcept {
    for (std::int32_t x = 0; x < count; ++x) std::memcpy(pixels + x, &colour, sizeof colour);
}

void ShiftedRow::Copy(std::int32_t from, std::int32_t to, Bgra* out) const noexcept {
    const std::int32_t first = std::clamp(start, from, to), last = std::clamp(start + count, first, to);
    FillPixels(out, first - from, border);
    if (first != last) {
        std::memcpy(out + (first - from), pixels + (first - start),
                    static_cast<std::size_t>(last - first) * sizeof(Bgra));
    }
    FillPixels(out + (last - from), to - last, border);
}

Rectangle Rectangle::Clipped(const Rectangle& bounds) const noexcept {
    return {std::max(top, bounds.top), std::min(bottom, bounds.bottom), std::max(left, bounds.left),
            std::min(right, bounds.right)};
}

ImageView ViewOf(const FrameDescription& frame, std::int32_t width, std::int32_t height,
                 RowBytesOf rowBytes) noexcept {
    constexpr std::int64_t kMost = std::numeric_limits<std::int32_t>::max();
    const std::int64_t bufferWidth = std::int64_t{frame.xOrigin} + frame.width;
    const std::int64_t bufferHeight = std::int64_t{frame.yOrigin} + frame.height;
    const std::int64_t step = std::abs(std::int64_t{frame.rowStep});
    // The buffer must also fit in the address space.
    if (frame.pixels == nullptr || bufferWidth > kMost || bufferHeight > kMost || step > kMost ||
        frame.xOrigin < 0 || frame.yOrigin < 0 || frame.width < 1 || frame.height < 1 || width < 1 ||
        height < 1 || rowBytes(static_cast<std::int32_t>(bufferWidth)) > step ||
        step * bufferHeight > std::numeric_limits<std::ptrdiff_t>::max()) {
        return {};
    }
    ImageView view;
    view.bufferWidth = static_cast<std::int32_t>(bufferWidth);
    view.bufferHeight = static_cast<std::int32_t>(bufferHeight);
    view.rowStep = static_cast<std::int32_t>(step);
    view.base = static_cast<std::uint8_t*>(frame.pixels);
    if (frame.rowStep < 0) view.base -= static_cast<std::ptrdiff_t>(step * (bufferHeight - 1));
    view.top = frame.yOrigin;
    view.bottom = frame.yOrigin + height;
    view.left = frame.xOrigin;
    view.right = frame.xOrigin + width;
    return view;
}

}  // namespace velmora::render
