#include "render/jitter.h"

#include <algorithm>
#include <bit>
#include <cstddef>
#include <cstring>

namespace velmora::render {
namespace {

static_assert(std::endian::native == std::endian::little, "border words are written as bytes");

Bgra* Pixel(const ImageView& view, std::int32_t row, std::int32_t column) noexcept {
    return reinterpret_cast<Bgra*>(view.base + std::ptrdiff_t{view.rowStep} * row) + column;
}

}  // namespace

void FillPixels(Bgra* pixels, std::int32_t count, std::uint32_t colour) noexcept {
    for (std::int32_t x = 0; x < count; ++x) std::memcpy(pixels + x, &colour, sizeof colour);
}

void FillRectangle(const ImageView& view, const Rectangle& rectangle, std::uint32_t colour) noexcept {
    if (rectangle.IsEmpty()) return;
    for (std::int32_t row = rectangle.top; row < rectangle.bottom; ++row) {
        FillPixels(Pixel(view, row, rectangle.left), rectangle.Width(), colour);
    }
}

void CopyRectangle(const ImageView& destination, std::int32_t row, std::int32_t column,
                   const Rectangle& destinationBounds, const ImageView& source, Rectangle rectangle,
                   const Rectangle& sourceBounds) noexcept {
    const Rectangle wanted = rectangle;
    rectangle = rectangle.Clipped(sourceBounds);
    row += rectangle.top - wanted.top;
    column += rectangle.left - wanted.left;
    const Rectangle target =
        Rectangle{row, row + rectangle.Height(), column, column + rectangle.Width()}.Clipped(
            destinationBounds);
    rectangle.top += target.top - row;
    rectangle.left += target.left - column;
    if (rectangle.IsEmpty() || target.IsEmpty()) return;
    const std::int32_t width = std::min(rectangle.Width(), target.Width());
    const std::int32_t height = std::min(rectangle.Height(), target.Height());
    for (std::int32_t y = 0; y < height; ++y) {
        std::memcpy(Pixel(destination, target.top + y, target.left),
                    Pixel(source, rectangle.top + y, rectangle.left),
                    static_cast<std::size_t>(width) * sizeof(Bgra));
    }
}

JitterStage PrepareJitter(const StageSettings& settings, Random& random) noexcept {
    if (settings.yJitter == 0 && settings.xJitter == 0) return {};
    const std::int32_t dy = random.Draw(-settings.yJitter, settings.yJitter);
    const std::int32_t dx = random.Draw(-settings.xJitter, settings.xJitter);
    return {dy, dx, settings.borderColour};
}

void JitterStage::Apply(FrameContext& context) const noexcept {
    const ImageView* input = context.CurrentInput(true);
    if (input == nullptr) return;
    const ImageView& output = context.ClaimDestination();
    const Rectangle region = output.Region();
    std::int32_t row = region.top, column = region.left;
    Rectangle picture = input->Region();
    if (m_dy != 0) {
        Rectangle band = region;
        if (m_dy < 0) {
            picture.top -= m_dy;
            band.top = region.bottom + m_dy;
        } else {
            row += m_dy;
            band.bottom = region.top + m_dy;
        }
        FillRectangle(output, band.Clipped(region), m_border);
    }
    if (m_dx != 0) {
        Rectangle band = region;
        if (m_dx < 0) {
            picture.left -= m_dx;
            band.left = region.right + m_dx;
        } else {
            column += m_dx;
            band.right = region.left + m_dx;
        }
        FillRectangle(output, band.Clipped(region), m_border);
    }
    CopyRectangle(output, row, column, region, *input, picture, input->Region());
}

ShiftedRow JitterStage::Shifted(const ImageView& source, std::int32_t y) const noexcept {
    const std::int32_t width = source.Region().Width();
    const std::int32_t row = y - m_dy;
    if (row < 0 || row >= source.Region().Height()) return {nullptr, 0, 0, m_border};
    const std::int32_t band = std::min(m_dx < 0 ? -m_dx : m_dx, width);
    const Bgra* pixels = source.Row(row);
    if (m_dx < 0) return {pixels + band, 0, width - band, m_border};
    return {pixels, band, width - band, m_border};
}

const Bgra* JitterStage::Row(const ImageView& source, Bgra* out, std::int32_t y) const noexcept {
    const std::int32_t width = source.Region().Width();
    const ShiftedRow row = Shifted(source, y);
    if (row.count == width) return row.pixels;
    FillPixels(out, row.start, row.border);
    if (row.count != 0)
        std::memcpy(out + row.start, row.pixels, static_cast<std::size_t>(row.count) * sizeof(Bgra));
    FillPixels(out + row.start + row.count, width - row.start - row.count, row.border);
    return out;
}

}  // namespace velmora::render
