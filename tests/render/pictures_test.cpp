#include "render/pictures.h"

#include <algorithm>
#include <cstdlib>
#include <vector>

#include <gtest/gtest.h>

namespace velmora::render {
namespace {

int At(const GreyPicture& picture, int x, int y) {
    return picture.pixels[y * picture.rowStep + x];
}

double MeanRowDifference(const GreyPicture& picture, int rowA, int rowB) {
    int sum = 0;
    for (int x = 0; x < picture.width; ++x) {
        sum += std::abs(At(picture, x, rowA) - At(picture, x, rowB));
    }
    return double(sum) / picture.width;
}

struct WearCase {
    int menuValue;
    int width;
    int height;
    // What the named look needs, in parts of 1: how bright on average, how much of the film is worn through.
    double leastMean, mostMean;
    double leastWorn, mostWorn;
};

constexpr WearCase kWearCases[] = {
    {2000, 50, 300, .06, .12, .06, .12},    // Wavy
    {2001, 50, 300, .07, .13, .02, .08},    // Blotchy: soft, so that little of it reaches half
    {2002, 50, 300, .03, .07, .03, .07},    // Grainy
    {2003, 50, 300, .02, .05, .02, .06},    // Fine
    {2004, 25, 150, .05, .11, .06, .12},    // Splotchy
    {2005, 64, 64, .003, .010, .001, .01},  // Lite
    {2006, 64, 64, .05, .11, .05, .11},     // Crackly
};

TEST(WearPictures, HaveTheirSizesAndBrightness) {
    for (const WearCase& wanted : kWearCases) {
        SCOPED_TRACE(wanted.menuValue);
        const GreyPicture& picture = WearPicture(wanted.menuValue);
        ASSERT_EQ(picture.width, wanted.width);
        ASSERT_EQ(picture.height, wanted.height);
        ASSERT_EQ(picture.rowStep, wanted.width);
        const double count = double(picture.width) * picture.height;
        double sum = 0, worn = 0, intact = 0;
        for (int y = 0; y < picture.height; ++y) {
            for (int x = 0; x < picture.width; ++x) {
                sum += At(picture, x, y) / 255.0;
                worn += At(picture, x, y) > 127;
                intact += At(picture, x, y) < 8;
            }
        }
        EXPECT_GE(sum / count, wanted.leastMean);
        EXPECT_LE(sum / count, wanted.mostMean);
        EXPECT_GE(worn / count, wanted.leastWorn);
        EXPECT_LE(worn / count, wanted.mostWorn);
        EXPECT_GE(intact / count, 0.6);  // else the frame would look fogged
    }
}

TEST(WearPictures, LastRowContinuesInTheFirst) {
    for (const WearCase& wanted : kWearCases) {
        SCOPED_TRACE(wanted.menuValue);
        const GreyPicture& picture = WearPicture(wanted.menuValue);
        std::vector<double> differences;
        for (int y = 1; y < picture.height; ++y) {
            differences.push_back(MeanRowDifference(picture, y - 1, y));
        }
        std::sort(differences.begin(), differences.end());
        EXPECT_LE(MeanRowDifference(picture, picture.height - 1, 0),
                  differences[differences.size() * 19 / 20]);
    }
}

TEST(WearPictures, UnknownValueGivesTheFirst) {
    for (int value : {0, -1, 1999, 2007, 2099}) {
        EXPECT_EQ(&WearPicture(value), &WearPicture(2000)) << value;
    }
}

struct SpotCase {
    int width;
    int height;
    int key;
};

constexpr SpotCase kSpotCases[kSpotCount] = {
    {9, 13, 93},  {9, 18, 93}, {11, 13, 102}, {9, 11, 94}, {8, 7, 103},   {5, 10, 110},
    {13, 14, 95}, {6, 9, 90},  {8, 12, 111},  {7, 8, 110}, {13, 11, 118},
};

TEST(SpotPictures, LieOnTheirKeyWithoutARectangle) {
    for (int index = 0; index < kSpotCount; ++index) {
        SCOPED_TRACE(index);
        const SpotCase& wanted = kSpotCases[index];
        const GreyPicture& spot = SpotPicture(index);
        ASSERT_EQ(spot.width, wanted.width);
        ASSERT_EQ(spot.height, wanted.height);
        ASSERT_EQ(spot.rowStep, wanted.width);
        ASSERT_EQ(spot.pixels[0], wanted.key);
        for (int y = 0; y < spot.height; ++y) {
            for (int x = 0; x < spot.width; ++x) {
                const bool onBorder = x == 0 || y == 0 || x == spot.width - 1 || y == spot.height - 1;
                if (onBorder) {
                    EXPECT_EQ(At(spot, x, y), wanted.key) << x << ", " << y;
                }
            }
        }
    }
}

// Dirt on the print is dark, dust that lay on the negative bright: mostly the first, but both are there.
TEST(SpotPictures, AreMostlyDirtAndSometimesClear) {
    int dark = 0, bright = 0;
    for (int index = 0; index < kSpotCount; ++index) {
        const GreyPicture& spot = SpotPicture(index);
        const auto [least, most] = std::minmax_element(spot.pixels, spot.pixels + spot.width * spot.height);
        dark += *least < spot.pixels[0] / 2;
        bright += *most > 200;
        EXPECT_TRUE(*least < spot.pixels[0] / 2 || *most > 200) << "spot " << index << " is hardly seen";
    }
    EXPECT_GT(dark, 2 * bright);
    EXPECT_GE(bright, 1);
}

}  // namespace
}  // namespace velmora::render
