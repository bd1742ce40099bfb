// Frames to measure with, and the measure: what work on a frame costs beside a memcpy of one.
#pragma once

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <vector>

#include "plugin/host_api.h"

namespace velmora::bench {

struct PictureSize {
    std::int32_t width;
    std::int32_t height;
};
inline constexpr PictureSize kFullHd = {1920, 1080};
inline constexpr PictureSize kUltraHd = {3840, 2160};

// Pairs of frames that together are larger than any cache: each use of the next pair comes from memory and goes to
// memory. The sources hold gradients, texture and highlights, so that no stage meets only one kind of pixel.
class FramePool {
  public:
    explicit FramePool(PictureSize size);

    void Next() { m_at = (m_at + 1) % m_sources.size(); }
    [[nodiscard]] std::uint8_t* Source() { return m_sources[m_at].data(); }
    [[nodiscard]] std::uint8_t* Destination() { return m_destinations[m_at].data(); }
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

// Times of a work and of the copies in turn with it, in seconds.
struct PairedTimes {
    std::vector<double> works, copies;

    // The lower quartiles: what a run costs when nothing else wants the machine.
    [[nodiscard]] double Work() const { return Typical(works); }
    [[nodiscard]] double Copy() const { return Typical(copies); }
    [[nodiscard]] double Ratio() const { return Work() / Copy(); }

  private:
    static double Typical(std::vector<double> values);
};

// A copy, then the work, each on the next pair of frames.
template <typename Work>
void RunPair(FramePool& pool, PairedTimes& times, Work&& work) {
    using Clock = std::chrono::steady_clock;
    const auto timed = [](auto&& action) {
        const auto start = Clock::now();
        action();
        return std::chrono::duration<double>(Clock::now() - start).count();
    };
    pool.Next();
    times.copies.push_back(timed([&] { pool.Copy(); }));
    pool.Next();
    times.works.push_back(timed(work));
}

}  // namespace velmora::bench
