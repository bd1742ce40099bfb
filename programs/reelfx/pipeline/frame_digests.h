// Digests of finished pictures, several at a time.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <mutex>
#include <span>
#include <vector>

#include "programs/reelfx/pipeline/frame_pipeline.h"

namespace velmora::hosts {

// MD5 of several messages of the same length at once. One sum is a chain in which every step waits for the one before,
// and a core computes three of them side by side in hardly more time than one. Ordinary registers hold that many; four in a
// vector are slower where vector instructions take two cycles.
class Md5Lanes {
  public:
    static constexpr std::size_t kLanes = 3;
    using Sum = std::array<std::uint8_t, 16>;

    // The next `size` bytes of each message.
    void Add(const std::array<const std::uint8_t*, kLanes>& bytes, std::size_t size);
    // The sums; nothing may be added after.
    std::array<Sum, kLanes> Finish();

  private:
    void AddWhole(std::array<const std::uint8_t*, kLanes> bytes, std::size_t blocks);

    using Words = std::array<std::uint32_t, 4>;
    static constexpr Words kStart = {0x67452301, 0xefcdab89, 0x98badcfe, 0x10325476};

    std::array<Words, kLanes> m_state = {kStart, kStart, kStart};
    std::array<std::array<std::uint8_t, 64>, kLanes> m_rest = {};  // less than a block
    std::uint64_t m_size = 0;                                      // of each message so far
};

// Safe to use from several threads.
class FrameDigests {
  public:
    static constexpr std::size_t kBatch = Md5Lanes::kLanes;

    // A picture of this size and kind with any content.
    [[nodiscard]] BgraPicture Take(std::int32_t width, std::int32_t height,
                                   SampleType samples = SampleType::kBytes);
    void GiveBack(BgraPicture& picture);
    // Fills in the digests of up to kBatch items with pictures of one size, and takes the pictures back.
    void Compute(std::span<PipelineItem* const> items);

  private:
    std::mutex m_mutex;
    std::vector<BgraPicture> m_spare;
};

}  // namespace velmora::hosts
