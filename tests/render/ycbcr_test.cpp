#include "render/ycbcr.h"

#include <gtest/gtest.h>

#include <cstring>
#include <vector>

#include "render/kernels.h"

namespace velmora::render {
namespace {

using Bytes = std::vector<std::uint8_t>;

Bytes Decode(const Bytes& row, std::int32_t width) {
    Bytes rgb(static_cast<std::size_t>(width) * 3 + 1, 0xEE);
    EXPECT_EQ(YcbcrToRgb(row.data(), 0, rgb.data(), 0, width, 1), ImagingStatus::kDone);
    EXPECT_EQ(rgb.back(), 0xEE);
    rgb.pop_back();
    return rgb;
}

TEST(Ycbcr, DecodesBlackWhiteAndEveryTriple) {
    for (const auto& [luma, level] : {std::pair{16, 0}, {235, 255}}) {
        const auto y = static_cast<std::uint8_t>(luma);
        for (const std::uint8_t channel : Decode({y, 128, y, 128}, 2)) EXPECT_NEAR(channel, level, 1);
    }
    for (std::int64_t y = 0; y < 256; y += 5) {
        for (std::int64_t cb = 0; cb < 256; cb += 17) {
            for (std::int64_t cr = 0; cr < 256; cr += 15) {
                const auto channel = [](std::int64_t sum) {
                    // Integer floor division by 65536, for either sign.
                    const std::int64_t v = sum >= 0 ? sum / 65536 : -((-sum + 65535) / 65536);
                    return static_cast<std::uint8_t>(v < 0 ? 0 : v > 255 ? 255 : v);
                };
                const std::int64_t luma = 76284 * y;
                const Bytes expected = {channel(luma + 104595 * cr - 14608761),
                                        channel(luma - 25690 * cb - 53281 * cr + 8887730),
                                        channel(luma + 132186 * cb - 18140365)};
                const auto byte = [](std::int64_t v) { return static_cast<std::uint8_t>(v); };
                const Bytes rgb = Decode({byte(y), byte(cb), byte(255 - y), byte(cr)}, 2);
                ASSERT_EQ(Bytes(rgb.begin(), rgb.begin() + 3), expected) << y << ' ' << cb << ' ' << cr;
            }
        }
    }
}

TEST(Ycbcr, OddWidthsBorrowTheChromaOfTheGroupBefore) {
    const Bytes row = {50, 100, 60, 200, 70, 110, 0xFF, 0xFF};
    const Bytes rgb = Decode(row, 3);
    EXPECT_EQ(Bytes(rgb.begin() + 6, rgb.end()), Bytes(Decode({70, 110, 0, 200}, 1)));
    const Bytes alone = Decode({70, 110, 0, 90}, 1), pair = Decode({70, 110, 0, 90}, 2);
    EXPECT_EQ(alone, Bytes(pair.begin(), pair.begin() + 3)) << "a width of 1 has its own group only";
}

TEST(Ycbcr, EncodesPairsAndALonePixel) {
    const Bytes rgb = {255, 0, 0, 10, 200, 30, 1, 2, 3};
    Bytes packed(8, 0xEE);
    ASSERT_EQ(RgbToYcbcr(rgb.data(), 9, packed.data(), 8, 3, 1), ImagingStatus::kDone);
    const auto shift = [](std::int64_t v, int bits) {
        const std::int64_t unit = std::int64_t{1} << bits;
        return static_cast<std::uint8_t>((v % unit + unit) % unit == 0 ? v / unit
                                                                       : (v < 0 ? v / unit - 1 : v / unit));
    };
    const Bytes expected = {shift(16843 * 255 + 0x108000, 16),
                            shift(-9699 * 265 - 19071 * 200 + 28770 * 30 - 0xFF0000, 17),
                            shift(16843 * 10 + 33030 * 200 + 6423 * 30 + 0x100000, 16),
                            shift(28770 * 265 - 24117 * 200 - 4653 * 30 - 0xFF0000, 17),
                            shift(16843 * 1 + 33030 * 2 + 6423 * 3 + 0x108000, 16),
                            shift(-9699 * 1 - 19071 * 2 + 28770 * 3 - 0x7F8000, 16),
                            0xEE,
                            0xEE};
    EXPECT_EQ(packed, expected);
}

// The kernels' expected result: conversion of the rows through RGB.
std::vector<Bgra> DecodedByRgb(const Bytes& row, std::int32_t sourceWidth, std::int32_t width) {
    Bytes rgb(static_cast<std::size_t>(sourceWidth) * 3);
    YcbcrRowToRgb(row.data(), rgb.data(), sourceWidth);
    std::vector<Bgra> result;
    for (std::size_t x = 0; x < static_cast<std::size_t>(width); ++x) {
        result.push_back({rgb[3 * x + 2], rgb[3 * x + 1], rgb[3 * x], 77});
    }
    return result;
}

Bytes EncodedByRgb(const std::vector<Bgra>& row, std::size_t size) {
    Bytes rgb, result(size, 0xEE);
    for (const Bgra& p : row) rgb.insert(rgb.end(), {p.red, p.green, p.blue});
    RgbRowToYcbcr(rgb.data(), result.data(), static_cast<std::int32_t>(row.size()));
    return result;
}

bool AreEqual(const Bgra* a, const Bgra* b, std::size_t count) {
    return std::memcmp(a, b, count * sizeof(Bgra)) == 0;
}

std::vector<SimdLevel> Levels() {
    std::vector<SimdLevel> levels;
    for (const SimdLevel level : kSimdLevels) {
        if (level <= BestSimdLevel()) levels.push_back(level);
    }
    return levels;
}

TEST(YcbcrKernels, DecodeEveryTripleOnEveryLevel) {
    constexpr std::int32_t kWidth = 512;
    Bytes row(kWidth * 2);
    std::vector<Bgra> result(kWidth);
    for (int cb = 0; cb < 256; ++cb) {
        for (int cr = 0; cr < 256; ++cr) {
            for (std::size_t i = 0; i < row.size(); i += 4) {
                row[i] = static_cast<std::uint8_t>(i / 4), row[i + 1] = static_cast<std::uint8_t>(cb);
                row[i + 2] = static_cast<std::uint8_t>(i / 4 + 128),
                        row[i + 3] = static_cast<std::uint8_t>(cr);
            }
            const std::vector<Bgra> expected = DecodedByRgb(row, kWidth, kWidth);
            for (const SimdLevel level : Levels()) {
                KernelsOf(level).ycbcr->toBgra(row.data(), result.data(), kWidth, 77);
                ASSERT_TRUE(AreEqual(result.data(), expected.data(), kWidth))
                    << static_cast<int>(level) << ' ' << cb << ' ' << cr;
            }
        }
    }
}

TEST(YcbcrKernels, EncodeEveryTripleOnEveryLevel) {
    constexpr std::int32_t kWidth = 256;
    std::vector<Bgra> row(kWidth);
    Bytes result(kWidth * 2);
    for (int green = 0; green < 256; ++green) {
        for (int red = 0; red < 256; ++red) {
            for (std::size_t x = 0; x < row.size(); ++x) {
                // Left pixels with any blue in one half of the row, right ones in the other.
                const auto blue = static_cast<std::uint8_t>(2 * x + x / 128 % 2 + x % 2);
                row[x] = {blue, static_cast<std::uint8_t>(green), static_cast<std::uint8_t>(red),
                          static_cast<std::uint8_t>(x)};
            }
            const Bytes expected = EncodedByRgb(row, result.size());
            for (const SimdLevel level : Levels()) {
                KernelsOf(level).ycbcr->fromBgra(row.data(), result.data(), kWidth);
                ASSERT_EQ(result, expected) << static_cast<int>(level) << ' ' << green << ' ' << red;
            }
        }
    }
}

TEST(YcbcrKernels, FollowTheRowsByWayOfRgbAtAllWidths) {
    for (std::int32_t width = 1; width <= 20; ++width) {
        const auto count = static_cast<std::size_t>(width);
        Bytes row(44), result(row.size(), 0xEE);
        for (std::size_t i = 0; i < row.size(); ++i) row[i] = static_cast<std::uint8_t>(i * 37 + i * i);
        std::vector<Bgra> pixels(count);
        for (std::size_t i = 0; i < count; ++i) std::memcpy(&pixels[i], row.data() + i, sizeof(Bgra));
        kPlainYcbcr.fromBgra(pixels.data(), result.data(), width);
        ASSERT_EQ(result, EncodedByRgb(pixels, row.size())) << width;
        for (const std::int32_t sourceWidth : {width, width + 1}) {
            std::vector<Bgra> decoded(count + 1, Bgra{1, 2, 3, 4});
            YcbcrRowToBgra(kPlainYcbcr, row.data(), sourceWidth, decoded.data(), width, 77);
            const std::vector<Bgra> expected = DecodedByRgb(row, sourceWidth, width);
            ASSERT_TRUE(AreEqual(decoded.data(), expected.data(), count)) << width << ' ' << sourceWidth;
            ASSERT_EQ(decoded.back().alpha, 4);
        }
    }
}

TEST(Ycbcr, RefusesNothingAndNoSize) {
    Bytes a(12, 1), b(12, 2);
    EXPECT_EQ(YcbcrToRgb(nullptr, 0, b.data(), 0, 1, 1), ImagingStatus::kNullPointer);
    EXPECT_EQ(RgbToYcbcr(a.data(), 0, nullptr, 0, 1, 1), ImagingStatus::kNullPointer);
    EXPECT_EQ(YcbcrToRgb(a.data(), 0, b.data(), 0, 1, 0), ImagingStatus::kBadSize);
    EXPECT_EQ(RgbToYcbcr(a.data(), 0, b.data(), 0, 0, 1), ImagingStatus::kBadSize);
    EXPECT_EQ(b, Bytes(12, 2));
}

TEST(PackedImage, GrowsInEachDirection) {
    PackedImage image;
    EXPECT_FALSE(image.Reserve(0, 1, 3));
    EXPECT_FALSE(image.Reserve(1, 1, 5));
    ASSERT_TRUE(image.Reserve(10, 2, 3));
    ASSERT_TRUE(image.Reserve(4, 7, 3));
    EXPECT_GE(image.RowStep(), 30u);
    image.Row(6)[29] = 1;
    EXPECT_FALSE(image.Reserve(2147483647, 2147483647, 4));
}

}  // namespace
}  // namespace velmora::render
