// Every form of a row kernel gives the plain form's bytes.

#include "render/kernels.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <functional>
#include <random>
#include <vector>

#include "render/shade.h"
#include "render/wear.h"

namespace velmora::render {
namespace {

constexpr std::int32_t kWidest = 70;
constexpr std::size_t kGuard = 80;  // bytes before and behind a row

std::vector<Form> FasterForms() {
    std::vector<Form> forms;
    for (const Form form : {Form::kSse2, Form::kAvx2, Form::kAvx512}) {
        if (form <= BestForm()) forms.push_back(form);
    }
    return forms;
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
void ExpectEqualForms(const Run& run, bool mayBeInPlace) {
    std::mt19937 numbers(1);
    std::vector<std::uint8_t> before(2 * kGuard + kWidest * sizeof(Bgra) + 64), source(before);
    for (std::uint8_t& byte : source) byte = static_cast<std::uint8_t>(numbers());
    for (std::uint8_t& byte : before) byte = static_cast<std::uint8_t>(numbers());
    for (const Form form : FasterForms()) {
        for (std::int32_t width = 0; width <= kWidest; ++width) {
            for (const std::size_t offset : {0u, 1u, 4u, 7u, 16u, 20u, 32u, 60u}) {
                const auto at = [offset](std::vector<std::uint8_t>& bytes) {
                    return reinterpret_cast<Bgra*>(bytes.data() + kGuard + offset);
                };
                std::vector<std::uint8_t> expected = before, apart = before, inPlace = source, alone = source;
                run(kPlainKernels, at(source), at(expected), width);
                run(KernelsOf(form), at(source), at(apart), width);
                ASSERT_EQ(apart, expected) << static_cast<int>(form) << ' ' << width << ' ' << offset;
                if (!mayBeInPlace) continue;
                run(kPlainKernels, at(alone), at(alone), width);
                run(KernelsOf(form), at(inPlace), at(inPlace), width);
                ASSERT_EQ(inPlace, alone) << static_cast<int>(form) << ' ' << width << ' ' << offset;
            }
        }
    }
}

TEST(RowKernels, TonesAreEqualInAllForms) {
    std::mt19937 numbers(4);
    const ChannelTables before = AnyTables(numbers), after = AnyTables(numbers);
    for (const Tone& tone : {Tone{&before, true, 40, &after}, Tone{nullptr, true, -127, &after},
                             Tone{&before, true, 127, nullptr}, Tone{&before, false, 0, nullptr},
                             Tone{nullptr, false, 0, &after}, Tone{nullptr, true, 5, nullptr},
                             Tone{nullptr, true, -126, nullptr}, Tone{nullptr, true, -1, nullptr},
                             Tone{nullptr, true, 0, nullptr}}) {
        ExpectEqualForms([&](const RowKernels& kernels, const Bgra* in, Bgra* out,
                             std::int32_t width) { kernels.tone(in, out, width, tone); },
                         true);
    }
}

TEST(RowKernels, WearIsEqualInAllForms) {
    std::mt19937 numbers(3);
    std::vector<float> fractions(kWidest);
    // Runs without wear, as pictures have them.
    for (float& f : fractions) f = numbers() % 3 == 0 ? static_cast<float>(numbers() % 1000) / 999.0f : 0.0f;
    std::fill(fractions.begin() + 20, fractions.begin() + 48, 0.0f);
    for (const std::uint32_t channels : {kColourChannels, kBlueChannel}) {
        ExpectEqualForms(
            [&](const RowKernels& kernels, const Bgra* in, Bgra* out, std::int32_t width) {
                kernels.wear(in, out, width, fractions.data(), channels);
            },
            true);
    }
}

TEST(RowKernels, WearInStripsIsEqualInAllForms) {
    std::mt19937 numbers(5);
    std::vector<float> fractions(kWidest + 2 * kWidestWear);
    for (float& f : fractions) f = static_cast<float>(numbers() % 1000) / 999.0f;
    for (const std::int32_t stripWidth : {16, 25, 50, 64}) {
        std::vector<const float*> strips;
        for (std::int32_t x = 0; x < kWidest; x += stripWidth)
            strips.push_back(fractions.data() + numbers() % kWidest);
        ExpectEqualForms(
            [&](const RowKernels& kernels, const Bgra* in, Bgra* out, std::int32_t width) {
                kernels.wearStrips(in, out, width, strips.data(), stripWidth, kColourChannels);
            },
            true);
    }
}

TEST(RowKernels, CopiesAreEqualInAllForms) {
    ExpectEqualForms([](const RowKernels& kernels, const Bgra* in, Bgra* out,
                        std::int32_t width) { kernels.copy(in, out, width); },
                     true);
    ExpectEqualForms(
        [](const RowKernels& kernels, const Bgra* in, Bgra* out, std::int32_t width) {
            kernels.stream(in, out, width);
            kernels.endStream();
        },
        false);
}

// Each pixel of a row holds one wear byte's fraction and, in its channels, one level in three orders.
TEST(RowKernels, WearRoundsEveryProductAsShadingDoes) {
    constexpr std::int32_t kLevels = 256;
    constexpr int kAmounts = 499;
    std::vector<Bgra> row(kLevels), expected(kLevels), result(kLevels);
    std::vector<float> fractions(kLevels);
    for (int step = 0; step <= kAmounts; ++step) {
        const float amount = static_cast<float>(step) / static_cast<float>(kAmounts);
        for (int byte = 0; byte < kLevels; ++byte) {
            const float fraction = WearFraction(static_cast<std::uint8_t>(byte), amount);
            std::fill(fractions.begin(), fractions.end(), fraction);
            for (std::size_t c = 0; c < row.size(); ++c) {
                const auto level = static_cast<std::uint8_t>(c);
                row[c] = {level, static_cast<std::uint8_t>(level + 85),
                          static_cast<std::uint8_t>(level + 170), level};
            }
            std::uint8_t shaded[kLevels];
            for (int c = 0; c < kLevels; ++c)
                shaded[c] = ShadeChannel(static_cast<std::uint8_t>(c), fraction);
            for (std::size_t c = 0; c < row.size(); ++c) {
                expected[c] = {shaded[row[c].blue], shaded[row[c].green], shaded[row[c].red], row[c].alpha};
            }
            for (const Form form : FasterForms()) {
                KernelsOf(form).wear(row.data(), result.data(), kLevels, fractions.data(), kColourChannels);
                ASSERT_EQ(std::memcmp(result.data(), expected.data(), sizeof(Bgra) * row.size()), 0)
                    << static_cast<int>(form) << ' ' << byte << ' ' << amount;
            }
        }
    }
}

}  // namespace
}  // namespace velmora::render
