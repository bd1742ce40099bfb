// Scratches: their lives and the marks they leave.

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <bit>
#include <map>
#include <numeric>
#include <random>

#include "render/kernels.h"
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

// The rules restated as simply as possible, frame by frame. Columns are in thousandths of a pixel.
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
    SimdLevel level = BestSimdLevel();
};

PlainPicture Draw(PlainPicture picture, const StageSettings& settings, const Drawing& drawing,
                  ScratchMemory& memory) {
    FrameContext context(picture.Description(), picture.Description());
    context.SetTime(drawing.seconds);
    const ScratchStage stage =
        PrepareScratches(settings, drawing.xOffset, context, memory, KernelsOf(drawing.level));
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
    std::array<std::int32_t, 40> frames;
    for (std::int32_t i = 0; i < 40; ++i) frames[static_cast<std::size_t>(i)] = i < 20 ? i : i * 911;
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
        EXPECT_FALSE(PrepareScratches(settings, 0, context, memory, KernelsOf(BestSimdLevel())).IsActive());
    }
}

// Pictures of any size, with any jitter. The rows are stored without gaps, so a write past the end of one lands in
// the next.
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
        drawing.level = SimdLevel::kPlain;
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

// How much the scratches change the picture, and in how many pixels.
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
        std::int64_t thin = 0, thick = 0;
        for (int seed = 60; seed < 70; ++seed) {
            const auto of = [&](std::uint32_t those) {
                return MarkOf(Draw(Grey(), Scratched(those, 16, 0.6f, static_cast<float>(seed)))).pixels;
            };
            thin += of(kinds);
            thick += of(kinds | 4);
        }
        EXPECT_GT(thick, thin * 6 / 5);
    }
}

TEST(Scratches, MoveWithThePicture) {
    const StageSettings settings = Scratched(7, 16, 0.9f, 77.0f);
    const PlainPicture still = Draw(Grey(), settings), moved = Draw(Grey(), settings, {.xOffset = 7});
    for (std::int32_t y = 0; y < still.Height(); ++y) {
        ASSERT_EQ(std::memcmp(still.Row(y), moved.Row(y) + 7, sizeof(Bgra) * 633), 0);
    }
}

// Calls check(line, frame, index) for all scratches of a few clips in successive frames, at full depth.
template <typename Check>
void ForEachLine(std::int32_t frames, const Check& check) {
    for (int clip = 0; clip < 6; ++clip) {
        const StageSettings settings = Scratched(7, 16, 1.0f, 40.0f + static_cast<float>(clip));
        PlainPicture picture(1920, 1080);
        ScratchMemory memory;
        for (std::int32_t frame = 0; frame < frames; ++frame) {
            FrameContext context(picture.Description(), picture.Description());
            context.SetTime((frame + 0.5) / 30.0);
            const ScratchStage stage =
                PrepareScratches(settings, 0, context, memory, KernelsOf(BestSimdLevel()));
            ASSERT_TRUE(stage.IsActive());
            for (std::uint32_t i = 0; i < 16; ++i) check(memory.lines[i], frame, i);
        }
    }
}

// Equal lines look like a fence; on worn film one or two in ten stand out among many faint ones.
TEST(Scratches, AreMostlyFaintWithAFewThatStandOut) {
    int faint = 0, strong = 0, all = 0;
    ForEachLine(200, [&](const ScratchLine& line, std::int32_t, std::uint32_t) {
        ++all;
        faint += line.strength < 65536 * 35 / 100;
        strong += line.strength > 65536 * 60 / 100;
    });
    EXPECT_GT(faint, all * 55 / 100);
    EXPECT_GT(strong, all / 16);
    EXPECT_LT(strong, all / 5);
}

// An eased fade of at most 3/4 over ten frames or more, and a tremble of +-1/16.
TEST(Scratches, FadeSlowly) {
    std::map<std::uint32_t, std::uint32_t> before;
    int jumps = 0, changes = 0;
    ForEachLine(200, [&](const ScratchLine& line, std::int32_t frame, std::uint32_t i) {
        if (frame > 0) {
            const double ratio = line.strength / static_cast<double>(before[i]);
            jumps += ratio < 0.7 || ratio > 1.4;
            changes += ratio < 0.98 || ratio > 1.02;
        }
        before[i] = line.strength;
    });
    EXPECT_LT(jumps, 6 * 16 * 200 / 40);  // a life of 52 frames on average, and most new ones differ
    EXPECT_GT(changes, 6 * 16 * 200 / 4);
}

// The rows in which a scratch only gets weaker, or only stronger: a spindle's end would have dozens of them.
TEST(Scratches, BreakOffRaggedly) {
    std::int32_t breaks = 0;
    ForEachLine(12, [&](const ScratchLine& line, std::int32_t frame, std::uint32_t i) {
        if (line.strength < 20000 || line.pixel < 20 || line.pixel > 1880) return;
        PlainPicture out = Grey(1920, 1080);
        const ScratchStage stage(&line, 1, 1080, KernelsOf(BestSimdLevel()));
        std::int32_t last = 0, falling = 0, rising = 0;
        for (std::int32_t y = 0; y < 1080; ++y) {
            stage.Row(out.Row(y), out.Row(y), 1920, y);
            std::int32_t mark = 0;
            for (std::int32_t x = line.pixel - 20; x < line.pixel + 40; ++x)
                mark += x < 1920 ? std::abs(out.Row(y)[x].green - 128) : 0;
            breaks += mark == 0 && last != 0;
            falling = mark < last ? falling + 1 : 0;
            rising = mark > last ? rising + 1 : 0;
            last = mark;
            ASSERT_LT(std::max(falling, rising), 45)
                << "frame " << frame << ", scratch " << i << ", row " << y;
        }
    });
    EXPECT_GT(breaks, 1000);
}

// A scratch has the same total weight at any position within a pixel; otherwise a drifting one would shimmer.
TEST(Scratches, CoverAsMuchAtEveryPhaseWithinTheProfile) {
    for (int i = 0; i < 2 * kScratchProfiles * kScratchSections; ++i) {
        const bool isWhite = i % 2 != 0;
        const std::int32_t index = i / 2 % kScratchProfiles;
        const ScratchProfile& profile = (isWhite ? kWhiteScratchProfiles : kBlackScratchProfiles)[index];
        for (const ScratchShape& shape : ScratchShapesOf(isWhite, index, i / 2 / kScratchProfiles).worn) {
            const auto sum = [](const auto& weights) {
                return std::accumulate(weights.begin(), weights.end(), 0);
            };
            for (const auto& weights : shape) {
                EXPECT_NEAR(sum(weights), sum(shape[0]), 16);
                EXPECT_TRUE(std::all_of(weights.begin() + profile.width + 1, weights.end(),
                                        [](std::uint16_t weight) { return weight == 0; }));
            }
            EXPECT_EQ(shape[0][static_cast<std::size_t>(profile.width)], 0);
        }
    }
}

// A black scratch darkens a shadow by a smaller share than a mid grey; likewise, a white one takes a smaller share of a
// highlight's distance to white.
TEST(Scratches, WeakenWhereThePictureIsLikeThem) {
    const auto changeOf = [](std::uint32_t kinds, std::uint8_t grey) {
        const PlainPicture in(640, 90, {grey, grey, grey, 255});
        std::int64_t change = 0;
        const PlainPicture out = Draw(in, Scratched(kinds, 16, 1.0f, 60.0f));
        for (const Bgra& pixel : out.Pixels()) change += std::abs(pixel.green - grey);
        return change;
    };
    EXPECT_LT(changeOf(1, 32) * 128, changeOf(1, 128) * 32 * 2 / 3);
    EXPECT_LT(changeOf(2, 223) * 128, changeOf(2, 127) * 32 * 2 / 3);
}

}  // namespace
}  // namespace velmora::render
