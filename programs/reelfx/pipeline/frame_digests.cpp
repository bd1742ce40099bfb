#include "programs/reelfx/pipeline/frame_digests.h"

#include <utility>

#include "programs/common/digest.h"

namespace velmora::hosts {

BgraPicture FrameDigests::Take(std::int32_t width, std::int32_t height, SampleType samples) {
    BgraPicture picture;
    {
        const std::lock_guard lock(m_mutex);
        if (!m_spare.empty()) {
            picture = std::move(m_spare.back());
            m_spare.pop_back();
        }
    }
    const bool isFit = picture.Width() == width && picture.Height() == height && picture.Samples() == samples;
    if (!isFit) picture = BgraPicture(width, height, samples);
    return picture;
}

void FrameDigests::GiveBack(BgraPicture& picture) {
    const std::lock_guard lock(m_mutex);
    m_spare.push_back(std::exchange(picture, BgraPicture()));
}

void FrameDigests::Compute(std::span<PipelineItem* const> items) {
    const BgraPicture& first = items[0]->picture;
    if (items.size() == 1) {  // faster than a single lane
        const auto width = static_cast<std::int32_t>(first.RowBytes() / 4);
        items[0]->digest = FrameDigest(first.Row(0), width, first.Height(), first.Stride());
    } else {
        Md5Lanes lanes;
        for (std::int32_t y = 0; y < first.Height(); ++y) {
            std::array<const std::uint8_t*, kBatch> rows;
            for (std::size_t i = 0; i < kBatch; ++i)
                rows[i] = items[i < items.size() ? i : 0]->picture.Row(y);
            lanes.Add(rows, first.RowBytes());
        }
        const auto sums = lanes.Finish();
        for (std::size_t i = 0; i < items.size(); ++i)
            items[i]->digest = HexOf(sums[i].data(), sums[i].size());
    }
    for (PipelineItem* const item : items) GiveBack(item->picture);
}

}  // namespace velmora::hosts
