// Frames to measure with, and the measure: what work on a frame costs beside a memcpy of one.
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

// Pairs of frames that together are larger than any cache: each use of the next pair comes from memory and goes to
// memory. The sources hold gradients, texture and highlights, so that no stage meets only one kind of pixel.
class FramePool {
  public:
    explicit FramePool(PictureSize size);

    void Next() { m_at = (m_at + 1) % m_sources.size(); }
    [[nodiscard]] std::uint8_t* Source() { return m_sources[m_at].data(); }
    [[nodiscard]] std::uint8_t* Destination() { return m_destinations[m_at].data(); }
    // Those of any number, for threads that take a pair each.
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

// What this thread has had of a processor; on Windows, whose count of that is coarse, the time of day. Programs that
// want the machine meanwhile then slow a work down, but are not counted with it.
[[nodiscard]] double SecondsOfThisThread();

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

// What a frame far behind the one before costs, beside a copy: `render(seconds)` renders the present pair of frames,
// near the clip's start, which is not measured, then at 10 h. Each round goes elsewhere, so that nothing kept from the
// round before serves.
template <typename Render>
void RunJump(FramePool& pool, PairedTimes& times, Render&& render) {
    const double round = static_cast<double>(times.works.size());
    render(1.0 + round);
    RunPair(pool, times, [&] { render(36000.0 + 7.0 * round); });
}

}  // namespace velmora::bench
