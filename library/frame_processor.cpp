#include "library/frame_processor.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>

#include "effects/render_session.h"
#include "platform/float_guard.h"

namespace velmora {
namespace {

// The two packings that a frame record can describe here.
struct Packing {
    render::RowBytesOf rowBytes;
    std::int64_t (*columnOffset)(std::int32_t column) noexcept;
};

constexpr Packing kBgra = {render::BgraRowBytes, render::BgraRowBytes};
// A region starts at the pixel group that holds its first pixel.
constexpr Packing kYcbcr = {render::YcbcrRowBytes,
                            [](std::int32_t column) noexcept { return std::int64_t{column} / 2 * 4; }};

// A frame's region as rows in memory order.
struct Region {
    std::uint8_t* first = nullptr;  // null: the frame is invalid
    std::ptrdiff_t step = 0;
    std::int32_t width = 0;
    std::int32_t height = 0;
    std::int64_t rowBytes = 0;

    [[nodiscard]] std::uint8_t* Row(std::int32_t row) const noexcept { return first + step * row; }
};

Region RegionOf(const FrameRecord* frame, const Packing& packing) noexcept {
    if (frame == nullptr) return {};
    const render::ImageView view =
        render::ViewOf(DescriptionOf(*frame), frame->width, frame->height, packing.rowBytes);
    if (!view.IsValid()) return {};
    const std::ptrdiff_t step = view.rowStep;
    return {
        .first = view.base + step * view.top + static_cast<std::ptrdiff_t>(packing.columnOffset(view.left)),
        .step = step,
        .width = frame->width,
        .height = frame->height,
        .rowBytes = packing.rowBytes(frame->width)};
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

// For frames that share memory: converts all rows into the scratch image before the first one is written.
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
    const Interface interfaces[] = {{&kIidUnknown, static_cast<IFrameProcessor*>(this)}};
    const Status status = FindInterface(interfaces, iid, out);
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
    // The source is decoded at its own width: an odd width affects how its last pixel is decoded.
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
