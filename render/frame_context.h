// One frame on its way through the stages: the source, the destination and the frame's time and number. It lives for
// one frame.
#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>

#include "render/image.h"

namespace velmora::render {

enum class Slot : std::int32_t { kSource = 1, kDestination = 3 };

class FrameContext {
  public:
    // Attaches the two frames; the processed size is the smaller of the two regions in each direction.
    FrameContext(const FrameDescription& source, const FrameDescription& destination) noexcept;

    // A frame of this size whose pixels are described elsewhere: for planning only. Its views are not valid.
    FrameContext(std::int32_t width, std::int32_t height) noexcept;

    // Seconds from the start of the clip. NaN counts as 0; the frame number saturates.
    void SetTime(double seconds) noexcept;

    [[nodiscard]] double Time() const noexcept { return m_time; }
    [[nodiscard]] std::int32_t FrameNumber() const noexcept { return m_frameNumber; }
    [[nodiscard]] std::int32_t Width() const noexcept { return m_width; }
    [[nodiscard]] std::int32_t Height() const noexcept { return m_height; }
    [[nodiscard]] bool IsValid(Slot slot) const noexcept { return View(slot).IsValid(); }
    [[nodiscard]] const ImageView& Source() const noexcept { return m_source; }
    [[nodiscard]] const ImageView& Destination() const noexcept { return m_destination; }
    [[nodiscard]] bool OutputWritten() const noexcept { return m_outputWritten; }
    // The two pictures share memory (a host that processes in place).
    [[nodiscard]] bool FramesOverlap() const noexcept;

    // Marks the output as written and returns the destination.
    const ImageView& ClaimDestination() noexcept;
    // Replaces the source with a private copy. Returns false if there is not enough memory.
    [[nodiscard]] bool DetachSource() noexcept;
    // Copies these rows of the source through when no stage has written the destination.
    void Finish(const RowRange& rows = {}) noexcept;

  private:
    struct Copy {
        std::unique_ptr<std::uint8_t[]> pixels;
        ImageView view;
        bool Take(const ImageView& picture) noexcept;
    };

    [[nodiscard]] const ImageView& View(Slot slot) const noexcept {
        return slot == Slot::kSource ? m_source : m_destination;
    }

    double m_time = -1.0;
    std::int32_t m_frameNumber = 0;
    std::int32_t m_width = 0;
    std::int32_t m_height = 0;
    ImageView m_source;
    ImageView m_destination;
    Copy m_copy;  // of the source
    bool m_outputWritten = false;
};

}  // namespace velmora::render
