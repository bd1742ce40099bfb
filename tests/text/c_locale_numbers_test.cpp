#include "text/number_text.h"

#include <gtest/gtest.h>

#include <climits>
#include <cmath>
#include <cstdio>
#include <limits>

namespace velmora {
namespace {

constexpr double kInfinite = std::numeric_limits<double>::infinity();
constexpr double kNone = -12345;  // no number

TEST(NumberText, ReadsIntegersAsScanfDoes) {
    struct Case {
        const char* text;
        int expected;
    };
    constexpr int kNoInteger = -12345;
    const Case cases[] = {
        {"0", 0},
        {"-7", -7},
        {"+7", 7},
        {" \t\n\v\f\r 12", 12},
        {"12abc", 12},
        {"2.9", 2},
        {"0x2", 0},
        {"007", 7},
        {"2147483647", INT_MAX},
        {"-2147483648", INT_MIN},
        {"99999999999", INT_MAX},
        {"-99999999999", INT_MIN},
        {"", kNoInteger},
        {"abc", kNoInteger},
        {"-", kNoInteger},
        {"+-1", kNoInteger},
        {"--1", kNoInteger},
        {"- 1", kNoInteger},
        {".5", kNoInteger},
    };
    for (const Case& c : cases) {
        int value = kNoInteger;
        EXPECT_EQ(ParseInteger(c.text, &value), c.expected != kNoInteger) << c.text;
        EXPECT_EQ(value, c.expected) << c.text;
    }
}

TEST(NumberText, ReadsNumbersAsScanfDoes) {
    struct Case {
        const char* text;
        double expected;
    };
    const std::string zeros(400, '0');
    const std::string tiny = "0." + zeros + "1e5", whole = "1" + zeros, balanced = "0." + zeros + "1e401";
    const Case cases[] = {
        {"0.5", 0.5},
        {"-0.5", -0.5},
        {"+.5", 0.5},
        {"5.", 5},
        {" \n1e-1x", 0.1},
        {"1E2", 100},
        {"0,5", 0},
        {"0.1.2", 0.1},
        {"1e400", kInfinite},
        {"-1e400", -kInfinite},
        {"1e-400", 0},
        {"-1e-400", 0},
        {"1e99999999999999999999", kInfinite},
        {"1e-99999999999999999999", 0},
        {"0e999999", 0},
        {tiny.c_str(), 0},
        {whole.c_str(), kInfinite},
        {balanced.c_str(), 1},
        {"inf", kInfinite},
        {"-Infinity", -kInfinite},
        {"0x1.8p1", 3},
        {"-0x10", -16},
        {"0xg", 0},
        {"0x-1", 0},
        {"0x", 0},
        {"", kNone},
        {"x", kNone},
        {".", kNone},
        {"-", kNone},
        {"--1", kNone},
        {"+-1", kNone},
        {"e5", kNone},
    };
    for (const Case& c : cases) {
        double value = kNone;
        EXPECT_EQ(ParseNumber(c.text, &value), c.expected != kNone) << c.text;
        EXPECT_EQ(value, c.expected) << c.text;
    }
    double value = 0;
    EXPECT_TRUE(ParseNumber("nan", &value));
    EXPECT_TRUE(std::isnan(value));
}

// The C library formats in the "C" locale here, and outside Windows it rounds exactly.
#ifndef _WIN32
TEST(NumberText, FormatsAsPrintfDoes) {
    for (const double value : {0.0, -0.0, 0.1, 0.25, 1.0, 1e-7, 5e-7, 0.0000005, 2.5e-6, 123456.7890125, 1e38,
                               double{0.1f}, double{std::numeric_limits<float>::max()}, -kInfinite}) {
        char expected[400];
        std::snprintf(expected, sizeof expected, "%f", value);
        EXPECT_EQ(FormatNumber(value), expected);
    }
}
#endif

}  // namespace
}  // namespace velmora
