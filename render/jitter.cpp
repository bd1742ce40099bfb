#include "render/jitter.h"

#include <algorithm>

namespace velmora::render {

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

}  // namespace velmora::render
