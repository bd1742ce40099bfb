// Frames for measurements, and the measurement: the cost of work on a frame compared with a memcpy of one.
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

// Times of the work and of the copies alternating with it, in seconds.
struct PairedTimes {
    std::vector<double> works, copies;

    // The lower quartiles: the cost of a run on an idle machine.
    [[nodiscard]] double Work() const { return Typical(works); }
    [[nodiscard]] double Copy() const { return Typical(copies); }
    [[nodiscard]] double Ratio() const { return Work() / Copy(); }

  private:
    static double Typical(std::vector<double> values);
};

// A copy, then the work, each on the next pair of frames.
template <typename Work>
void RunPair(FramePool& pool, PairedTimes& times, Work&& work) {
    const auto timed = [](auto&& action) {
        const double start = SecondsOfThisThread();
        action();
        return SecondsOfThisThread() - start;
    };
    pool.Next();
    times.copies.push_back(timed([&] { pool.Copy(); }));
    pool.Next();
    times.works.push_back(timed(work));
}

// The cost of a frame after a long jump, compared with a copy: `render(seconds)` renders the current pair of
// frames near the start of the clip, which is not measured, and then at 10 h. Each round jumps to a different
// time, so that nothing kept from an earlier round helps.
template <typename Render>
void RunJump(FramePool& pool, PairedTimes& times, Render&& render) {
    const double round = static_cast<double>(times.works.size());
    render(1.0 + round);
    RunPair(pool, times, [&] { render(36000.0 + 7.0 * round); });
}

}  // namespace velmora::bench
