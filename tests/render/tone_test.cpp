// Colour and tint: tables and mixing, against the rules restated in other arithmetic.

#include <gtest/gtest.h>

#include <bit>
#include <cmath>
#include <cstdlib>

#include "render/colour.h"
#include "render/tint.h"

namespace velmora::render {
namespace {

// Half away from zero of p / q, in whole numbers.
std::int64_t RoundRatio(std::int64_t p, std::int64_t q) {
    const std::int64_t magnitude = (2 * std::llabs(p) + q) / (2 * q);
    return p < 0 ? -magnitude : magnitude;
}

// Offsets whose products with a byte are exact in single precision, so that whole numbers can restate them.
TEST(BrightnessTable, MatchesWholeNumbers) {
    for (std::int64_t sixtyFourths = -64; sixtyFourths <= 64; ++sixtyFourths) {
        const ByteTable table = BrightnessTable(static_cast<float>(sixtyFourths) / 64.0f);
        for (std::int64_t i = 0; i < 256; ++i) {
            const std::int64_t distance = sixtyFourths > 0 ? 255 - i : i;
            ASSERT_EQ(table[static_cast<std::size_t>(i)], i + RoundRatio(distance * sixtyFourths, 64))
                << sixtyFourths << ' ' << i;
        }
    }
    EXPECT_EQ(BrightnessTable(0.5f)[0], 128);
    EXPECT_EQ(BrightnessTable(0.5f)[255], 255);
}

int CountOffLine(const ByteTable& table, const ToneLine& line) {
    int count = 0;
    for (int i = 0; i < 256; ++i) {
        const auto level = static_cast<std::uint8_t>(i);
        count += EntryOf(line, level) != table[level];
    }
    return count;
}

// No 16-bit numbers give some of the tables; that only costs time.
TEST(ToneLine, GivesNearlyAllTablesOfBrightnessAndContrast) {
    int tables = 0, missed = 0;
    const auto check = [&](const ByteTable& table, double slope) {
        const auto line = LineOf(table, slope);
        ++tables;
        missed += !line;
        if (line) {
            EXPECT_EQ(CountOffLine(table, *line), 0) << slope;
        }
    };
    for (int step = -500; step <= 500; ++step) {
        const float part = static_cast<float>(step) / 1000.0f;
        check(BrightnessTable(2 * part), 1.0 - std::abs(2.0 * part));
        check(ContrastTable(part), step < 0 ? 1.0 + part : 1.0 + 10.0 * part * part);
    }
    EXPECT_LT(missed, tables / 20);
}

TEST(ToneLine, IsNotMadeOfOtherTables) {
    ByteTable bent = BrightnessTable(0.25f);
    bent[100] = static_cast<std::uint8_t>(bent[100] + 2);
    EXPECT_FALSE(LineOf(bent, 0.75));
    EXPECT_FALSE(LineOf(BrightnessTable(0.25f), 0.5));
    EXPECT_FALSE(LineOf(ContrastTable(0.95f), 254.0));
}

TEST(ContrastTable, MatchesWholeNumbers) {
    // c' = -1/2: g = 1/2; c' = 1/2: g = 10/4 + 1 = 7/2. x = ((i/255 - 1/2) g + 1/2) 255.
    const ByteTable low = ContrastTable(-0.5f), high = ContrastTable(0.5f);
    EXPECT_EQ(low[0], 63);
    EXPECT_EQ(low[255], 191);
    for (std::int64_t i = 0; i < 256; ++i) {
        const std::int64_t lowQuarters = 2 * i - 255 + 510;            // 4 x
        const std::int64_t highQuarters = 14 * i - 7 * 255 + 2 * 255;  // 4 x
        ASSERT_EQ(low[static_cast<std::size_t>(i)], lowQuarters / 4) << i;
        ASSERT_EQ(high[static_cast<std::size_t>(i)], highQuarters < 0      ? 0
                                                     : highQuarters > 1020 ? 255
                                                                           : highQuarters / 4)
            << i;
    }
}

TEST(ContrastTable, FollowsTheGainLadder) {
    // The smallest input that reaches white shows the gain: 127.5 + 127.5 / g.
    struct Row {
        float contrast;
        double factor;
    };
    for (const Row& row : {Row{0.59f, 10},
                           {0.6f, 12},
                           {0.7f, 15},
                           {0.75f, 19},
                           {0.8f, 24},
                           {0.85f, 30},
                           {0.9f, 40},
                           {0.95f, 254},
                           {1.0f, 254}}) {
        const double gain = row.factor * row.contrast * row.contrast + 1.0;
        const ByteTable table = ContrastTable(row.contrast);
        const auto white = static_cast<std::size_t>(std::ceil(127.5 + 127.5 / gain));
        EXPECT_EQ(table[white], 255) << row.contrast;
        EXPECT_LT(table[white - 1], 255) << row.contrast;
    }
}

// The flicker computed directly: one draw after another from time 0.
float PlainFlicker(float saturation, float flicker, std::uint32_t rate, double draws) {
    std::uint64_t state = std::bit_cast<std::uint32_t>(saturation + flicker);
    const auto span = static_cast<std::uint64_t>(std::floor(static_cast<double>(flicker * 100.0f) + 0.5));
    double value = 0;
    for (double k = 0; k < (rate == 0 ? 1 : draws); ++k) {
        state = (state * 1103515245ull + 12345ull) % 4294967296ull;
        value = static_cast<double>(state / 65536 % 32768 * span / 32767) / 100.0;
        if (value > static_cast<double>(flicker)) value = static_cast<double>(flicker);
    }
    return static_cast<float>(value - 0.5 * static_cast<double>(flicker));
}

TEST(FlickerOffset, IsTheLastOfItsDraws) {
    struct Row {
        std::uint32_t rate;
        double seconds;
        double draws;
    };
    const Row rows[] = {{7, 1.0, 7},
                        {0, 100.0, 1},
                        {0, 0.0, 1},
                        {30, 0.0, 1},
                        {30, 0.1, 3},
                        {30, 0.1001, 4},
                        {7, 1.0001, 8},
                        {29, -5.0, 1},
                        {30, 36000.0, 1080000},
                        // Whole periods of the generator later.
                        {1, 0x1p55 + 8, 8},
                        {2, 0x1p70 + 0x1p20, 2097152}};
    for (const Row& row : rows) {
        for (const float flicker : {0.16f, 0.615f, 1.0f, 0.003f}) {
            EXPECT_EQ(
                FlickerOffset(static_cast<float>(0.25 + double{flicker}), flicker, row.rate, row.seconds),
                PlainFlicker(0.25f, flicker, row.rate, row.draws))
                << row.rate << ' ' << row.seconds << ' ' << flicker;
        }
    }
    // Ends in bounded time, with a value in its range.
    for (const double seconds : {1e300, -1e300, HUGE_VAL}) {
        EXPECT_LE(std::fabs(FlickerOffset(0, 1.0f, 30, seconds)), 0.5f);
    }
}

TEST(Colour, NeutralSettingsDoNothing) {
    ContrastCache cache;
    EXPECT_FALSE(PrepareColour({}, 0, cache).IsActive());
    StageSettings nearly;
    nearly.saturation = nearly.flicker = 0.000009f;
    nearly.brightness = nearly.contrast = -0.000019f;  // halved before the test for zero
    EXPECT_FALSE(PrepareColour(nearly, 0, cache).IsActive());
    nearly.contrast = 0.000021f;
    EXPECT_TRUE(PrepareColour(nearly, 0, cache).IsActive());
}

TEST(Colour, KeepsTheContrastTableOfTheLastValue) {
    ContrastCache cache;
    StageSettings settings;
    settings.contrast = 1.0f;
    const ByteTable first = PrepareColour(settings, 0, cache).Tone();
    EXPECT_EQ(first, ContrastTable(0.5f));
    settings.contrast = -1.0f;
    EXPECT_EQ(PrepareColour(settings, 0, cache).Tone(), ContrastTable(-0.5f));
    settings.contrast = 1.0f;
    settings.brightness = 1.0f;
    const ByteTable both = PrepareColour(settings, 0, cache).Tone();
    for (std::size_t i = 0; i < 256; ++i) EXPECT_EQ(both[i], first[BrightnessTable(0.5f)[i]]);
}

Bgra Mixed(float saturation, Bgra pixel) {
    ContrastCache cache;
    StageSettings settings;
    settings.saturation = saturation;
    const ColourStage stage = PrepareColour(settings, 0, cache);
    EXPECT_TRUE(stage.Mixes());
    return MixWithGrey(pixel, stage.Weight());
}

TEST(Colour, MixesWithTheGreyValue) {
    const Bgra red = Mixed(-1.0f, {0, 0, 255, 9});
    EXPECT_EQ(red.red, 74);
    EXPECT_EQ(red.green, 74);
    EXPECT_EQ(red.blue, 74);
    EXPECT_EQ(red.alpha, 9);
    for (const float saturation : {-3.0f, -1.0f, -0.5f, -0.004f, 0.004f, 0.3f, 1.0f}) {
        const auto w = static_cast<std::int64_t>(-static_cast<double>(saturation) * 127.0);
        for (std::int64_t blue = 0; blue < 256; blue += 15) {
            for (std::int64_t green = 0; green < 256; green += 17) {
                for (std::int64_t redIn = 0; redIn < 256; redIn += 51) {
                    const auto byte = [](std::int64_t v) { return static_cast<std::uint8_t>(v); };
                    const Bgra out = Mixed(saturation, {byte(blue), byte(green), byte(redIn), 200});
                    const std::int64_t luma = (76 * redIn + 149 * green + 30 * blue) / 256;
                    std::int64_t grey = luma * w % 65536;
                    grey = grey > 32767 ? grey - 65536 : grey < -32768 ? grey + 65536 : grey;
                    const auto channel = [&](std::int64_t v) {
                        const auto x = static_cast<std::int64_t>(
                            std::floor(static_cast<double>((127 - w) * v + grey) / 128.0));
                        return x < 0 ? 0 : x > 255 ? 255 : x;
                    };
                    ASSERT_EQ(out.blue, channel(blue)) << saturation;
                    ASSERT_EQ(out.green, channel(green)) << saturation;
                    ASSERT_EQ(out.red, channel(redIn)) << saturation;
                    ASSERT_EQ(out.alpha, 200);
                }
            }
        }
    }
}

TEST(TintOffset, RunsFromMinus128To128) {
    EXPECT_EQ(TintOffset(0.5f), 0);
    EXPECT_EQ(TintOffset(0.0f), -127);  // (0.25 x 510 + 0.5) is 128.0
    EXPECT_EQ(TintOffset(1.0f), 128);   // 383.0
    EXPECT_EQ(TintOffset(0.75f), 64);   // 319.25
    EXPECT_EQ(TintOffset(-2.0f), -255);
}

TEST(TintTable, LiftsOrCutsTheBlacks) {
    for (const std::int32_t offset : {1, 13, 64, 128, 255, 0, -1, -13, -64, -127}) {
        const ByteTable table = TintTable(offset);
        for (std::int32_t i = 0; i < 256; ++i) {
            // The exact line; the running single-precision sum stays within a hundredth of it.
            const double line = offset > 0     ? offset + i * (256 - offset) / 255.0
                                : i <= -offset ? 0.0
                                               : (i + offset) * 255.0 / (256 + offset);
            const double shifted = std::min(line + 0.5, 255.0);
            const int entry = table[static_cast<std::size_t>(i)];
            if (std::fabs(shifted - std::round(shifted)) > 0.01) {
                ASSERT_EQ(entry, static_cast<int>(shifted)) << offset << ' ' << i;
            } else {
                ASSERT_NEAR(entry, shifted - 0.5, 0.52) << offset << ' ' << i;
            }
        }
    }
    EXPECT_EQ(TintTable(0)[255], 254);
    EXPECT_EQ(TintTable(64)[0], 64);
    EXPECT_EQ(TintTable(64)[255], 255);
    EXPECT_EQ(TintTable(-64)[64], 0);
}

TEST(FilmGammaTable, BendsTowardAnS) {
    const ByteTable none = FilmGammaTable(0.0f);
    for (std::size_t i = 0; i < 256; ++i) ASSERT_EQ(none[i], i);
    for (const float gamma : {0.25f, 0.5f, 1.0f}) {
        const ByteTable table = FilmGammaTable(gamma);
        EXPECT_EQ(table[128], 128) << gamma;
        for (int i = 0; i < 256; ++i) {
            const long double x = i / 256.0L, pi = 3.14159265358979323846264338327950288L;
            const long double y = (gamma * (1 - std::cos(pi * x)) / 2 + (1 - gamma) * x) * 256;
            // Unless the exact curve is within rounding error of a whole number, the result must be its floor.
            if (std::fabs(y - std::round(y)) > 1e-4L) {
                ASSERT_EQ(table[static_cast<std::size_t>(i)], static_cast<int>(y)) << gamma << ' ' << i;
            }
        }
    }
}

TEST(Tint, ChainsGammaTintGamma) {
    StageSettings settings;
    EXPECT_FALSE(PrepareTint(settings).IsActive());
    settings.tintRed = 0.75f;
    const TintStage stage = PrepareTint(settings);
    EXPECT_EQ(stage.Red()[0], 64);
    EXPECT_EQ(stage.Green()[0], 0);

    settings.tintRed = 0.5f;
    settings.filmGamma = 0.5f;
    const TintStage gammaOnly = PrepareTint(settings);
    const ByteTable g = FilmGammaTable(0.5f);
    for (std::size_t i = 0; i < 256; ++i) {
        // After a gamma the neutral tint is i x 255 / 256, rounded.
        const std::size_t tinted = (2 * g[i] * 255 + 256) / 512;
        ASSERT_EQ(gammaOnly.Red()[i], g[tinted]) << i;
        ASSERT_EQ(gammaOnly.Blue()[i], g[tinted]) << i;
    }
}

}  // namespace
}  // namespace velmora::render
