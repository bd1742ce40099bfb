#include "text/number_text.h"

#include <gtest/gtest.h>

namespace velmora::hosts {
namespace {

TEST(NumberText, ReadsWholeTextsOnly) {
    EXPECT_EQ(ParseNumber("24.5"), 24.5);
    EXPECT_EQ(ParseNumber("-100"), -100.0);
    EXPECT_EQ(ParseHexWord("0xFFFFFFFF"), 0xFFFFFFFFu);
    for (const char* text : {"", "1,5", "4x", " 4", "nan", "inf", "--1"}) {
        EXPECT_FALSE(ParseNumber(text)) << text;
    }
    EXPECT_FALSE(ParseHexWord("100000000"));
}

TEST(NumberText, ReadsSizes) {
    const auto size = ParseSize("1920x1080");
    ASSERT_TRUE(size);
    EXPECT_EQ(size->width, 1920);
    EXPECT_EQ(size->height, 1080);
    for (const char* text : {"1920", "0x5", "5x0", "-4x4", "40000x4", "4x4x4"}) {
        EXPECT_FALSE(ParseSize(text)) << text;
    }
}

TEST(NumberText, ReadsRatesAndTheirUsualAbbreviations) {
    struct Row {
        const char* text;
        std::int32_t numerator, denominator;
    };
    for (const Row& row : {Row{"25", 25, 1}, Row{"29.97", 30000, 1001}, Row{"23.976", 24000, 1001},
                           Row{"30000/1001", 30000, 1001}, Row{"12.5", 12500, 1000}}) {
        const auto rate = ParseRate(row.text);
        ASSERT_TRUE(rate) << row.text;
        EXPECT_EQ(rate->numerator, row.numerator) << row.text;
        EXPECT_EQ(rate->denominator, row.denominator) << row.text;
    }
    for (const char* text : {"0", "-25", "25/0", "/", "a"}) EXPECT_FALSE(ParseRate(text)) << text;
}

TEST(NumberText, ReadsTimes) {
    EXPECT_EQ(ParseTime("1.5"), 1.5);
    EXPECT_EQ(ParseTime("1:30"), 90.0);
    EXPECT_EQ(ParseTime("01:00:02.25"), 3602.25);
    for (const char* text : {"", "-1", "1.5:00", "1:2:3:4", "1:", "1e300"}) EXPECT_FALSE(ParseTime(text)) << text;
}

}  // namespace
}  // namespace velmora::hosts
