#include "render/frame_context.h"

#include <algorithm>
#include <cstring>
#include <limits>
#include <new>

#include "render/rounding.h"
#include "render/stage_settings.h"

namespace velmora::render {

FrameContext::FrameContext(const FrameDescription& source, const FrameDescription& destination) noexcept
    : m_width(std::min(source.width, destination.width)),
      m_height(std::min(source.height, destination.height)),
      m_source(ViewOf(source, m_width, m_height)),
      m_destination(ViewOf(destination, m_width, m_height)) {}

FrameContext::FrameContext(std::int32_t width, std::int32_t height) noexcept
    : m_width(width), m_height(height) {
    m_source.bottom = m_destination.bottom = height;
    m_source.right = m_destination.right = width;
}

void FrameContext::SetTime(double seconds) noexcept {
    m_time = seconds == seconds ? seconds : 0.0;
    m_frameNumber = TruncateTolerant(m_time * kFramesPerSecond);
}

bool FrameContext::FramesOverlap() const noexcept {
    const auto first = [](const ImageView& v) { return reinterpret_cast<std::uintptr_t>(v.Row(0)); };
    const auto last = [this](const ImageView& v) {
        return reinterpret_cast<std::uintptr_t>(v.Row(m_height - 1) + m_width);
    };
    return first(m_source) < last(m_destination) && first(m_destination) < last(m_source);
}

const ImageView& FrameContext::ClaimDestination() noexcept {
    m_outputWritten = true;
    return m_destination;
}

bool FrameContext::DetachSource() noexcept {
    if (!m_copy.Take(m_source)) return false;
    m_source = m_copy.view;
    return true;
}

void FrameContext::Finish(const RowRange& rows) noexcept {
    if (m_outputWritten) return;
    m_outputWritten = true;
    const std::int32_t first = std::max(rows.first, 0), count = std::min(rows.end, m_height) - first;
    if (count <= 0) return;
    const std::size_t rowBytes = static_cast<std::size_t>(m_width) * sizeof(Bgra);
    const auto isGapless = [rowBytes](const ImageView& view) {
        return static_cast<std::size_t>(view.rowStep) == rowBytes;
    };
    if (isGapless(m_source) && isGapless(m_destination)) {
        // One long copy is cheaper than many short ones.
        std::memmove(m_destination.Row(first), m_source.Row(first),
                     rowBytes * static_cast<std::size_t>(count));
        return;
    }
    // If the pictures overlap, the order must not overwrite source rows that are still to be copied.
    const bool upward = m_destination.Row(0) > m_source.Row(0);
    for (std::int32_t i = 0; i < count; ++i) {
        const std::int32_t y = first + (upward ? count - 1 - i : i);
        std::memmove(m_destination.Row(y), m_source.Row(y), rowBytes);
    }
}

// Copies only the processed rectangle: no stage reads beyond it.
bool FrameContext::Copy::Take(const ImageView& picture) noexcept {
    const std::size_t width = static_cast<std::size_t>(picture.Region().Width());
    const std::size_t height = static_cast<std::size_t>(picture.Region().Height());
    const std::size_t rowBytes = width * sizeof(Bgra);
    if (rowBytes > static_cast<std::size_t>(std::numeric_limits<std::int32_t>::max())) return false;
    if (height > std::numeric_limits<std::size_t>::max() / 2 / rowBytes) return false;
    if (pixels == nullptr) pixels.reset(new (std::nothrow) std::uint8_t[rowBytes * height]);
    if (pixels == nullptr) return false;
    for (std::int32_t y = 0; y < picture.Region().Height(); ++y) {
        std::memcpy(pixels.get() + rowBytes * static_cast<std::size_t>(y), picture.Row(y), rowBytes);
    }
    view.bufferWidth = view.right = picture.Region().Width();
    view.bufferHeight = view.bottom = picture.Region().Height();
    view.rowStep = static_cast<std::int32_t>(rowBytes);
    view.base = pixels.get();
    return true;
}

}  // namespace velmora::render
