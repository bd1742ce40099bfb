#include "render/jitter.h"

#include <algorithm>
#include <bit>
#include <cstddef>
#include <cstring>

namespace velmora::render {
static_assert(std::endian::native == std::endian::little, "border words are written as bytes");

void FillPixels(Bgra* pixels, std::int32_t count, std::uint32_t colour) noexcept {
    for (std::int32_t x = 0; x < count; ++x) std::memcpy(pixels + x, &colour, sizeof colour);
}

JitterStage PrepareJitter(const StageSettings& settings, Random& random) noexcept {
    if (settings.yJitter == 0 && settings.xJitter == 0) return {};
    const std::int32_t dy = random.Draw(-settings.yJitter, settings.yJitter);
    const std::int32_t dx = random.Draw(-settings.xJitter, settings.xJitter);
    return {dy, dx, settings.borderColour};
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
