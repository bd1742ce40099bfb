// Scratches: the lives that they lead and the marks that they leave.

#include <gtest/gtest.h>

#include <algorithm>
#include <bit>
#include <random>

#include "render/scratches.h"
#include "tests/render/plain_picture.h"

namespace velmora::render {
namespace {

using testing::PlainPicture;
using testing::SamePixels;

StageSettings Scratched(std::uint32_t kinds, std::uint32_t count, float depth, float seed) {
    StageSettings settings;
    settings.scratchKinds = kinds;
    settings.scratchCount = count;
    settings.scratchConstant = 35;
    settings.scratchDepth = depth;
    settings.scratchSeed = seed;
    return settings;
}

// The rules once more, frame by frame and in the plainest words. Columns in thousandths of a pixel.
class PlainReplay {
  public:
    struct Scratch {
        std::int64_t index = 0, isWhite = 0, end = 0, x0 = 0, low = 0, high = 0, column = 0, speed = 0;
    };

    PlainReplay(const StageSettings& settings, std::int64_t width)
        : m_settings(settings), m_width(width), m_scratches(settings.scratchCount) {
        m_state = std::bit_cast<std::uint32_t>(settings.scratchSeed);
    }

    void NextFrame() {
        ++m_frame;
        for (Scratch& scratch : m_scratches) {
            if (m_frame == 0 || m_frame == scratch.end) {
                Restart(scratch);
            } else {
                scratch.column += scratch.speed;
                if (scratch.column < scratch.low || scratch.column > scratch.high) {
                    scratch.column -= scratch.speed;
                    scratch.speed = -scratch.speed;
                }
            }
        }
    }
    const std::vector<Scratch>& Scratches() const { return m_scratches; }

  private:
    std::int64_t Draw(std::int64_t a, std::int64_t b) {
        m_state = m_state * 1103515245u + 12345u;
        const std::int64_t low = std::min(a, b), high = std::max(a, b);
        return (m_state >> 16 & 0x7FFF) * (high - low) / 32767 + low;
    }

    void Restart(Scratch& s) {
        constexpr std::int64_t kWidths[2][5] = {{2, 3, 4, 7, 10}, {2, 3, 4, 6, 9}};
        const std::uint32_t colours = m_settings.scratchKinds & 3;
        s.index = Draw(0, m_settings.scratchKinds & 4 ? 4 : 2);
        s.isWhite = colours == 1 ? 0 : colours == 2 ? 1 : Draw(0, 1000) > 700;
        s.end = m_frame + Draw(15, 90);
        const std::int64_t last = m_width - kWidths[s.isWhite][s.index];
        s.x0 = Draw(0, last);
        const std::int64_t r = Draw(0, 35);
        s.low = std::clamp<std::int64_t>(s.x0 - r / 2, std::min<std::int64_t>(0, last),
                                         std::max<std::int64_t>(0, last)) *
                1000;
        s.high = std::clamp<std::int64_t>(s.x0 + r, std::min<std::int64_t>(0, last),
                                          std::max<std::int64_t>(0, last)) *
                 1000;
        s.speed = Draw(-1750, 1750);
        s.column = s.x0 * 1000;
    }

    StageSettings m_settings;
    std::int64_t m_width;
    std::vector<Scratch> m_scratches;
    std::uint32_t m_state = 0;
    std::int64_t m_frame = -1;
};

TEST(ScratchLives, FollowThePlainReplay) {
    for (std::uint32_t kinds = 1; kinds <= 7; ++kinds) {
        for (const std::int32_t width : {3, 320, 1920}) {
            const StageSettings settings =
                Scratched(kinds, 1 + kinds * 2, 0.5f, 35.5f + static_cast<float>(kinds));
            PlainReplay plain(settings, width);
            ScratchReplays replays;
            for (std::int32_t frame = 0; frame < 2000; ++frame) {
                plain.NextFrame();
                if (frame % 7 != 0 && frame > 200) continue;
                const ScratchReplay& replay = replays.At(ReplayKeyOf(settings), frame);
                for (std::uint32_t i = 0; i < settings.scratchCount; ++i) {
                    SCOPED_TRACE(::testing::Message() << kinds << ", frame " << frame << ", scratch " << i);
                    const PlainReplay::Scratch& expected = plain.Scratches()[i];
                    const ScratchState state = ScratchStateAt(replay.LifeOf(i), frame, settings, width);
                    ASSERT_EQ(state.profileIndex, expected.index);
                    ASSERT_EQ(state.isWhite, expected.isWhite != 0);
                    ASSERT_EQ(state.endFrame, expected.end);
                    ASSERT_EQ(state.startColumn, expected.x0);
                    ASSERT_EQ(state.leastPosition, expected.low);
                    ASSERT_EQ(state.mostPosition, expected.high);
                    ASSERT_EQ(state.speed, expected.speed);
                    ASSERT_EQ(state.position, expected.column);
                    ASSERT_TRUE(state.tremble >= 218 && state.tremble <= 294);
                }
            }
        }
    }
}

struct Drawing {
    std::int32_t xOffset = 0;
    double seconds = 0.0;
    Form form = BestForm();
};

PlainPicture Draw(PlainPicture picture, const StageSettings& settings, const Drawing& drawing,
                  ScratchMemory& memory) {
    FrameContext context(picture.Description(), picture.Description());
    context.SetTime(drawing.seconds);
    const ScratchStage stage = PrepareScratches(settings, drawing.xOffset, context, memory, drawing.form);
    if (!stage.IsActive()) return picture;
    for (std::int32_t y = 0; y < picture.Height(); ++y) {
        stage.Row(picture.Row(y), picture.Row(y), picture.Width(), y);
    }
    return picture;
}

PlainPicture Draw(const PlainPicture& picture, const StageSettings& settings, const Drawing& drawing = {}) {
    ScratchMemory memory;
    return Draw(picture, settings, drawing, memory);
}

PlainPicture Grey(std::int32_t width = 640, std::int32_t height = 90) {
    return PlainPicture(width, height, {128, 128, 128, 255});
}

TEST(Scratches, AreTheSameInAnyOrderOfFrames) {
    const StageSettings settings[2] = {Scratched(7, 16, 0.8f, 60.0f), Scratched(1, 5, 0.4f, 60.0f)};
    std::vector<std::int32_t> frames;
    for (std::int32_t i = 0; i < 40; ++i) frames.push_back(i < 20 ? i : i * 911);
    ScratchMemory used;
    for (std::uint32_t round = 0; round < 3; ++round) {
        for (const std::int32_t frame : frames) {
            const StageSettings& those = settings[(static_cast<std::uint32_t>(frame) + round) % 2];
            const Drawing drawing{.seconds = (frame + 0.5) / 30.0};
            ASSERT_TRUE(SamePixels(Draw(Grey(), those, drawing, used), Draw(Grey(), those, drawing)))
                << frame;
        }
        std::shuffle(frames.begin(), frames.end(), std::mt19937(round));
    }
}

TEST(Scratches, StandStillBeforeTheClipAndComeAgainAfterItsEnd) {
    const StageSettings settings = Scratched(7, 16, 0.8f, 60.0f);
    const PlainPicture first = Draw(Grey(), settings);
    EXPECT_TRUE(SamePixels(first, Draw(Grey(), settings, {.seconds = -500.0})));
    EXPECT_TRUE(SamePixels(first, Draw(Grey(), settings, {.seconds = -1e30})));
    EXPECT_FALSE(SamePixels(first, Draw(Grey(), settings, {.seconds = 36000.0})));
    EXPECT_EQ(ScratchFrame(std::numeric_limits<std::int32_t>::max()), (1 << 22) - 1);
    EXPECT_EQ(ScratchFrame(1080000), 1080000);
}

TEST(Scratches, DrawNothingWithoutDepthOrCount) {
    for (const StageSettings& settings : {Scratched(7, 16, 0.0f, 60.0f), Scratched(7, 0, 1.0f, 60.0f)}) {
        PlainPicture picture = Grey();
        FrameContext context(picture.Description(), picture.Description());
        ScratchMemory memory;
        EXPECT_FALSE(PrepareScratches(settings, 0, context, memory, BestForm()).IsActive());
    }
}

// Over pictures of any size, wherever the jitter moves them: guards at either end of the rows stay whole,
// since the rows lie behind each other.
TEST(Scratches, BlackNeverLightensWhiteNeverDarkensAlphaStays) {
    std::mt19937 numbers(3);
    for (int round = 0; round < 300; ++round) {
        SCOPED_TRACE(round);
        const auto whole = [&numbers](int low, int high) {
            return std::uniform_int_distribution<int>(low, high)(numbers);
        };
        const int kinds = (round % 2 == 0 ? 1 : 2) + 4 * whole(0, 1);
        const StageSettings settings =
            Scratched(static_cast<std::uint32_t>(kinds), 16, static_cast<float>(whole(1, 10)) / 10.0f, 40.0f);
        const PlainPicture in =
            PlainPicture::Random(whole(1, 60), whole(1, 30), static_cast<std::uint32_t>(round));
        Drawing drawing{.xOffset = whole(-10, 10), .seconds = whole(0, 400) / 10.0};
        const PlainPicture out = Draw(in, settings, drawing);
        drawing.form = Form::kPlain;
        ASSERT_TRUE(SamePixels(out, Draw(in, settings, drawing)));
        for (std::size_t i = 0; i < in.Pixels().size(); ++i) {
            const int sign = round % 2 == 0 ? -1 : 1;
            const Bgra before = in.Pixels()[i], after = out.Pixels()[i];
            ASSERT_GE(sign * (after.blue - before.blue), 0);
            ASSERT_GE(sign * (after.green - before.green), 0);
            ASSERT_GE(sign * (after.red - before.red), 0);
            ASSERT_EQ(after.alpha, before.alpha);
        }
    }
}

// How much the scratches change, and in how many pixels.
struct Mark {
    std::int64_t amount = 0, pixels = 0;
};
Mark MarkOf(const PlainPicture& picture) {
    Mark mark;
    for (const Bgra& pixel : picture.Pixels()) {
        mark.amount += std::abs(pixel.green - 128);
        mark.pixels += pixel.green != 128;
    }
    return mark;
}

TEST(Scratches, DeepenWithDepthAndWidenWithThickOnes) {
    for (const std::uint32_t kinds : {1u, 2u, 3u}) {
        std::int64_t last = 0;
        for (const float depth : {0.1f, 0.3f, 0.6f, 1.0f}) {
            const std::int64_t amount = MarkOf(Draw(Grey(), Scratched(kinds, 16, depth, 60.0f))).amount;
            EXPECT_GT(amount, last * 3 / 2);
            last = amount;
        }
        const Mark thin = MarkOf(Draw(Grey(), Scratched(kinds, 16, 0.6f, 60.0f)));
        const Mark thick = MarkOf(Draw(Grey(), Scratched(kinds | 4, 16, 0.6f, 60.0f)));
        EXPECT_GT(thick.pixels, thin.pixels * 4 / 3);
    }
}

TEST(Scratches, MoveWithThePicture) {
    const StageSettings settings = Scratched(7, 16, 0.9f, 77.0f);
    const PlainPicture still = Draw(Grey(), settings), moved = Draw(Grey(), settings, {.xOffset = 7});
    for (std::int32_t y = 0; y < still.Height(); ++y) {
        ASSERT_EQ(std::memcmp(still.Row(y), moved.Row(y) + 7, sizeof(Bgra) * 633), 0);
    }
}

// Each scratch is seen from top to bottom in most of its rows, and no row is cut off by a hard edge.
TEST(Scratches, RunDownThePictureAsSoftLines) {
    for (std::int32_t frame = 0; frame < 60; ++frame) {
        const PlainPicture out =
            Draw(Grey(1920, 540), Scratched(1, 1, 1.0f, 51.0f), {.seconds = frame / 30.0 + 0.01});
        std::int32_t rowsMarked = 0, darkestBefore = 128;
        for (std::int32_t y = 0; y < out.Height(); ++y) {
            const auto darker = [](const Bgra& a, const Bgra& b) { return a.green < b.green; };
            const Bgra* darkest = std::min_element(out.Row(y), out.Row(y) + 1920, darker);
            rowsMarked += darkest->green < 120;
            ASSERT_TRUE(y == 0 || std::abs(darkest->green - darkestBefore) <= 24)
                << "frame " << frame << ", row " << y;
            darkestBefore = darkest->green;
        }
        EXPECT_GT(rowsMarked, out.Height() / 3) << frame;
    }
}

}  // namespace
}  // namespace velmora::render
