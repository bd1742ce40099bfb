// Frames for measurements.
#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "api/host_api.h"

namespace velmora::bench {

struct PictureSize {
    std::int32_t width;
    std::int32_t height;
};
inline constexpr PictureSize kFullHd = {1920, 1080};
inline constexpr PictureSize kUltraHd = {3840, 2160};

// Pairs of frames that together are larger than any cache, so that each pair is read from memory and written
// to memory. The sources hold gradients, texture and highlights, so that no stage meets only one kind of
// pixel.
class FramePool {
  public:
    explicit FramePool(PictureSize size);

    void Next() { m_at = (m_at + 1) % m_sources.size(); }
    [[nodiscard]] std::uint8_t* Source() { return m_sources[m_at].data(); }
    [[nodiscard]] std::uint8_t* Destination() { return m_destinations[m_at].data(); }
    // The pair of a given number, for threads that use one pair each.
    [[nodiscard]] std::uint8_t* SourceAt(std::size_t pair) {
        return m_sources[pair % m_sources.size()].data();
    }
    [[nodiscard]] std::uint8_t* DestinationAt(std::size_t pair) {
        return m_destinations[pair % m_destinations.size()].data();
    }
    [[nodiscard]] std::size_t Bytes() const;
    [[nodiscard]] FrameRecord Record(std::uint8_t* pixels) const {
        return {pixels, m_size.width, m_size.height, m_size.width * 4, 0, 0, 0};
    }
    // Copies a pair's source.
    void Copy();

  private:
    PictureSize m_size;
    std::vector<std::vector<std::uint8_t>> m_sources, m_destinations;
    std::size_t m_at = 0;
};

// The processor time of this thread, so that other programs are not counted; on Windows, where that is too
// coarse, the elapsed time.
[[nodiscard]] double SecondsOfThisThread();

}  // namespace velmora::bench
