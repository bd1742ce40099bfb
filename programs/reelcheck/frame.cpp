#include "programs/reelcheck/frame.h"

#include <algorithm>
#include <cstring>

namespace velmora::reelcheck {
namespace {

std::size_t BytesOf(Packing packing, std::int32_t width) noexcept {
    const std::int32_t groups = packing == Packing::kBgra ? width : (width + 1) / 2;
    return static_cast<std::size_t>(groups) * 4;
}

std::int32_t StepOf(const Layout& layout, Packing packing) noexcept {
    return static_cast<std::int32_t>(BytesOf(packing, layout.xOrigin + layout.width)) + layout.padding;
}

std::size_t SizeOf(const Layout& layout, Packing packing) noexcept {
    const auto rows = static_cast<std::size_t>(layout.yOrigin) + static_cast<std::size_t>(layout.height);
    return static_cast<std::size_t>(StepOf(layout, packing)) * (rows - 1) +
           BytesOf(packing, layout.xOrigin + layout.width);
}

bool AreAll(const std::uint8_t* begin, const std::uint8_t* end, std::uint8_t value) noexcept {
    return begin >= end ||
           (*begin == value && std::memcmp(begin, begin + 1, static_cast<std::size_t>(end - begin) - 1) == 0);
}

// One byte per column and row from a few kinds of stripes, so that the picture is neither all noise nor all smooth.
void PaintRow(std::uint8_t* row, std::size_t bytes, std::size_t y, Dice& dice) noexcept {
    static constexpr std::uint8_t kExtremes[] = {0, 255, 1, 254, 128};
    for (std::size_t x = 0; x < bytes;) {
        const std::size_t end = std::min(bytes, x + static_cast<std::size_t>(dice.Between(4, 160)));
        const std::uint32_t bits = dice.Word();
        for (; x < end; ++x) {
            switch (bits & 3) {
                case 0:
                    row[x] = static_cast<std::uint8_t>((x + y) >> (bits >> 2 & 3));
                    break;
                case 1:
                    row[x] = kExtremes[(bits >> 4) % std::size(kExtremes)];
                    break;
                default:
                    row[x] = static_cast<std::uint8_t>(bits >> (8 + (x & 1) * 8)) ^
                             static_cast<std::uint8_t>(x * 29);
            }
        }
    }
}

}  // namespace

Frame::Frame(const Layout& layout, Packing packing)
    : m_layout(layout),
      m_packing(packing),
      m_step(StepOf(layout, packing)),
      m_memory(SizeOf(layout, packing), layout.edge) {}

void Frame::Paint(Dice& dice) const {
    const auto step = static_cast<std::size_t>(m_step);
    for (std::size_t at = 0; at < Size(); at += step) {
        PaintRow(Bytes() + at, std::min(step, Size() - at), at / step, dice);
    }
}

void Frame::Fill(std::uint8_t value) const {
    std::memset(Bytes(), value, Size());
}

FrameRecord Frame::RecordAt(std::int32_t offset, const Layout& layout) const noexcept {
    const std::int32_t step = StepOf(layout, m_packing), rows = layout.yOrigin + layout.height;
    FrameRecord record = {};
    record.pixels = Bytes() + offset + (layout.bottomUp ? std::ptrdiff_t{step} * (rows - 1) : 0);
    record.width = layout.width;
    record.height = layout.height;
    record.rowStep = layout.bottomUp ? -step : step;
    record.reserved = 0xDEADBEEFu;  // not read
    record.xOrigin = layout.xOrigin;
    record.yOrigin = layout.yOrigin;
    return record;
}

FrameRecord Frame::Record() const noexcept {
    return RecordAt(0, m_layout);
}

std::size_t Frame::RowBytes(std::int32_t width) const noexcept {
    return BytesOf(m_packing, width);
}

std::uint8_t* Frame::Row(std::int32_t row) const noexcept {
    const std::size_t left = m_packing == Packing::kBgra ? static_cast<std::size_t>(m_layout.xOrigin) * 4
                                                         : static_cast<std::size_t>(m_layout.xOrigin / 2) * 4;
    return Bytes() + std::ptrdiff_t{m_step} * (m_layout.yOrigin + row) + left;
}

std::uint64_t Frame::Digest(std::int32_t width, std::int32_t height) const noexcept {
    std::uint64_t digest = 0xCBF29CE484222325u;
    for (std::int32_t y = 0; y < height; ++y) {
        const std::uint8_t* const row = Row(y);
        const std::size_t bytes = RowBytes(width);
        for (std::size_t x = 0; x < bytes; x += 4) {
            std::uint32_t word;
            std::memcpy(&word, row + x, sizeof word);
            digest = (digest ^ word) * 0x100000001B3u;
        }
    }
    return digest;
}

bool Frame::OnlyInside(std::int32_t width, std::int32_t height, std::uint8_t value) const noexcept {
    const std::uint8_t* untouched = Bytes();
    for (std::int32_t y = 0; y < height; ++y) {
        if (!AreAll(untouched, Row(y), value)) return false;
        untouched = Row(y) + RowBytes(width);
    }
    return AreAll(untouched, Bytes() + Size(), value);
}

void Frame::CopyRegion(const Frame& from) noexcept {
    for (std::int32_t y = 0; y < m_layout.height; ++y) {
        std::memcpy(Row(y), from.Row(y), RowBytes(m_layout.width));
    }
}

}  // namespace velmora::reelcheck
