#include "library/frame_processor.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <limits>

#include "platform/float_guard.h"

namespace velmora {
namespace {

// The two layouts that a frame record can describe here.
struct PackedLayout {
    std::int64_t (*rowBytes)(std::int32_t width) noexcept;
    std::int64_t (*columnOffset)(std::int32_t column) noexcept;
};

constexpr PackedLayout kBgra = {[](std::int32_t width) noexcept { return std::int64_t{width} * 4; },
                                [](std::int32_t column) noexcept { return std::int64_t{column} * 4; }};
// A region starts with the group that holds its first pixel.
constexpr PackedLayout kYcbcr = {render::YcbcrRowBytes,
                                 [](std::int32_t column) noexcept { return std::int64_t{column} / 2 * 4; }};

// A frame's region as rows in memory order, after the checks that rendering makes as well.
struct Region {
    std::uint8_t* first = nullptr;  // null: the frame is not valid
    std::ptrdiff_t step = 0;
    std::int32_t width = 0;
    std::int32_t height = 0;
    std::int64_t rowBytes = 0;

    [[nodiscard]] std::uint8_t* Row(std::int32_t row) const noexcept { return first + step * row; }
};

Region RegionOf(const FrameRecord* frame, const PackedLayout& layout) noexcept {
    if (frame == nullptr || frame->pixels == nullptr || frame->width < 1 || frame->height < 1 ||
        frame->xOrigin < 0 || frame->yOrigin < 0) {
        return {};
    }
    constexpr std::int32_t kMost = std::numeric_limits<std::int32_t>::max();
    const std::int64_t bufferWidth = std::int64_t{frame->xOrigin} + frame->width;
    const std::int64_t bufferHeight = std::int64_t{frame->yOrigin} + frame->height;
    const std::int64_t step = std::abs(std::int64_t{frame->rowStep});
    if (bufferWidth > kMost || bufferHeight > kMost || step > kMost ||
        layout.rowBytes(static_cast<std::int32_t>(bufferWidth)) > step ||
        step * bufferHeight > std::numeric_limits<std::ptrdiff_t>::max()) {
        return {};
    }
    Region region;
    region.first = static_cast<std::uint8_t*>(frame->pixels);
    if (frame->rowStep < 0) region.first -= static_cast<std::ptrdiff_t>(step * (bufferHeight - 1));
    region.first += static_cast<std::ptrdiff_t>(step * frame->yOrigin + layout.columnOffset(frame->xOrigin));
    region.step = static_cast<std::ptrdiff_t>(step);
    region.width = frame->width;
    region.height = frame->height;
    region.rowBytes = layout.rowBytes(frame->width);
    return region;
}

bool Overlap(const Region& a, const Region& b) noexcept {
    const auto begin = [](const Region& r) { return reinterpret_cast<std::uintptr_t>(r.first); };
    const auto end = [](const Region& r) {
        return reinterpret_cast<std::uintptr_t>(r.Row(r.height - 1) + r.rowBytes);
    };
    return begin(a) < end(b) && begin(b) < end(a);
}

void SpreadRow(const std::uint8_t* rgb, std::uint8_t* bgra, std::int32_t width, std::uint8_t alpha) noexcept {
    for (std::int32_t x = 0; x < width; ++x, rgb += 3, bgra += 4) {
        bgra[0] = rgb[2];
        bgra[1] = rgb[1];
        bgra[2] = rgb[0];
        bgra[3] = alpha;
    }
}

void PackRow(const std::uint8_t* bgra, std::uint8_t* rgb, std::int32_t width) noexcept {
    for (std::int32_t x = 0; x < width; ++x, bgra += 4, rgb += 3) {
        rgb[0] = bgra[2];
        rgb[1] = bgra[1];
        rgb[2] = bgra[0];
    }
}

render::Bgra* PixelsOf(const Region& region, std::int32_t row) noexcept {
    return reinterpret_cast<render::Bgra*>(region.Row(row));
}

// Frames that share memory: takes all rows to the scratch image before the first one is written.
template <typename ToScratch, typename FromScratch>
bool ConvertThrough(render::PackedImage& scratch, std::int32_t width, std::int32_t height,
                    ToScratch&& toScratch, FromScratch&& fromScratch) noexcept {
    constexpr std::int32_t kRgbBytes = 3;
    if (!scratch.Reserve(width, height, kRgbBytes)) return false;
    for (std::int32_t y = 0; y < height; ++y) toScratch(y, scratch.Row(y));
    for (std::int32_t y = 0; y < height; ++y) fromScratch(y, scratch.Row(y));
    return true;
}

}  // namespace

Status VM_CALL FrameProcessor::QueryInterface(const Guid* iid, void** out) {
    const Face faces[] = {{&kIidUnknown, static_cast<IFrameProcessor*>(this)}};
    const Status status = FindFace(faces, iid, out);
    if (status == kStatusOk) AddRef();
    return status;
}

std::uint32_t VM_CALL FrameProcessor::AddRef() {
    return m_references.Add();
}

std::uint32_t VM_CALL FrameProcessor::Release() {
    const std::uint32_t left = m_references.Drop();
    if (left != 0) return left;
    const FloatGuard guard;
    delete this;
    return 0;
}

bool VM_CALL FrameProcessor::Reserved3(const FrameRecord*, const FrameRecord*, std::uint8_t) {
    return false;
}
bool VM_CALL FrameProcessor::Reserved4(const FrameRecord*, const FrameRecord*, std::uint8_t) {
    return false;
}
bool VM_CALL FrameProcessor::Reserved5(const FrameRecord*, const FrameRecord*, std::uint8_t) {
    return false;
}

bool VM_CALL FrameProcessor::ConvertYcbcrToBgra(const FrameRecord* source, const FrameRecord* destination,
                                                std::uint8_t alpha) {
    const FloatGuard guard;
    const Region from = RegionOf(source, kYcbcr), to = RegionOf(destination, kBgra);
    if (from.first == nullptr || to.first == nullptr) return false;
    // The source is decoded by its own width: where that is odd decides about its last pixel.
    const std::int32_t width = std::min(from.width, to.width), height = std::min(from.height, to.height);
    if (!Overlap(from, to)) {
        for (std::int32_t y = 0; y < height; ++y) {
            render::YcbcrRowToBgra(m_kernels, from.Row(y), from.width, PixelsOf(to, y), width, alpha);
        }
        return true;
    }
    return ConvertThrough(
        m_scratch, from.width, height,
        [&](std::int32_t row, std::uint8_t* rgb) { render::YcbcrRowToRgb(from.Row(row), rgb, from.width); },
        [&](std::int32_t row, const std::uint8_t* rgb) { SpreadRow(rgb, to.Row(row), width, alpha); });
}

bool VM_CALL FrameProcessor::ConvertBgraToYcbcr(const FrameRecord* source, const FrameRecord* destination,
                                                std::uint8_t) {
    const FloatGuard guard;
    const Region from = RegionOf(source, kBgra), to = RegionOf(destination, kYcbcr);
    if (from.first == nullptr || to.first == nullptr) return false;
    const std::int32_t width = std::min(from.width, to.width), height = std::min(from.height, to.height);
    if (!Overlap(from, to)) {
        for (std::int32_t y = 0; y < height; ++y) m_kernels.fromBgra(PixelsOf(from, y), to.Row(y), width);
        return true;
    }
    return ConvertThrough(
        m_scratch, width, height,
        [&](std::int32_t row, std::uint8_t* rgb) { PackRow(from.Row(row), rgb, width); },
        [&](std::int32_t row, const std::uint8_t* rgb) { render::RgbRowToYcbcr(rgb, to.Row(row), width); });
}

}  // namespace velmora
