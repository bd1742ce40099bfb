#include "render/tone_line.h"

#include <cstddef>

namespace velmora::render {
namespace {

// The line with these factors that satisfies the bounds set by each entry; black and white set only one bound.
std::optional<ToneLine> LineBy(std::int32_t times, std::int32_t shift, const ByteTable& table) noexcept {
    std::int32_t least = -65535, most = 65535;
    for (std::size_t i = 0; i < table.size(); ++i) {
        const auto product = static_cast<std::int32_t>(
            (static_cast<std::uint32_t>(i) << 8) * static_cast<std::uint32_t>(times) >> 16);
        const std::int32_t from = (table[i] << shift) - product, to = from + (1 << shift) - 1;
        least = std::max(least, table[i] > 0 ? from : least);
        most = std::min(most, table[i] < 255 ? to : most);
    }
    if (least > most) return std::nullopt;
    const std::int32_t offset = (least + most) / 2;
    return ToneLine{static_cast<std::uint16_t>(times), static_cast<std::uint16_t>(std::max(offset, 0)),
                    static_cast<std::uint16_t>(std::max(-offset, 0)), static_cast<std::uint16_t>(shift)};
}

}  // namespace

std::optional<ToneLine> LineOf(const ByteTable& table, double slope) noexcept {
    constexpr std::int32_t kMostShift = 8, kFarthest = 8;
    if (!(slope >= 0.0 && slope <= 8.0)) return std::nullopt;
    std::int32_t shift = kMostShift;
    while (slope * 255.0 * (1 << shift) > 65535.0) --shift;
    const auto nearest = static_cast<std::int32_t>(slope * (256 << shift));
    for (std::int32_t step = 0; step <= 2 * kFarthest; ++step) {
        const std::int32_t times = nearest + (step % 2 == 0 ? -step / 2 : step / 2 + 1);
        if (times < 0 || times > 65535) continue;
        if (const auto line = LineBy(times, shift, table)) return line;
    }
    return std::nullopt;
}

}  // namespace velmora::render
