// Digests of finished pictures, several at a time; see md5_lanes.h. Safe to use from several threads.
#pragma once

#include <mutex>
#include <span>
#include <vector>

#include "programs/reelfx/common/md5_lanes.h"
#include "programs/reelfx/pipeline/frame_pipeline.h"

namespace velmora::hosts {

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
