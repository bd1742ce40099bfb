#include "programs/reelfx/pipeline/frame_pipeline.h"

#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <stdexcept>

#include "programs/reelfx/media/picture_turn.h"
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
    EXPECT_LT(read, 20);
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
