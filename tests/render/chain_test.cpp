// Rendering by rows, on every SIMD level, gives the same frame as applying the stages one after the other, for any
// settings and frames.

#include <gtest/gtest.h>

#include <algorithm>
#include <random>

#include "render/renderer.h"
#include "tests/common/guarded_frame.h"
#include "tests/render/stage_renderer.h"

namespace velmora::render {
namespace {

using testing::Geometry;
using testing::GuardedFrame;

class Dice {
  public:
    explicit Dice(std::uint32_t seed) : m_numbers(seed) {}
    std::int32_t Whole(std::int32_t low, std::int32_t high) {
        return std::uniform_int_distribution<std::int32_t>(low, high)(m_numbers);
    }
    float Part() { return static_cast<float>(Whole(0, 1000)) / 1000.0f; }
    bool Half() { return Whole(0, 1) == 1; }

  private:
    std::mt19937 m_numbers;
};

// Each stage takes part in half of the frames.
StageSettings AnySettings(Dice& dice) {
    StageSettings s;
    if (dice.Half()) s.yJitter = dice.Whole(0, 10), s.xJitter = dice.Whole(0, 10);
    s.borderColour = static_cast<std::uint32_t>(dice.Whole(0, 0x7FFFFFFF));
    if (dice.Half()) s.glow = dice.Part();
    if (dice.Half()) s.saturation = 2.0f * dice.Part() - 1.0f;
    if (dice.Half()) s.flicker = dice.Part(), s.flickerRate = static_cast<std::uint32_t>(dice.Whole(0, 30));
    if (dice.Half()) s.brightness = 2.0f * dice.Part() - 1.0f;
    if (dice.Half()) s.contrast = 2.0f * dice.Part() - 1.0f;
    if (dice.Half()) s.filmGamma = dice.Part();
    if (dice.Half()) s.tintRed = dice.Part(), s.tintBlue = dice.Part();
    if (dice.Half()) s.wear = dice.Part(), s.wearPattern = dice.Whole(2000, 1999 + kWearPictureCount);
    if (dice.Half()) s.wearChannels = kWearBlueOnly;
    if (dice.Half()) {
        s.scratchKinds = static_cast<std::uint32_t>(dice.Whole(1, 7));
        s.scratchCount = static_cast<std::uint32_t>(dice.Whole(1, 16));
        s.scratchConstant = 35;
        s.scratchDepth = dice.Part();
        s.scratchSeed = 35.0f + 100.0f * dice.Part();
    }
    if (dice.Half()) s.spots = 100.0f * dice.Part();
    return s;
}

Geometry AnyGeometry(Dice& dice) {
    const std::int32_t largest = dice.Half() ? 90 : 7;
    return {dice.Whole(1, largest), dice.Whole(1, largest), dice.Whole(0, 3),
            dice.Whole(0, 3),       dice.Whole(0, 5),       dice.Half()};
}

// The plain reference, or by rows with these options.
struct How {
    bool isReference = false;
    RenderOptions options = {};
};

void Render(GuardedFrame& source, GuardedFrame& destination, const StageSettings& settings, const How& how,
            double seconds) {
    RenderState state;
    state.random.Pin(3, 0);
    FrameContext context(source.Description(), destination.Description());
    context.SetTime(seconds);
    ASSERT_TRUE(context.IsValid(Slot::kSource) && context.IsValid(Slot::kDestination));
    if (how.isReference) {
        testing::RenderByStages(context, settings, state, how.options.isDamageOnly);
    } else {
        RenderStages(context, settings, state, how.options);
    }
    context.Finish();
}

const How kReference = {true}, kByRows = {}, kStreamed = {false, {BestSimdLevel(), 0}};

TEST(Chain, ByRowsGivesTheStagesBytes) {
    for (std::uint32_t seed = 0; seed < 400; ++seed) {
        SCOPED_TRACE(seed);
        Dice dice(seed);
        const StageSettings settings = AnySettings(dice);
        GuardedFrame source(AnyGeometry(dice)), expected(AnyGeometry(dice));
        source.FillRandom(seed), expected.FillRandom(seed + 1);
        const GuardedFrame before = expected, untouched = source;
        const double seconds = dice.Whole(0, 3000) / 30.0;
        const bool isDamageOnly = seed % 8 == 0;
        Render(source, expected, settings, {true, {.isDamageOnly = isDamageOnly}}, seconds);
        const std::int32_t width = std::min(source.Shape().width, expected.Shape().width);
        const std::int32_t height = std::min(source.Shape().height, expected.Shape().height);
        ASSERT_TRUE(expected.OnlyRegionDiffers(before, width, height));
        for (const SimdLevel level : kSimdLevels) {
            if (level > BestSimdLevel()) continue;
            for (const std::int64_t streamedBytes : {std::int64_t{0}, RenderOptions{}.streamedBytes}) {
                GuardedFrame destination = before;
                Render(source, destination, settings, {false, {level, streamedBytes, isDamageOnly}}, seconds);
                ASSERT_EQ(destination.Bytes(), expected.Bytes()) << static_cast<int>(level);
            }
        }
        ASSERT_EQ(source.Bytes(), untouched.Bytes());
    }
}

// Few amounts have bytes without a factor.
TEST(Chain, ByRowsGivesTheStagesBytesUnderOddWear) {
    int found = 0;
    for (int step = 1; step <= 2000; ++step) {
        StageSettings settings;
        settings.wearPattern = 2002;  // the one with the most different bytes
        settings.wear = static_cast<float>(step) / 2000.0f;
        WearFactors factors;
        ASSERT_TRUE(factors.Set(WearPicture(settings.wearPattern), settings.wear));
        if (!factors.HasOddBytes()) continue;
        ++found;
        for (const std::int32_t channels : {kWearAllChannels, kWearBlueOnly}) {
            settings.wearChannels = channels;
            GuardedFrame source{Geometry{130, 40}}, expected{Geometry{130, 40}}, result = expected;
            source.FillRandom(1);
            Render(source, expected, settings, kReference, 0.0);
            Render(source, result, settings, kByRows, 0.0);
            ASSERT_EQ(result.Bytes(), expected.Bytes()) << step;
        }
    }
    EXPECT_GT(found, 5);
}

TEST(Chain, InPlaceIsAsIfTheSourceHadBeenCopiedFirst) {
    for (std::uint32_t seed = 0; seed < 200; ++seed) {
        SCOPED_TRACE(seed);
        Dice dice(seed);
        const StageSettings settings = AnySettings(dice);
        const Geometry geometry = AnyGeometry(dice);
        GuardedFrame source(geometry), expected(geometry);
        source.FillRandom(seed);
        expected = source;
        Render(source, expected, settings, kReference, 1.0);
        for (const How& how : {kReference, kByRows, kStreamed}) {
            GuardedFrame both = source;
            Render(both, both, settings, how, 1.0);
            ASSERT_EQ(both.Bytes(), expected.Bytes());
        }
    }
}

TEST(Chain, OverlappingFramesAreAsIfTheSourceHadBeenCopiedFirst) {
    for (std::int32_t shift = -3; shift <= 3; ++shift) {
        for (const bool jitter : {false, true}) {
            StageSettings settings;
            settings.saturation = -0.5f;
            if (jitter) settings.yJitter = settings.xJitter = 5;
            // One buffer of 20 rows; the destination is `shift` rows below the source.
            GuardedFrame buffer{Geometry{9, 20}};
            buffer.FillRandom(1);
            GuardedFrame apart = buffer, copy = buffer;
            const auto part = [](GuardedFrame& frame, std::int32_t top) {
                FrameDescription d = frame.Description();
                d.yOrigin = top;
                d.height = 10;
                return d;
            };
            for (auto [source, destination] : {std::pair{&copy, &apart}, {&buffer, &buffer}}) {
                RenderState state;
                state.random.Pin(1, 0);
                FrameContext context(part(*source, 5), part(*destination, 5 + shift));
                RenderStages(context, settings, state);
                context.Finish();
            }
            EXPECT_EQ(buffer.Bytes(), apart.Bytes()) << shift;
        }
    }
}

TEST(Chain, NeutralSettingsCopyTheSource) {
    for (const How& how : {kReference, kByRows, kStreamed}) {
        GuardedFrame source{Geometry{13, 9, 1, 2, 3, true}}, destination{Geometry{11, 12}};
        source.FillRandom(1), destination.FillRandom(2);
        Render(source, destination, {}, how, 2.0);
        for (int y = 0; y < 9; ++y) {
            for (int x = 0; x < 11; ++x) ASSERT_EQ(destination.WordAt(y, x), source.WordAt(y, x));
        }
    }
}

TEST(DrawsPerFrame, TellsHowFarTheSequenceMoves) {
    for (std::uint32_t seed = 0; seed < 100; ++seed) {
        Dice dice(seed);
        const StageSettings settings = AnySettings(dice);
        GuardedFrame source(AnyGeometry(dice)), destination(AnyGeometry(dice));
        FrameContext context(source.Description(), destination.Description());
        RenderState state;
        state.random.Seed(seed);
        Random plain(seed);
        (void)PlanFrame(context, settings, state, kPlainKernels);
        plain.Skip(DrawsPerFrame(settings, context.Width()));
        ASSERT_EQ(state.random.Numbers().State(), plain.State()) << seed;
    }
}

}  // namespace
}  // namespace velmora::render
