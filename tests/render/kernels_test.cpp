// Every form of a row kernel gives the plain form's bytes.

#include "render/kernels.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <functional>
#include <limits>
#include <random>
#include <vector>

#include "render/shade.h"
#include "render/wear_factors.h"

namespace velmora::render {
namespace {

constexpr std::int32_t kWidest = 140;
constexpr std::size_t kGuard = 80;  // bytes before and behind a row

std::vector<SimdLevel> FasterLevels() {
    std::vector<SimdLevel> levels;
    for (const SimdLevel level : {SimdLevel::kSse2, SimdLevel::kAvx2, SimdLevel::kAvx512}) {
        if (level <= BestSimdLevel()) levels.push_back(level);
    }
    return levels;
}

ChannelTables AnyTables(std::mt19937& numbers) {
    ByteTable tables[3];
    for (ByteTable& table : tables) {
        for (std::uint8_t& entry : table) entry = static_cast<std::uint8_t>(numbers());
    }
    ChannelTables result;
    result.Set(tables[0], tables[1], tables[2]);
    return result;
}

using Run = std::function<void(const RowKernels&, const Bgra* in, Bgra* out, std::int32_t width)>;

// Rows of all widths at all addresses, apart and, where it may be, in place; bytes around the row must stay.
void ExpectEqualLevels(const Run& run, bool mayBeInPlace) {
    std::mt19937 numbers(1);
    std::vector<std::uint8_t> before(2 * kGuard + kWidest * sizeof(Bgra) + 64), source(before);
    for (std::uint8_t& byte : source) byte = static_cast<std::uint8_t>(numbers());
    for (std::uint8_t& byte : before) byte = static_cast<std::uint8_t>(numbers());
    for (const SimdLevel level : FasterLevels()) {
        for (std::int32_t width = 0; width <= kWidest; ++width) {
            for (const std::size_t offset : {0u, 1u, 4u, 7u, 16u, 20u, 32u, 60u}) {
                const auto at = [offset](std::vector<std::uint8_t>& bytes) {
                    return reinterpret_cast<Bgra*>(bytes.data() + kGuard + offset);
                };
                std::vector<std::uint8_t> expected = before, apart = before, inPlace = source, alone = source;
                run(kPlainKernels, at(source), at(expected), width);
                run(KernelsOf(level), at(source), at(apart), width);
                ASSERT_EQ(apart, expected) << static_cast<int>(level) << ' ' << width << ' ' << offset;
                if (!mayBeInPlace) continue;
                run(kPlainKernels, at(alone), at(alone), width);
                run(KernelsOf(level), at(inPlace), at(inPlace), width);
                ASSERT_EQ(inPlace, alone) << static_cast<int>(level) << ' ' << width << ' ' << offset;
            }
        }
    }
}

TEST(RowKernels, TonesAreEqualOnAllLevels) {
    std::mt19937 numbers(4);
    const ChannelTables before = AnyTables(numbers), after = AnyTables(numbers);
    for (const Tone& tone : {Tone{&before, true, 40, &after}, Tone{nullptr, true, -127, &after},
                             Tone{&before, true, 127, nullptr}, Tone{&before, false, 0, nullptr},
                             Tone{nullptr, false, 0, &after}, Tone{nullptr, true, 5, nullptr},
                             Tone{nullptr, true, -126, nullptr}, Tone{nullptr, true, -1, nullptr},
                             Tone{nullptr, true, 0, nullptr}}) {
        ExpectEqualLevels([&](const RowKernels& kernels, const Bgra* in, Bgra* out,
                              std::int32_t width) { kernels.tone(in, out, width, tone); },
                          true);
    }
}

TEST(RowKernels, LinesAreEqualToTheirTableOnAllLevels) {
    const ToneLine up = {200 << 8, 3000, 0, 8}, cut = {60000, 0, 9000, 6};
    std::mt19937 numbers(6);
    const ChannelTables after = AnyTables(numbers);
    for (const std::vector<ToneLine>& lines : {std::vector{up}, std::vector{cut}, std::vector{up, cut}}) {
        ByteTable table;
        for (std::size_t i = 0; i < table.size(); ++i) {
            table[i] = static_cast<std::uint8_t>(i);
            for (const ToneLine& line : lines) table[i] = EntryOf(line, table[i]);
        }
        ChannelTables before;
        before.Set(table, table, table);
        for (Tone tone : {Tone{&before, true, 40, &after}, Tone{&before, false, 0, nullptr}}) {
            tone.lines = lines;
            ExpectEqualLevels([&](const RowKernels& kernels, const Bgra* in, Bgra* out,
                                  std::int32_t width) { kernels.tone(in, out, width, tone); },
                              true);
        }
    }
}

TEST(RowKernels, WearIsEqualOnAllLevels) {
    constexpr std::int32_t kHeight = 9;
    std::mt19937 numbers(3);
    std::vector<WearFactor> factors(kHeight * kWidestWear + 2 * WearStrips::kRoom);
    for (WearFactor& f : factors) {
        f = {static_cast<std::uint16_t>(numbers()), static_cast<std::uint16_t>(numbers() % 256)};
    }
    for (const std::int32_t stripWidth : {16, 25, 50, 64}) {
        for (const std::uint32_t channels : {kColourChannels, kBlueChannel}) {
            const WearStrips strips(WearRows(Random(7), kHeight, 5), factors.data() + WearStrips::kRoom,
                                    stripWidth);
            ExpectEqualLevels([&](const RowKernels& kernels, const Bgra* in, Bgra* out,
                                  std::int32_t width) { kernels.wear(in, out, width, strips, channels); },
                              true);
        }
    }
}

TEST(RowKernels, CopiesAreEqualOnAllLevels) {
    ExpectEqualLevels([](const RowKernels& kernels, const Bgra* in, Bgra* out,
                         std::int32_t width) { kernels.copy(in, out, width); },
                      true);
    ExpectEqualLevels(
        [](const RowKernels& kernels, const Bgra* in, Bgra* out, std::int32_t width) {
            kernels.stream(in, out, width);
            kernels.endStream();
        },
        false);
}

TEST(WearFactor, AddsWhatShadingDoes) {
    constexpr int kAmounts = 499;
    int bytes = 0, odd = 0;
    for (int step = 0; step <= kAmounts; ++step) {
        const float amount = static_cast<float>(step) / static_cast<float>(kAmounts);
        for (int byte = 0; byte < 256; ++byte, ++bytes) {
            const float fraction = WearFraction(static_cast<std::uint8_t>(byte), amount);
            const auto factor = WearFactorOf(fraction);
            odd += !factor;
            for (int channel = 0; factor && channel < 256; ++channel) {
                const std::uint32_t added =
                    ((static_cast<std::uint32_t>(255 - channel) * 256 * factor->times >> 16) +
                     factor->plus) >>
                    8;
                ASSERT_EQ(static_cast<std::uint32_t>(channel) + added,
                          ShadeChannel(static_cast<std::uint8_t>(channel), fraction))
                    << byte << ' ' << amount;
            }
        }
    }
    EXPECT_LT(odd, bytes / 1000);
    for (const float beyond : {-0.1f, 1.5f, std::numeric_limits<float>::quiet_NaN()}) {
        EXPECT_FALSE(WearFactorOf(beyond)) << beyond;
    }
}

}  // namespace
}  // namespace velmora::render
