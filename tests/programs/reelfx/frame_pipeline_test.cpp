#include "programs/reelfx/pipeline/frame_pipeline.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <stdexcept>

#include "programs/common/digest.h"
#include "programs/reelfx/media/bgra_picture.h"
#include "programs/reelfx/pipeline/frame_digests.h"
#include "programs/reelfx/common/progress.h"

namespace velmora::hosts {
namespace {

// Items 0 to count - 1; every third is a packet.
FramePipeline::Source Counting(std::int64_t count) {
    return [count, next = std::int64_t{0}]() mutable -> PipelineItemPtr {
        if (next == count) return nullptr;
        auto item = std::make_unique<PipelineItem>();
        item->index = next++;
        if (item->index % 3 == 2) item->packet = NewPacket();
        return item;
    };
}

// The first of two frames takes longer.
void WorkUnevenly(PipelineItem& item) {
    std::this_thread::sleep_for(std::chrono::milliseconds(item.index % 2 == 0 ? 3 : 0));
    item.digest = std::to_string(item.index);
}

TEST(FramePipeline, KeepsTheOrderWithAnyNumberOfWorkers) {
    for (const std::size_t workers : {1u, 4u}) {
        FramePipeline pipeline(Counting(50), std::vector<FramePipeline::Worker>(workers, WorkUnevenly));
        for (std::int64_t i = 0; i < 50; ++i) {
            const PipelineItemPtr item = pipeline.Next();
            ASSERT_TRUE(item);
            EXPECT_EQ(item->index, i);
            EXPECT_EQ(item->digest, item->packet ? "" : std::to_string(i));
        }
        EXPECT_FALSE(pipeline.Next());
    }
}

TEST(FramePipeline, GathersItemsForASecondStep) {
    for (const std::size_t workers : {1u, 3u}) {
        const BatchStep batch = {[&](std::span<PipelineItem* const> items) {
                                     EXPECT_LE(items.size(), 4U);
                                     for (PipelineItem* const item : items) item->digest += "!";
                                 },
                                 4};
        FramePipeline pipeline(Counting(50), std::vector<FramePipeline::Worker>(workers, WorkUnevenly),
                               batch);
        for (std::int64_t i = 0; i < 50; ++i) {
            const PipelineItemPtr item = pipeline.Next();
            EXPECT_EQ(item->digest, item->packet ? "" : std::to_string(i) + "!");
        }
        EXPECT_FALSE(pipeline.Next());
    }
}

// Item 3 waits for so many later ones that the queue is full of finished items behind it.
TEST(FramePipeline, GathersFewerThanAskedRatherThanStop) {
    std::atomic<bool> isLate = false;
    const auto work = [&](PipelineItem& item) {
        if (item.index == 8) isLate = true;
        while (item.index == 3 && !isLate) std::this_thread::sleep_for(std::chrono::milliseconds(1));
    };
    const auto source = [next = std::int64_t{0}]() mutable -> PipelineItemPtr {
        auto item = std::make_unique<PipelineItem>();
        item->index = next++;
        return next > 20 ? nullptr : std::move(item);
    };
    FramePipeline pipeline(source, {work, work}, {[](std::span<PipelineItem* const>) {}, 4});
    for (std::int64_t i = 0; i < 20; ++i) EXPECT_EQ(pipeline.Next()->index, i);
    EXPECT_FALSE(pipeline.Next());
}

TEST(FrameDigests, AreThoseOfSinglePictures) {
    FrameDigests digests;
    for (const std::int32_t width : {1, 7, 13, 16, 29}) {  // ends of rows and of messages anywhere in a block
        for (std::size_t count = 1; count <= FrameDigests::kBatch; ++count) {
            PipelineItem items[FrameDigests::kBatch];
            PipelineItem* const places[] = {&items[0], &items[1], &items[2]};
            std::vector<std::string> expected;
            for (std::size_t i = 0; i < count; ++i) {
                BgraPicture picture = digests.Take(width, 9);
                for (std::int32_t y = 0; y < 9; ++y)
                    std::fill_n(picture.Row(y), width * 4,
                                static_cast<std::uint8_t>(y * 50 + width + static_cast<int>(i)));
                expected.push_back(FrameDigest(picture.Row(0), width, 9, picture.Stride()));
                items[i].picture = std::move(picture);
            }
            digests.Compute(std::span(places).first(count));
            for (std::size_t i = 0; i < count; ++i) EXPECT_EQ(items[i].digest, expected[i]);
        }
    }
}

TEST(FramePipeline, HandsErrorsOutInTheirTurn) {
    const auto failing = [](PipelineItem& item) {
        if (item.index == 4) throw std::runtime_error("four");
    };
    FramePipeline pipeline(Counting(50), {failing, failing});
    for (int i = 0; i < 4; ++i) EXPECT_TRUE(pipeline.Next());
    EXPECT_THROW(pipeline.Next(), std::runtime_error);
}

TEST(FramePipeline, ReadsOnlyALittleAhead) {
    std::atomic<int> read = 0;
    const auto endless = [&]() -> PipelineItemPtr {
        ++read;
        return std::make_unique<PipelineItem>();
    };
    {
        FramePipeline pipeline(endless, {WorkUnevenly});
        for (int i = 0; i < 10; ++i) EXPECT_TRUE(pipeline.Next());
    }  // leaving an endless source must not hang
    EXPECT_LE(read, 10 + 3);  // one in work, one waiting before it and one behind it
}

TEST(PictureTurn, QuartersGoClockwise) {
    BgraPicture lying(3, 2);
    for (std::uint8_t i = 0; i < 6; ++i) lying.Row(i / 3)[i % 3 * 4] = i;
    // 0 1 2    3 0
    // 3 4 5 -> 4 1
    //          5 2
    BgraPicture upright, back;
    TurnPicture(lying, {0, -1, 1, 0}, upright);
    ASSERT_EQ(upright.Width(), 2);
    ASSERT_EQ(upright.Height(), 3);
    const std::uint8_t expected[] = {3, 0, 4, 1, 5, 2};
    for (int i = 0; i < 6; ++i) EXPECT_EQ(upright.Row(i / 2)[i % 2 * 4], expected[i]);
    TurnPicture(upright, PictureTurn{0, -1, 1, 0}.Back(), back);
    for (std::uint8_t i = 0; i < 6; ++i) EXPECT_EQ(back.Row(i / 3)[i % 3 * 4], i);
}

TEST(Progress, TellsShareSpeedAndTimeLeft) {
    EXPECT_EQ(ProgressText(10, 40, 2.0), "frame 10/40  25%  5.0 fps  0:06 left");
    EXPECT_EQ(ProgressText(1, 7201, 1.0), "frame 1/7201  0%  1.0 fps  2:00:00 left");
    EXPECT_EQ(ProgressText(10, 0, 2.0), "frame 10  5.0 fps");
    EXPECT_EQ(ProgressText(45, 40, 9.0),
              "frame 45/45  100%  5.0 fps  0:00 left");  // the count was an estimate
}

TEST(Progress, ProgramsGetALineOfJson) {
    EXPECT_EQ(ProgressJson(10, 40, 2.0, false),
              R"({"frame":10,"frames":40,"seconds":2.000,"fps":5.0,"progress":"continue"})");
    EXPECT_EQ(ProgressJson(45, 0, 9.0, true), R"({"frame":45,"seconds":9.000,"fps":5.0,"progress":"end"})");
    // Once the source has ended, the count is known.
    EXPECT_EQ(ProgressJson(38, 40, 0.0, true),
              R"({"frame":38,"frames":38,"seconds":0.000,"fps":0.0,"progress":"end"})");
}

}  // namespace
}  // namespace velmora::hosts
