// Wear and spots.

#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <vector>

#include "render/kernels.h"
#include "render/image.h"
#include "render/spots.h"
#include "render/wear.h"
#include "render/wear_factors.h"

namespace velmora::render {
namespace {

TEST(Shade, MatchesWholeNumbersOnExactFractions) {
    for (int sixtyFourths = -64; sixtyFourths <= 64; ++sixtyFourths) {
        for (int c = 0; c < 256; ++c) {
            const int distance = sixtyFourths > 0 ? 255 - c : c;
            const int magnitude = (2 * distance * std::abs(sixtyFourths) + 64) / 128;
            const int expected = c + (sixtyFourths < 0 ? -magnitude : magnitude);
            ASSERT_EQ(ShadeChannel(static_cast<std::uint8_t>(c), static_cast<float>(sixtyFourths) / 64.0f),
                      expected)
                << sixtyFourths << ' ' << c;
        }
    }
}

// A row of wear restated: strip by strip, each with its own start row, wrapping at the picture's end.
TEST(Wear, TilesInStripsWithARandomStartEach) {
    WearFactors factors;
    for (const std::int32_t pattern : {2000, 2004, 2006, 2099}) {
        for (const std::int32_t width : {1, 50, 120, 133}) {
            StageSettings settings;
            settings.wear = 0.7f;
            settings.wearPattern = pattern;
            Random random(5), plain(5);
            const WearStage stage = PrepareWear(settings, width, random, factors, kPlainKernels);
            const GreyPicture& picture = WearPicture(pattern == 2099 ? 2000 : pattern);
            plain.Next();  // unused orientation
            std::vector<std::int64_t> starts;
            for (std::int32_t x = 0; x < width; x += picture.width) {
                starts.push_back(std::int64_t{plain.Next()} * (picture.height - 3) / 32767);
            }
            EXPECT_EQ(random.State(), plain.State());
            std::vector<Bgra> in(static_cast<std::size_t>(width)), out(in);
            for (std::int32_t y : {0, 1, 149, 299, 300, 1234}) {
                for (std::size_t x = 0; x < in.size(); ++x) {
                    in[x] = {static_cast<std::uint8_t>(x), static_cast<std::uint8_t>(y), 100, 50};
                }
                stage.Row(in.data(), out.data(), width, y);
                for (std::size_t x = 0; x < in.size(); ++x) {
                    const auto strip = x / static_cast<std::size_t>(picture.width);
                    const auto column =
                        static_cast<std::int64_t>(x % static_cast<std::size_t>(picture.width));
                    const std::int64_t row = (starts[strip] + y) % picture.height;
                    const float b = static_cast<float>(picture.pixels[row * picture.width + column] / 255.0);
                    const float a = b * 0.7f;
                    const auto lighter = [a](int c) {
                        const float product = a * static_cast<float>(255 - c);
                        return c + static_cast<int>(static_cast<double>(product) + 0.5);
                    };
                    ASSERT_EQ(out[x].blue, lighter(in[x].blue));
                    ASSERT_EQ(out[x].green, lighter(in[x].green));
                    ASSERT_EQ(out[x].red, lighter(in[x].red));
                    ASSERT_EQ(out[x].alpha, 50);
                }
            }
        }
    }
}

TEST(WearFactors, TakeThePicturesThatThereAreAndRefuseTooLargeOnes) {
    WearFactors factors;
    for (std::int32_t value = 2000; value < 2000 + kWearPictureCount; ++value) {
        EXPECT_LE(WearPicture(value).width, kWidestWear);
        EXPECT_TRUE(factors.Set(WearPicture(value), 0.5f)) << value;
    }
    const GreyPicture tooLarge = {WearFactors::kMostPixels + 1, 1, WearFactors::kMostPixels + 1, nullptr};
    EXPECT_FALSE(factors.Set(tooLarge, 0.5f));
    const GreyPicture tooNarrow = {WearStrips::kPadding - 1, 9, WearStrips::kPadding - 1, nullptr};
    EXPECT_FALSE(factors.Set(tooNarrow, 0.5f));
}

TEST(Wear, ZeroDrawsOnceAndDoesNothing) {
    WearFactors factors;
    Random random(5);
    EXPECT_FALSE(PrepareWear({}, 500, random, factors, kPlainKernels).IsActive());
    Random plain(5);
    plain.Next();
    EXPECT_EQ(random.State(), plain.State());
}

TEST(Wear, BlueOnlyLeavesTheOtherChannels) {
    WearFactors factors;
    StageSettings settings;
    settings.wear = 1.0f;
    settings.wearChannels = kWearBlueOnly;
    Random random(1);
    const WearStage stage = PrepareWear(settings, 200, random, factors, kPlainKernels);
    std::vector<Bgra> row(200, Bgra{10, 20, 30, 40});
    bool changed = false;
    for (std::int32_t y = 0; y < 100; ++y) {
        stage.Row(row.data(), row.data(), 200, y);
        for (const Bgra& pixel : row) {
            ASSERT_EQ(pixel.green, 20);
            ASSERT_EQ(pixel.red, 30);
            ASSERT_EQ(pixel.alpha, 40);
            changed = changed || pixel.blue != 10;
        }
    }
    EXPECT_TRUE(changed);
}

TEST(SpotCount, IsAQuarterOfTheLevelButNeverNone) {
    struct Row {
        float spots;
        std::uint32_t count;
    };
    for (const Row& row :
         {Row{0, 0}, {0.4f, 0}, {0.5f, 1}, {1, 1}, {3, 1}, {7.4f, 1}, {7.5f, 2}, {100, 25}}) {
        StageSettings settings;
        settings.spots = row.spots;
        EXPECT_EQ(SpotCount(settings), row.count) << row.spots;
        Random random(3), plain(3);
        EXPECT_EQ(PrepareSpots(settings, {0, 100, 0, 100}, random).Count(), row.count);
        plain.Skip(6 * row.count);
        EXPECT_EQ(random.State(), plain.State());
    }
}

TEST(SpotFraction, IsZeroAtTheKeyAndFullAtTheEnds) {
    EXPECT_EQ(SpotFraction(93, 93, 1.0f), 0.0f);
    EXPECT_EQ(SpotFraction(0, 93, 1.0f), -1.0f);
    EXPECT_EQ(SpotFraction(255, 93, 0.5f), 0.5f);
    EXPECT_EQ(SpotFraction(31, 93, 0.75f), -0.5f);
}

TEST(PlacedSpot, WalksThePictureInSixWays) {
    const std::uint8_t bytes[] = {1, 2, 3, 4, 5, 6};  // 3 wide, 2 high
    const GreyPicture picture = {3, 2, 3, bytes};
    struct Row {
        SpotOrientation orientation;
        std::int32_t height, width;
        std::vector<int> expected;
    };
    const Row rows[] = {
        {SpotOrientation::kAsStored, 2, 3, {1, 2, 3, 4, 5, 6}},
        {SpotOrientation::kMirroredLeftRight, 2, 3, {3, 2, 1, 6, 5, 4}},
        {SpotOrientation::kMirroredTopBottom, 2, 3, {4, 5, 6, 1, 2, 3}},
        {SpotOrientation::kHalfTurn, 2, 3, {6, 5, 4, 3, 2, 1}},
        {SpotOrientation::kQuarterClockwise, 3, 2, {4, 1, 5, 2, 6, 3}},
        {SpotOrientation::kQuarterCounterClockwise, 3, 2, {3, 6, 2, 5, 1, 4}},
    };
    for (const Row& row : rows) {
        const PlacedSpot spot = {&picture, row.orientation, 1.0f, 0, 0, row.height, row.width};
        std::vector<int> walked;
        for (int y = 0; y < row.height; ++y) {
            for (int x = 0; x < row.width; ++x) walked.push_back(spot.ByteAt(y, x));
        }
        EXPECT_EQ(walked, row.expected) << static_cast<int>(row.orientation);
    }
}

// The draws of a spot, restated in order, for a region that does not start at the buffer's corner.
TEST(Spots, ArePlacedByTheirDraws) {
    StageSettings settings;
    settings.spots = 41.5f;  // level 42: 10 spots, strength 5..84
    const Rectangle region = {20, 70, 30, 90};
    Random random(8), plain(8);
    const SpotStage stage = PrepareSpots(settings, region, random);
    ASSERT_EQ(stage.Count(), 10u);
    const auto draw = [&plain](std::int64_t low, std::int64_t high) {
        return std::int64_t{plain.Next()} * (high - low) / 32767 + low;
    };
    for (std::uint32_t i = 0; i < 10; ++i) {
        const PlacedSpot& spot = stage.Spot(i);
        const GreyPicture& picture = SpotPicture(static_cast<std::int32_t>(draw(0, 10)));
        const std::int64_t code = draw(0, 5);
        const float strength = static_cast<float>(static_cast<double>(draw(5, 84)) / 100.0);
        draw(5, 42);
        const std::int64_t h = picture.height, w = picture.width;
        const std::int64_t y = draw(20 + 1 - (h - h / 2), 70 + 1 - h / 2);
        const std::int64_t x = draw(30 + 1 - (w - w / 2), 90 + 1 - w / 2);
        const bool turned = code == 3 || code == 5;
        EXPECT_EQ(spot.picture->pixels, picture.pixels);
        EXPECT_EQ(static_cast<std::int64_t>(spot.orientation), code);
        EXPECT_EQ(spot.strength, strength);
        EXPECT_EQ(spot.top, y - (turned ? w : h) / 2 - 20);
        EXPECT_EQ(spot.left, x - (turned ? h : w) / 2 - 30);
    }
    EXPECT_EQ(random.State(), plain.State());
}

TEST(Spots, AreClippedAndShadePixelByPixel) {
    StageSettings settings;
    settings.spots = 100;
    for (const std::int32_t width : {1, 5, 40}) {
        Random random(11);
        const SpotStage stage = PrepareSpots(settings, {0, 12, 0, width}, random);
        for (std::int32_t y = 0; y < 12; ++y) {
            std::vector<Bgra> row(static_cast<std::size_t>(width) + 2, Bgra{90, 120, 200, 33});
            stage.Row(row.data() + 1, row.data() + 1, width, y);
            EXPECT_EQ(row.front().red, 200);
            EXPECT_EQ(row.back().red, 200);
            for (std::int32_t x = 0; x < width; ++x) {
                Bgra expected = {90, 120, 200, 33};
                for (std::uint32_t i = 0; i < stage.Count(); ++i) {
                    const PlacedSpot& spot = stage.Spot(i);
                    const std::int32_t v = y - spot.top, u = x - spot.left;
                    if (v < 0 || u < 0 || v >= spot.height || u >= spot.width) continue;
                    const std::uint8_t key = spot.picture->pixels[0];
                    expected = ShadePixel(expected, SpotFraction(spot.ByteAt(v, u), key, spot.strength));
                }
                const Bgra& pixel = row[static_cast<std::size_t>(x) + 1];
                ASSERT_EQ(std::memcmp(&pixel, &expected, 4), 0) << width << ' ' << x << ' ' << y;
            }
        }
    }
}

}  // namespace
}  // namespace velmora::render
