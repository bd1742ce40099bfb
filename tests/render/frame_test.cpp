// Views, the frame context and the random sequence.

#include <gtest/gtest.h>

#include <algorithm>
#include <limits>
#include <vector>

#include "render/frame_context.h"
#include "render/random.h"
#include "render/render_state.h"
#include "render/rounding.h"
#include "tests/common/guarded_frame.h"

namespace velmora::render {
namespace {

using testing::Geometry;
using testing::GuardedFrame;

TEST(Rounding, FollowsItsRulesAtHalvesAndEnds) {
    EXPECT_EQ(RoundHalfAway(2.5), 3);
    EXPECT_EQ(RoundHalfAway(-2.5), -3);
    EXPECT_EQ(RoundHalfAway(0.49999999999999994), 1) << "0.5 is added in double precision";
    EXPECT_EQ(RoundHalfAway(Narrow(0.49999997)), 0);
    EXPECT_EQ(RoundToUnsigned(0.5), 1u);
    EXPECT_EQ(RoundToUnsigned(-0.6), 0u);
    EXPECT_EQ(RoundToUnsigned(5e9), 4294967295u);
    EXPECT_EQ(RoundToUnsigned(std::numeric_limits<double>::quiet_NaN()), 0u);
}

TEST(FrameContext, TellsTheFrameNumberFromTheTime) {
    const double inf = std::numeric_limits<double>::infinity();
    struct Row {
        double seconds;
        std::int32_t number;
    };
    const Row rows[] = {{0, 0},
                        {1.0, 30},
                        {0.999, 29},
                        {-0.5, -15},
                        {2.999 / 30, 2},
                        {0.1, 3},
                        {0.7, 21},
                        {-0.01, 0},
                        {100.0 / 30, 100},
                        {std::numeric_limits<double>::quiet_NaN(), 0},
                        {inf, 2147483647},
                        {-1e300, std::numeric_limits<std::int32_t>::min()}};
    for (const Row& row : rows) {
        GuardedFrame frame{Geometry{}};
        FrameContext context(frame.Description(), frame.Description());
        context.SetTime(row.seconds);
        EXPECT_EQ(context.FrameNumber(), row.number) << row.seconds;
    }
    // Every whole frame at 30 frames a second maps to itself while the product's error is below the tolerance.
    GuardedFrame frame{Geometry{}};
    FrameContext context(frame.Description(), frame.Description());
    for (std::int32_t n = -4095; n < 4096; ++n) {
        context.SetTime(n / 30.0);
        ASSERT_EQ(context.FrameNumber(), n);
    }
    for (std::int32_t seconds = 0; seconds < 40000; seconds += 9) {
        context.SetTime(seconds);
        ASSERT_EQ(context.FrameNumber(), 30 * seconds);
    }
}

TEST(ImageView, JudgesValidityInExactArithmetic) {
    std::uint8_t pixel[64] = {};
    constexpr std::int32_t kMost = std::numeric_limits<std::int32_t>::max();
    struct Row {
        const char* name;
        FrameDescription frame;
        bool valid;
    };
    const Row rows[] = {
        {"one pixel", {pixel, 1, 1, 4, 0, 0}, true},
        {"odd step", {pixel, 1, 2, 5, 0, 0}, true},
        {"origin inside", {pixel, 1, 1, 16, 3, 2}, true},
        {"no pixels", {nullptr, 1, 1, 4, 0, 0}, false},
        {"zero width", {pixel, 0, 1, 4, 0, 0}, false},
        {"zero height", {pixel, 1, 0, 4, 0, 0}, false},
        {"zero width behind an origin", {pixel, 0, 1, 64, 4, 0}, false},
        {"negative height behind an origin", {pixel, 1, -1, 64, 0, 4}, false},
        {"short step", {pixel, 2, 1, 7, 0, 0}, false},
        {"step short of the origin", {pixel, 1, 1, 4, 1, 0}, false},
        {"negative origin", {pixel, 2, 2, 16, -1, 0}, false},
        {"zero step", {pixel, 1, 1, 0, 0, 0}, false},
        {"width overflows", {pixel, kMost, 1, kMost, 1, 0}, false},
        {"height overflows", {pixel, 1, kMost, 4, 0, 1}, false},
        {"step overflows", {pixel, 1, 1, std::numeric_limits<std::int32_t>::min(), 0, 0}, false},
    };
    for (const Row& row : rows) {
        EXPECT_EQ(ViewOf(row.frame, row.frame.width, row.frame.height).IsValid(), row.valid) << row.name;
    }
}

TEST(ImageView, BottomUpBuffersCountFromTheLowestAddress) {
    GuardedFrame up{Geometry{4, 3, 1, 2, 3, true}};
    GuardedFrame down{Geometry{4, 3, 1, 2, 3, false}};
    up.FillRandom(1), down.FillRandom(1);
    const ImageView a = ViewOf(up.Description(), 4, 3), b = ViewOf(down.Description(), 4, 3);
    for (int y = 0; y < 3; ++y) EXPECT_EQ(std::memcmp(a.Row(y), b.Row(y), 16), 0) << y;
    EXPECT_EQ(a.rowStep, b.rowStep);
}

TEST(FrameContext, DetachesTheSourceAndLeavesWhatIsClaimed) {
    GuardedFrame source{Geometry{3, 2}}, destination{Geometry{5, 4, 2, 1, 3}};
    source.FillRandom(1), destination.FillRandom(2);
    FrameContext context(source.Description(), destination.Description());
    ASSERT_EQ(context.Width(), 3);
    ASSERT_EQ(context.Height(), 2);
    const ImageView attached = context.Source();
    ASSERT_TRUE(context.DetachSource());
    EXPECT_NE(context.Source().Row(0), attached.Row(0));
    EXPECT_EQ(std::memcmp(context.Source().Row(1), attached.Row(1), 12), 0);

    context.ClaimDestination().Row(1)[2] = {1, 2, 3, 4};
    const GuardedFrame before = destination;
    context.Finish();
    EXPECT_EQ(destination.Bytes(), before.Bytes()) << "claimed: nothing to copy";
}

TEST(FrameContext, CopiesRowsThatOverlapAsIfTheSourceHadBeenTakenFirst) {
    constexpr std::int32_t kWidth = 3, kHeight = 5, kStep = 16;  // a gap after each row
    for (const std::int32_t shift : {1, -1}) {
        std::vector<std::uint8_t> memory(kStep * (kHeight + 2));
        for (std::size_t i = 0; i < memory.size(); ++i) memory[i] = static_cast<std::uint8_t>(i);
        std::vector<std::uint8_t> expected = memory;
        for (std::int32_t y = 1; y <= kHeight; ++y) {
            std::copy_n(memory.begin() + y * kStep, kWidth * 4, expected.begin() + (y + shift) * kStep);
        }
        std::uint8_t* const from = memory.data() + kStep;
        FrameContext({from, kWidth, kHeight, kStep, 0, 0},
                     {from + shift * kStep, kWidth, kHeight, kStep, 0, 0})
            .Finish();
        EXPECT_EQ(memory, expected) << shift;
    }
}

TEST(Random, MatchesLongArithmeticAndSkips) {
    // state x 1103515245 + 12345 modulo 2^32, restated with a wide product.
    Random random(12345);
    std::uint64_t state = 12345;
    for (std::uint32_t i = 1; i <= 1000; ++i) {
        state = (state * 1103515245ull + 12345ull) % 4294967296ull;
        ASSERT_EQ(random.Next(), state / 65536 % 32768);
        Random jump(12345);
        jump.Skip(i);
        ASSERT_EQ(jump.State(), random.State()) << i;
    }
    // Advancing by 2^32 - 1 goes one step back.
    Random back = random;
    back.Skip(0xFFFFFFFFu);
    back.Next();
    EXPECT_EQ(back.State(), random.State());
}

TEST(Random, DrawsBetweenIntegersInEitherOrder) {
    for (std::uint32_t seed = 0; seed < 2000; ++seed) {
        Random a(seed * 2654435761u), b = a, plain = a;
        const std::int32_t drawn = a.Draw(-7, 12);
        ASSERT_EQ(drawn, b.Draw(12, -7));
        ASSERT_EQ(drawn, static_cast<std::int64_t>(plain.Next()) * 19 / 32767 - 7);
    }
    Random random(1);
    EXPECT_EQ(random.Draw(5, 5), 5);
    // Only the largest number gives the upper end; this state comes just before it.
    Random last(0x7FFF0000u);
    last.Skip(0xFFFFFFFFu);
    EXPECT_EQ(last.Draw(-7, 12), 12);
}

TEST(Random, DecimalDrawsKeepTheirEnds) {
    for (std::uint32_t seed = 0; seed < 500; ++seed) {
        Random a(seed), plain(seed);
        const double value = a.DrawDecimal(0.0f, 0.166f, 2);
        // 0.166 x 100 rounds to 17 hundredths, clamped to the float 0.166.
        const double drawn = static_cast<double>(plain.Next() * 17 / 32767) / 100.0;
        ASSERT_EQ(value, drawn > static_cast<double>(0.166f) ? static_cast<double>(0.166f) : drawn);
    }
}

TEST(FrameRandom, ReplaysOnlyAnImmediateRepeat) {
    FrameRandom frames;
    frames.Seed(99);
    const auto numberOf = [&frames](std::int32_t frame) {
        frames.BeginFrame(frame);
        return frames.Numbers().Next();
    };
    Random running(99);
    const auto first = running.Next(), second = running.Next(), third = running.Next();
    EXPECT_EQ(numberOf(5), first);
    EXPECT_EQ(numberOf(5), first);
    EXPECT_EQ(numberOf(6), second);
    EXPECT_EQ(numberOf(5), third);
}

TEST(FrameRandom, PinnedFramesDependOnSeedAndNumberAlone) {
    FrameRandom frames;
    const auto pinned = [&frames](std::uint32_t seed, std::int32_t number) {
        frames.Pin(seed, number);
        frames.BeginFrame(number);
        return frames.Numbers().State();
    };
    const auto value = pinned(7, 100);
    EXPECT_NE(value, pinned(7, 101));
    EXPECT_NE(value, pinned(8, 100));
    frames.Numbers().Next();
    EXPECT_EQ(value, pinned(7, 100));
}

}  // namespace
}  // namespace velmora::render
