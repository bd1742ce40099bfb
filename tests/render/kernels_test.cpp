// Every kernel of every SIMD level gives the plain kernel's bytes: for all widths up to a few vectors and all
// alignments, with random and extreme numbers, and with guard bytes around what may be written.

#include "render/kernels.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cstring>
#include <functional>
#include <limits>
#include <memory>
#include <random>
#include <vector>

#include "render/glow_kernels.h"
#include "render/scratch_span.h"
#include "render/image.h"
#include "render/wear_factors.h"
#include "render/ycbcr.h"

namespace velmora::render {
namespace {

constexpr std::int32_t kWidest = 140;
constexpr std::size_t kGuard = 80;  // bytes before and after a row

using Bytes = std::vector<std::uint8_t>;

std::vector<SimdLevel> FasterLevels() {
    std::vector<SimdLevel> levels;
    for (const SimdLevel level : kSimdLevels) {
        if (level != SimdLevel::kPlain && level <= BestSimdLevel()) levels.push_back(level);
    }
    return levels;
}

// Random bytes, black, white, and alternating black and white.
std::vector<Bytes> Inputs(std::size_t size) {
    std::mt19937 numbers(1);
    std::vector<Bytes> inputs(4, Bytes(size));
    for (std::uint8_t& byte : inputs[0]) byte = static_cast<std::uint8_t>(numbers());
    std::fill(inputs[2].begin(), inputs[2].end(), std::uint8_t{255});
    for (std::size_t i = 0; i < size; ++i) inputs[3][i] = numbers() % 2 == 0 ? 0 : 255;
    return inputs;
}

template <typename In, typename Out>
using Run = std::function<void(const Kernels&, const In*, Out*, std::int32_t width)>;

// From a row at some alignment into another one that is filled with guard bytes first. The input's allocation ends with
// its last pixel, so that the address sanitizer catches reads beyond it.
template <typename In, typename Out>
void ExpectEqualRows(const Run<In, Out>& run, std::size_t inBytes, std::size_t outBytes) {
    for (std::int32_t width = 0; width <= kWidest; ++width) {
        const std::size_t count = static_cast<std::size_t>(width);
        for (const std::size_t offset : {0u, 1u, 4u, 7u, 16u, 20u, 32u, 60u}) {
            for (const Bytes& source : Inputs(std::max<std::size_t>(offset + count * inBytes, 1))) {
                const auto result = [&](const Kernels& kernels) {
                    Bytes row(2 * kGuard + 64 + count * outBytes, 0xA5);
                    run(kernels, reinterpret_cast<const In*>(source.data() + offset),
                        reinterpret_cast<Out*>(row.data() + kGuard + offset), width);
                    return row;
                };
                const Bytes expected = result(kPlainKernels);
                for (const SimdLevel level : FasterLevels()) {
                    ASSERT_EQ(result(KernelsOf(level)), expected)
                        << static_cast<int>(level) << ' ' << width << ' ' << offset;
                }
            }
        }
    }
}

void ExpectEqualPixels(const Run<Bgra, Bgra>& run) {
    ExpectEqualRows<Bgra, Bgra>(run, sizeof(Bgra), sizeof(Bgra));
    // In place as well.
    ExpectEqualRows<Bgra, Bgra>(
        [&run](const Kernels& kernels, const Bgra* in, Bgra* out, std::int32_t width) {
            std::copy(in, in + width, out);
            run(kernels, out, out, width);
        },
        sizeof(Bgra), sizeof(Bgra));
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

// Tables with some rises of `steepest` in 16 entries and falls, in all others, of up to 15 against their index.
ChannelTables SmoothTables(std::mt19937& numbers, std::size_t steepest) {
    ByteTable tables[3];
    for (ByteTable& table : tables) {
        for (std::size_t i = 0; i < table.size(); ++i) {
            const std::size_t entry = i < 16 ? i * steepest / 15 : i + numbers() % 16;
            table[i] = static_cast<std::uint8_t>(std::min<std::size_t>(entry, 255));
        }
    }
    ChannelTables result;
    result.Set(tables[0], tables[1], tables[2]);
    return result;
}

// Tones of all kinds, with the tables that they point to.
class SomeTones {
  public:
    SomeTones() {
        std::mt19937 numbers(4);
        before = AnyTables(numbers);
        after = AnyTables(numbers);
        gentle = SmoothTables(numbers, 30);
        steep = SmoothTables(numbers, 45);
        tones = {{&before, true, 40, &after},  {nullptr, true, -127, &after}, {&before, true, 127, nullptr},
                 {&before, false, 0, nullptr}, {nullptr, false, 0, &after},   {nullptr, true, -1, nullptr},
                 {nullptr, true, 0, nullptr},  {nullptr, true, -60, &gentle}, {nullptr, false, 0, &gentle},
                 {nullptr, false, 0, &steep}};
        for (std::size_t i = 0; i < lines.size(); ++i) {
            ByteTable table;
            for (std::size_t entry = 0; entry < table.size(); ++entry) {
                table[entry] = static_cast<std::uint8_t>(entry);
                for (const ToneLine& line : lines[i]) table[entry] = EntryOf(line, table[entry]);
            }
            tables[i].Set(table, table, table);
            tones.push_back({&tables[i], i != 0, i % 2 == 0 ? 40 : -40, i != 0 ? &after : nullptr, lines[i]});
            tones.push_back({&tables[i], false, 0, nullptr, lines[i]});
        }
    }
    SomeTones(const SomeTones&) = delete;
    SomeTones& operator=(const SomeTones&) = delete;

    ChannelTables before, after, gentle, steep;
    std::vector<Tone> tones;

  private:
    // Kinds of lines that kernels compute, and one that they do not. `tables` are what they make.
    static constexpr ToneLine kUp = {200 << 8, 3000, 0, 8}, kCut = {60000, 0, 9000, 6},
                              kSharp = {53248, 0, 10200, 7}, kOther = {60000, 2000, 0, 6};
    const std::array<std::vector<ToneLine>, 7> lines = {
        {{kUp}, {kCut}, {kUp, kCut}, {kSharp}, {kUp, kSharp}, {kOther}, {kCut, kUp}}};
    std::array<ChannelTables, 7> tables;
};

TEST(Kernels, ToneIsThePlainOneOnEveryLevel) {
    const auto some = std::make_unique<SomeTones>();
    EXPECT_EQ(some->after.shuffles, ShuffleTable::Kind::kAny);
    EXPECT_EQ(some->gentle.shuffles, ShuffleTable::Kind::kGentle);
    EXPECT_EQ(some->steep.shuffles, ShuffleTable::Kind::kSteep);
    for (const Tone& tone : some->tones) {
        ExpectEqualPixels([&](const Kernels& kernels, const Bgra* in, Bgra* out, std::int32_t width) {
            kernels.tone(in, out, width, tone);
        });
    }
}

TEST(Kernels, WearIsThePlainOneOnEveryLevel) {
    constexpr std::int32_t kHeight = 9;
    std::mt19937 numbers(3);
    for (const std::int32_t stripWidth : {16, 25, 50, 64}) {
        std::vector<WearFactor> factors(static_cast<std::size_t>(kHeight * stripWidth) +
                                        2 * WearStrips::kPadding);
        std::vector<std::uint16_t> starts(kWidest / 16 + 2);
        for (std::uint16_t& start : starts) start = static_cast<std::uint16_t>(numbers() % kHeight);
        for (WearFactor& f : factors) {
            f = {static_cast<std::uint16_t>(numbers()), static_cast<std::uint16_t>(numbers() % 256)};
        }
        for (const std::uint32_t channels : {kColourChannels, kBlueChannel}) {
            const WearStrips strips(starts.data(), 5, factors.data() + WearStrips::kPadding,
                                    {stripWidth, kHeight});
            ExpectEqualPixels([&](const Kernels& kernels, const Bgra* in, Bgra* out, std::int32_t width) {
                kernels.wear(in, out, width, strips, channels);
            });
        }
    }
}

TEST(Kernels, CopiesArePlainOnesOnEveryLevel) {
    ExpectEqualPixels([](const Kernels& kernels, const Bgra* in, Bgra* out, std::int32_t width) {
        kernels.copy(in, out, width);
    });
    ExpectEqualRows<Bgra, Bgra>(
        [](const Kernels& kernels, const Bgra* in, Bgra* out, std::int32_t width) {
            kernels.stream(in, out, width);
            kernels.endStream();
        },
        sizeof(Bgra), sizeof(Bgra));
}

TEST(Kernels, ConversionsArePlainOnesOnEveryLevel) {
    ExpectEqualRows<std::uint8_t, Bgra>([](const Kernels& kernels, const std::uint8_t* in, Bgra* out,
                                           std::int32_t width) { kernels.ycbcr->toBgra(in, out, width, 77); },
                                        sizeof(Bgra), sizeof(Bgra));
    ExpectEqualRows<Bgra, std::uint8_t>([](const Kernels& kernels, const Bgra* in, std::uint8_t* out,
                                           std::int32_t width) { kernels.ycbcr->fromBgra(in, out, width); },
                                        sizeof(Bgra), sizeof(Bgra));
}

TEST(Kernels, ScratchesArePlainOnesOnEveryLevel) {
    ScratchTexture texture;
    std::mt19937 numbers(9);
    const auto below = [&numbers](std::int32_t end) {
        return static_cast<std::int32_t>(numbers() % static_cast<std::uint32_t>(end));
    };
    for (std::size_t row = 0; row < texture.values.size(); ++row) {
        texture.values[row] = row < ScratchTexture::kRows ? static_cast<std::int16_t>(below(45057) - 22528)
                                                          : texture.values[row - ScratchTexture::kRows];
    }
    for (int round = 0; round < 300; ++round) {
        std::vector<ScratchLine> lines(4);
        for (ScratchLine& line : lines) {
            line.isWhite = below(2) == 0;
            line.shapes = &ScratchShapesOf(line.isWhite, below(kScratchProfiles), below(kScratchSections));
            line.pixels = line.shapes->pixels;
            line.pixel = below(kWidest + 20) - 15;
            line.strength = below(4) == 0 ? 65535 : static_cast<std::uint32_t>(below(65536));
            line.roughness = below(65535);
            line.absentLevel = -below(20000);
            line.texture = below(ScratchTexture::kRows);
            line.rows = &texture;
            line.shake = below(300);
            for (ScratchLine::Knot& knot : line.knots) knot = {below(20000) - 10000, below(135537) - 65536};
        }
        ScratchRows rows = {below(1080), static_cast<std::size_t>(below(64)), ScratchRows::kMost};
        for (std::int32_t& part : rows.parts) part = below(4096);
        const auto which = static_cast<std::size_t>(below(ScratchRows::kMost));
        const std::int32_t width = 1 + below(kWidest);
        for (const Bytes& source : Inputs(static_cast<std::size_t>(width) * sizeof(Bgra))) {
            const auto drawn = [&](const Kernels& kernels) {
                Bytes row = source;
                std::array<ScratchSpans, 4> spans{};
                kernels.scratches->find(lines.data(), 4, rows, spans.data());
                kernels.scratches->draw(lines.data(), spans.data(), 4, which,
                                        reinterpret_cast<Bgra*>(row.data()), width);
                return row;
            };
            for (const SimdLevel level : FasterLevels()) {
                ASSERT_EQ(drawn(KernelsOf(level)), drawn(kPlainKernels)) << static_cast<int>(level);
            }
        }
    }
}

// A row of cells with its padding, which may be read but must not matter; memory after it must stay unchanged.
class CellsOf {
  public:
    enum class Fill { kRandom, kBlack, kWhite, kEither };

    CellsOf(std::int32_t count, Fill fill, std::uint32_t seed) {
        std::mt19937 numbers(seed);
        m_lanes.resize(static_cast<std::size_t>(count + 2 * kCellPad) * kCellLanes);
        for (std::size_t i = 0; i < m_lanes.size(); ++i) {
            const std::uint32_t any = static_cast<std::uint32_t>(numbers());
            const std::uint32_t value = fill == Fill::kRandom  ? any % (kCellWhite + 1)
                                        : fill == Fill::kBlack ? 0
                                        : fill == Fill::kWhite ? kCellWhite
                                                               : any % 2 * kCellWhite;
            m_lanes[i] = i % kCellLanes == 3 ? std::uint16_t{0} : static_cast<std::uint16_t>(value);
        }
    }
    CellRow Row() { return m_lanes.data() + kCellPad * kCellLanes; }
    // Everything except the padding after the row.
    std::vector<std::uint16_t> Written() const {
        return {m_lanes.begin(), m_lanes.end() - kCellPad * kCellLanes};
    }

  private:
    std::vector<std::uint16_t> m_lanes;
};

// `run` may read `in`, rows of twice `count` cells, and writes `out`, which is just as long.
using RunCells =
    std::function<void(const GlowKernels&, std::vector<CellsOf>& in, CellRow out, std::int32_t count)>;

void ExpectEqualCells(const RunCells& run, std::int32_t cellsWritten) {
    using Fill = CellsOf::Fill;
    for (std::int32_t count = 1; count <= 21; ++count) {
        for (const Fill fill : {Fill::kRandom, Fill::kBlack, Fill::kWhite, Fill::kEither}) {
            const auto result = [&](const Kernels& kernels) {
                std::vector<CellsOf> in;
                for (std::uint32_t i = 0; i < 9; ++i) in.emplace_back(2 * count, fill, i);
                CellsOf out(count * cellsWritten, fill, 99);
                run(*kernels.glow, in, out.Row(), count);
                return out.Written();
            };
            const auto expected = result(kPlainKernels);
            for (const SimdLevel level : FasterLevels()) {
                ASSERT_EQ(result(KernelsOf(level)), expected) << static_cast<int>(level) << ' ' << count;
            }
        }
    }
}

TEST(Kernels, GlowsCellsArePlainOnesOnEveryLevel) {
    using Rows = std::vector<CellsOf>;
    ExpectEqualCells(
        [](const GlowKernels& k, Rows&, CellRow out, std::int32_t n) { k.keepHighlights(out, n); }, 1);
    for (const GlowTaps& taps :
         {GlowTaps{2, 20000, {15000, 7768}}, GlowTaps{2, 65535, {}},
          GlowTaps{4, 12000, {10000, 8000, 5000, 3768}}, GlowTaps{4, 0, {0, 0, 0, 32768}}}) {
        ExpectEqualCells(
            [&](const GlowKernels& k, Rows& in, CellRow out, std::int32_t n) {
                const ConstCellRow before[] = {in[1].Row(), in[2].Row(), in[3].Row(), in[4].Row()};
                const ConstCellRow after[] = {in[5].Row(), in[6].Row(), in[7].Row(), in[8].Row()};
                k.filter(in[0].Row(), before, after, out, n, taps);
            },
            1);
    }
    ExpectEqualCells(
        [](const GlowKernels& k, Rows& in, CellRow out, std::int32_t n) {
            const ConstCellRow rows[] = {in[0].Row(), in[1].Row(), in[2].Row(), in[3].Row()};
            k.halveRows(rows, out, n);
        },
        1);
    ExpectEqualCells([](const GlowKernels& k, Rows& in, CellRow out,
                        std::int32_t n) { k.halveAlong(in[0].Row(), out, n); },
                     1);
    ExpectEqualCells([](const GlowKernels& k, Rows& in, CellRow out,
                        std::int32_t n) { k.between(in[0].Row(), in[1].Row(), out, n); },
                     1);
    ExpectEqualCells([](const GlowKernels& k, Rows& in, CellRow out,
                        std::int32_t n) { k.doubleAlong(in[0].Row(), out, n); },
                     2);
    for (const std::uint16_t share : std::initializer_list<std::uint16_t>{0, 13107, 32767, 65535}) {
        ExpectEqualCells(
            [&](const GlowKernels& k, Rows& in, CellRow out, std::int32_t n) {
                k.mix(out, in[0].Row(), n, share, static_cast<std::uint16_t>(65535 - share));
                k.lift(out, n, share);
            },
            1);
        ExpectEqualCells(
            [&](const GlowKernels& k, Rows& in, CellRow out, std::int32_t n) {
                k.approach(in[0].Row(), in[1].Row(), out, n, static_cast<std::int16_t>(share / 2));
            },
            1);
    }
}

TEST(Kernels, GlowsPixelsArePlainOnesOnEveryLevel) {
    for (const auto fill : {CellsOf::Fill::kRandom, CellsOf::Fill::kBlack, CellsOf::Fill::kWhite}) {
        for (const std::uint16_t dither : std::initializer_list<std::uint16_t>{0, 40000, 65535}) {
            ExpectEqualPixels([&](const Kernels& kernels, const Bgra* in, Bgra* out, std::int32_t width) {
                CellsOf layer(width, fill, dither), quarter((width + 3) / 4, fill, dither);
                kernels.glow->screen(in, out, layer.Row(), width, dither);
                kernels.glow->screenFourfold(out, out, quarter.Row(), width, dither);
            });
        }
    }
    ExpectEqualRows<Bgra, std::uint16_t>(
        [](const Kernels& kernels, const Bgra* in, std::uint16_t* out, std::int32_t width) {
            std::vector<std::uint16_t> cells(static_cast<std::size_t>(width / 16) * kCellLanes);
            const std::int32_t quarter = width / 16 * 4;
            const Bgra* const rows[] = {in, in + quarter, in + 2 * quarter, in + 3 * quarter};
            kernels.glow->averageBlocks(rows, cells.data(), width / 16);
            if (!cells.empty()) std::memcpy(out, cells.data(), cells.size() * sizeof(std::uint16_t));
        },
        sizeof(Bgra), sizeof(Bgra));
}

// The layer between two rows of cells, screened in steps or, where the level can, in one with the tone.
void ToneUnderGlow(const Kernels& kernels, const Bgra* in, Bgra* out, std::int32_t width, const Tone& tone,
                   CellsOf::Fill fill) {
    constexpr std::int16_t kShare = 12288;
    constexpr std::uint16_t kDither = 40000;
    const std::int32_t cells = (width + 3) / 4;
    CellsOf near(cells, fill, 1), far(cells, fill, 2), over(cells, fill, 3);
    if (width == 0) return;
    std::uint16_t* const row = over.Row();
    std::uint16_t* const last = row + (cells - 1) * kCellLanes;
    if (kernels.glowedTone == nullptr) {
        kernels.glow->approach(near.Row(), far.Row(), row, cells, kShare);
        std::copy_n(row, kCellLanes, row - kCellLanes);
        std::copy_n(last, kCellLanes, last + kCellLanes);
        kernels.glow->screenFourfold(in, out, row, width, kDither);
        return kernels.tone(out, out, width, tone);
    }
    std::vector<std::uint16_t> planes[3];
    for (auto& plane : planes)
        plane.resize(static_cast<std::size_t>(cells) + 1 + std::size_t{kPlanesRead}, 0xFFFF);
    std::uint16_t* const first[3] = {planes[0].data() + 1, planes[1].data() + 1, planes[2].data() + 1};
    kernels.glowedTone->split(near.Row(), far.Row(), first, cells, kShare);
    for (std::uint16_t* plane : first) {
        plane[-1] = plane[0];
        plane[cells] = plane[cells - 1];
    }
    kernels.glowedTone->tone(in, out, width, tone, {first[0], first[1], first[2], kDither});
}

TEST(Kernels, ToneUnderGlowIsOneAfterTheOther) {
    const auto some = std::make_unique<SomeTones>();
    const auto fills = {CellsOf::Fill::kRandom, CellsOf::Fill::kWhite, CellsOf::Fill::kEither};
    for (std::size_t i = 0; i < some->tones.size(); ++i) {
        const CellsOf::Fill fill = fills.begin()[i % fills.size()];
        ExpectEqualPixels([&](const Kernels& kernels, const Bgra* in, Bgra* out, std::int32_t width) {
            ToneUnderGlow(kernels, in, out, width, some->tones[i], fill);
        });
    }
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
