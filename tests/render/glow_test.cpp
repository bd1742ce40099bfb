// Diffusion: what a mist filter does and does not do to a picture.

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <limits>
#include <vector>

#include "render/glow.h"
#include "render/kernels.h"
#include "tests/render/plain_picture.h"

namespace velmora::render {
namespace {

using testing::PlainPicture;
using testing::SamePixels;

const GlowKernels& BestGlow() {
    return *KernelsOf(BestSimdLevel()).glow;
}

PlainPicture Glowing(const PlainPicture& in, float amount) {
    GlowMemory memory;
    PlainPicture out = in;
    const GlowStage stage = PrepareGlow(amount, in, in.Width(), in.Height(), memory, BestGlow());
    EXPECT_TRUE(stage.IsActive());
    for (std::int32_t y = 0; y < in.Height(); ++y) stage.Row(in.Row(y), out.Row(y), in.Width(), y);
    return out;
}

void Paint(PlainPicture& picture, const Rectangle& rectangle, std::uint8_t level) {
    for (std::int32_t y = rectangle.top; y < rectangle.bottom; ++y) {
        std::fill(picture.Row(y) + rectangle.left, picture.Row(y) + rectangle.right,
                  Bgra{level, level, level, 255});
    }
}

// Small ones, odd ones, and heights on both sides of every step of the reduction up to eightfold.
constexpr struct {
    std::int32_t width, height;
} kSizes[] = {{1, 1},    {2, 1},    {1, 5},    {3, 2},    {7, 7},    {64, 48},   {31, 299}, {1023, 3},
              {33, 300}, {34, 301}, {45, 599}, {61, 602}, {5, 1201}, {71, 1210}, {2, 2403}};

TEST(Glow, DoesNothingWithoutAnAmount) {
    const PlainPicture picture(8, 8, {200, 200, 200, 255});
    GlowMemory memory;
    for (const float amount : {0.0f, -1.0f, std::numeric_limits<float>::quiet_NaN()}) {
        EXPECT_FALSE(PrepareGlow(amount, picture, 8, 8, memory, BestGlow()).IsActive());
    }
}

TEST(Glow, NeverDarkensAndKeepsAlpha) {
    for (const auto& size : kSizes) {
        SCOPED_TRACE(::testing::Message() << size.width << "x" << size.height);
        PlainPicture in = PlainPicture::Random(size.width, size.height, 5);
        for (std::size_t i = 0; i < in.Pixels().size(); i += 3) in.Pixels()[i] = {0, 0, 0, 77};
        for (std::size_t i = 1; i < in.Pixels().size(); i += 3) in.Pixels()[i] = {255, 255, 255, 3};
        for (const float amount : {0.1f, 1.0f}) {
            const PlainPicture out = Glowing(in, amount);
            for (std::size_t i = 0; i < in.Pixels().size(); ++i) {
                const Bgra before = in.Pixels()[i], after = out.Pixels()[i];
                ASSERT_GE(after.blue, before.blue);
                ASSERT_GE(after.green, before.green);
                ASSERT_GE(after.red, before.red);
                ASSERT_EQ(after.alpha, before.alpha);
            }
        }
    }
}

TEST(Glow, LeavesAPictureWithoutLightsAsItIs) {
    for (const auto& size : kSizes) {
        SCOPED_TRACE(::testing::Message() << size.width << "x" << size.height);
        PlainPicture in(size.width, size.height);
        ASSERT_TRUE(SamePixels(in, Glowing(in, 1.0f)));
        const PlainPicture noise = PlainPicture::Random(size.width, size.height, 6);
        std::transform(noise.Pixels().begin(), noise.Pixels().end(), in.Pixels().begin(), [](Bgra pixel) {
            const auto level = static_cast<std::uint8_t>(pixel.green % 90);
            return Bgra{level, level, level, pixel.alpha};
        });
        ASSERT_TRUE(SamePixels(in, Glowing(in, 1.0f)));
    }
}

// Apart from the dither, which is below one level.
TEST(Glow, LeavesAnEvenPictureEvenUpToItsBorder) {
    for (const auto& size : kSizes) {
        for (const std::uint8_t level : std::initializer_list<std::uint8_t>{110, 140, 201, 255}) {
            SCOPED_TRACE(::testing::Message() << size.width << "x" << size.height << " of " << int{level});
            const std::uint8_t half = static_cast<std::uint8_t>(level / 2);
            const PlainPicture out =
                Glowing(PlainPicture(size.width, size.height, {half, level, level, 9}), 0.7f);
            const auto [lowest, highest] =
                std::minmax_element(out.Pixels().begin(), out.Pixels().end(),
                                    [](Bgra a, Bgra b) { return a.blue + a.green < b.blue + b.green; });
            EXPECT_GE(lowest->green, level);
            EXPECT_LE(highest->green - lowest->green, 1);
            EXPECT_LE(highest->blue - lowest->blue, 1);
        }
    }
}

TEST(Glow, SpreadsALightEvenlyToAllSides) {
    PlainPicture in(256, 256, {25, 25, 25, 255});
    Paint(in, {118, 138, 118, 138}, 255);
    const PlainPicture out = Glowing(in, 1.0f);
    const auto at = [&out](std::int32_t x, std::int32_t y) -> int { return out.Row(y)[x].green; };
    for (std::int32_t y = 0; y < 256; ++y) {
        for (std::int32_t x = 0; x < 256; ++x) {
            ASSERT_NEAR(at(x, y), at(255 - x, y), 1);
            ASSERT_NEAR(at(x, y), at(x, 255 - y), 1);
            ASSERT_NEAR(at(x, y), at(y, x), 1);
        }
    }
    EXPECT_GT(at(112, 128), 45);  // a halo
    EXPECT_EQ(at(2, 128), 25);    // not a wash
}

// A light a tenth of the height in size, measured at distances relative to the height.
TEST(Glow, ReachesAsFarAsThePictureIsHigh) {
    const auto halo = [](std::int32_t height, double distance) -> int {
        PlainPicture in(height, height, {40, 40, 40, 255});
        Paint(in, {height * 45 / 100, height * 55 / 100, height * 45 / 100, height * 55 / 100}, 255);
        const std::int32_t x = height * 55 / 100 + static_cast<std::int32_t>(std::lround(height * distance));
        return Glowing(in, 1.0f).Row(height / 2)[x].green - 40;
    };
    for (const double distance : {0.01, 0.02, 0.04, 0.08}) {
        const int expected = halo(1200, distance);
        for (const std::int32_t height : {200, 280, 320, 580, 720, 1080}) {
            EXPECT_NEAR(halo(height, distance), expected, 3 + expected / 10)
                << height << " rows, " << distance;
        }
    }
}

// The mean green of successive 16 × 16 blocks to the right of a point. Averaging removes the dither.
std::vector<double> Profile(const PlainPicture& picture, std::int32_t left, std::int32_t top) {
    constexpr std::int32_t kSide = 16;
    std::vector<double> means;
    for (std::int32_t x = left; x + kSide <= picture.Width(); x += kSide) {
        double sum = 0;
        for (std::int32_t i = 0; i < kSide * kSide; ++i) {
            sum += picture.Row(top + i / kSide)[x + i % kSide].green;
        }
        means.push_back(sum / (kSide * kSide));
    }
    return means;
}

// A white disc on black and on grey. The halo is grey, falls steadily without rings or bands (stretches of one level),
// and is visible at an eighth of the height from the disc.
TEST(Glow, MakesASmoothWideHalo) {
    for (const std::int32_t height : {288, 576, 1080}) {
        for (const std::uint8_t ground : std::initializer_list<std::uint8_t>{0, 60}) {
            const std::int32_t radius = height / 10, middle = height / 2;
            PlainPicture in(height, height, {ground, ground, ground, 255});
            for (std::int32_t y = -radius; y <= radius; ++y) {
                const auto half = static_cast<std::int32_t>(std::sqrt(radius * radius - y * y));
                Paint(in, {middle - half, middle + half, middle + y, middle + y + 1}, 255);
            }
            for (const float amount : {0.1f, 0.35f, 1.0f}) {
                SCOPED_TRACE(::testing::Message() << height << " rows on " << int{ground} << ", " << amount);
                const PlainPicture out = Glowing(in, amount);
                for (const Bgra pixel : out.Pixels()) {
                    ASSERT_TRUE(pixel.blue == pixel.green && pixel.red == pixel.green);
                }
                const std::vector<double> halo = Profile(out, middle + radius + 2, middle - 8);
                for (std::size_t i = 1; i < halo.size() && halo[i - 1] > ground + 0.3; ++i) {
                    EXPECT_LT(halo[i], halo[i - 1]) << "step " << i;
                }
                EXPECT_GT(halo[static_cast<std::size_t>(height / 8 / 16)],
                          ground + 8 * amount * (255 - ground) / 255);
                EXPECT_LT(halo.back(), ground + 0.3);
            }
        }
    }
}

TEST(Glow, GrowsWithTheAmountAndKeepsTheLightsColour) {
    PlainPicture in(300, 200, {50, 50, 50, 255});
    for (std::int32_t y = 80; y < 120; ++y)
        std::fill(in.Row(y) + 100, in.Row(y) + 200, Bgra{60, 200, 255, 255});
    int last = 50;
    for (const float amount : {0.1f, 0.25f, 0.5f, 0.75f, 1.0f}) {
        const Bgra beside = Glowing(in, amount).Row(100)[205];
        EXPECT_GT(beside.red, last);
        EXPECT_GE(beside.red, beside.green);
        EXPECT_GT(beside.green, beside.blue);
        last = beside.red;
    }
}

// A frame does not depend on the one before it, of whatever size, and its rows can be processed in any order.
TEST(Glow, RemembersNeitherTheFrameNorTheRowBefore) {
    GlowMemory memory;
    for (const auto& size : kSizes) {
        PlainPicture in = PlainPicture::Random(size.width, size.height, 8);
        std::fill(in.Row(0), in.Row(0) + size.width, Bgra{255, 255, 255, 255});
        PlainPicture out = in;
        const GlowStage stage = PrepareGlow(0.5f, in, size.width, size.height, memory, BestGlow());
        for (std::int32_t y = size.height; y-- > 0;) stage.Row(out.Row(y), out.Row(y), size.width, y);
        ASSERT_TRUE(SamePixels(out, Glowing(in, 0.5f)));
    }
}

}  // namespace
}  // namespace velmora::render
