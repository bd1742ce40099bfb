#include "programs/common/y4m.h"

#include <gtest/gtest.h>

#include <vector>

#include "text/number_text.h"

namespace velmora::hosts {
namespace {

TEST(Y4m, ReadsHeaders) {
    const Y4mFormat format = ParseY4mHeader("YUV4MPEG2 W5 H3 F30000:1001 Ip A1:1 C420jpeg XCOLORRANGE=FULL");
    EXPECT_EQ(format.size.width, 5);
    EXPECT_EQ(format.size.height, 3);
    EXPECT_EQ(format.rate.denominator, 1001);
    EXPECT_TRUE(format.isFullRange);
    EXPECT_EQ(format.FrameBytes(), 15u + 2 * 3 * 2);  // odd sizes round the chroma up
    for (const char* line :
         {"YUV4MPEG W4 H4", "YUV4MPEG2 W4", "YUV4MPEG2 W4 H4 C420p10", "YUV4MPEG2 W0 H4"}) {
        EXPECT_THROW(ParseY4mHeader(line), UsageError) << line;
    }
}

// The code values of a saturated colour, as tabulated in the video literature.
TEST(Y4m, KnowsTheColourBars) {
    constexpr Y4mMatrix kBt601 = Y4mMatrix::kBt601, kBt709 = Y4mMatrix::kBt709;
    struct Row {
        Y4mMatrix matrix;
        std::uint8_t blue, green, red, y, cb, cr;
    };
    const Row rows[] = {
        {kBt601, 255, 255, 255, 235, 128, 128}, {kBt601, 0, 0, 0, 16, 128, 128},
        {kBt601, 0, 0, 255, 81, 90, 240},       {kBt601, 0, 255, 0, 145, 54, 34},
        {kBt601, 255, 0, 0, 41, 240, 110},      {kBt709, 255, 255, 255, 235, 128, 128},
        {kBt709, 0, 0, 0, 16, 128, 128},        {kBt709, 0, 0, 255, 63, 102, 240},
        {kBt709, 0, 255, 0, 173, 42, 26},       {kBt709, 255, 0, 0, 32, 240, 118},
    };
    Y4mFormat format = ParseY4mHeader("YUV4MPEG2 W1 H1 F25:1 C444");
    for (const Row& row : rows) {
        format.matrix = row.matrix;
        const std::uint8_t pixel[4] = {row.blue, row.green, row.red, 7};
        std::uint8_t planes[3] = {};
        BgraToY4m(format, pixel, planes);
        EXPECT_EQ(planes[0], row.y);
        EXPECT_EQ(planes[1], row.cb);
        EXPECT_EQ(planes[2], row.cr);
        std::uint8_t back[4] = {};
        Y4mToBgra(format, planes, back);
        EXPECT_NEAR(back[0], row.blue, 2);
        EXPECT_NEAR(back[1], row.green, 2);
        EXPECT_NEAR(back[2], row.red, 2);
        EXPECT_EQ(back[3], 255);
    }
}

TEST(Y4m, GuessesTheMatrixAsPlayersDo) {
    EXPECT_EQ(ParseY4mHeader("YUV4MPEG2 W720 H576").matrix, Y4mMatrix::kBt601);
    EXPECT_EQ(ParseY4mHeader("YUV4MPEG2 W720 H577").matrix, Y4mMatrix::kBt709);
    EXPECT_EQ(ParseY4mHeader("YUV4MPEG2 W1280 H16").matrix, Y4mMatrix::kBt709);
    EXPECT_EQ(ParseY4mMatrix("bt709"), Y4mMatrix::kBt709);
    EXPECT_EQ(ParseY4mMatrix("BT2020"), std::nullopt);
}

TEST(Y4m, UntouchedFramesReturnButForRounding) {
    for (const char* chroma : {"C420jpeg", "C422", "C444", "Cmono"}) {
        const Y4mFormat format = ParseY4mHeader(std::string("YUV4MPEG2 W7 H5 F25:1 ") + chroma);
        std::vector<std::uint8_t> planes(format.FrameBytes()), back(planes.size());
        // Muted colours: all of them exist in RGB.
        for (std::size_t i = 0; i < planes.size(); ++i) {
            planes[i] = static_cast<std::uint8_t>(i < 35 ? 80 + i * 3 : 120 + i % 16);
        }
        std::vector<std::uint8_t> bgra(7 * 5 * 4);
        Y4mToBgra(format, planes.data(), bgra.data());
        BgraToY4m(format, bgra.data(), back.data());
        for (std::size_t i = 0; i < planes.size(); ++i) EXPECT_NEAR(planes[i], back[i], 1) << chroma << i;
    }
}

}  // namespace
}  // namespace velmora::hosts
