// Values, times, and what a frame may depend on.

#include <chrono>
#include <cmath>
#include <limits>
#include <vector>

#include "programs/reelcheck/checks.h"
#include "programs/reelcheck/library.h"
#include "programs/reelcheck/playing_host.h"

namespace velmora::reelcheck {
namespace {

using Limits = std::numeric_limits<float>;

constexpr Layout kSmall{61, 47};

// One effect rendering one small picture.
struct Bench {
    Reference<IVideoEffect> effect;
    EffectFacts facts;
    PlayingHost host;
    Frame source, destination;

    Bench(const OpenLibrary& library, std::uint32_t index, Dice& dice)
        : effect(library.Effect(index)),
          facts(EffectFacts::Of(*effect)),
          source(kSmall),
          destination(kSmall) {
        source.Paint(dice);
        source.ForbidWriting();
        SetPlace("%s", facts.name.c_str());
    }

    std::uint64_t DigestAt(double seconds) {
        RenderInside(*effect, host, source, destination, seconds);
        return destination.Digest();
    }
};

template <typename Visit>
void ForEachBench(CheckContext& context, Visit&& check) {
    const OpenLibrary library(context.libraryPath);
    for (std::uint32_t index = 0; index < kEffectCount; ++index) {
        Bench bench(library, index, context.dice);
        check(bench);
    }
}

}  // namespace

void CheckClamping(CheckContext& context) {
    struct Row {
        float given, counts;
    };
    static constexpr Row kRows[] = {
        {1.5f, 1.0f},
        {1e30f, 1.0f},
        {Limits::max(), 1.0f},
        {Limits::infinity(), 1.0f},
        {-0.5f, 0.0f},
        {Limits::lowest(), 0.0f},
        {-Limits::infinity(), 0.0f},
        {Limits::quiet_NaN(), 0.0f},
        {-0.0f, 0.0f},
    };
    ForEachBench(context, [&](Bench& bench) {
        for (std::size_t i = 0; i < bench.facts.params.size(); ++i) {
            if (bench.facts.params[i].kind != kKindSlider) continue;
            for (const Row& row : kRows) {
                SetPlace("%s, %s at %g", bench.facts.name.c_str(), ParamName(bench.facts.params[i]).c_str(),
                         double{row.given});
                ChooseFull(bench.host, bench.facts);
                bench.host.values[i].number = row.counts;
                const std::uint64_t expected = bench.DigestAt(2.0);
                bench.host.values[i].number = row.given;
                Require(bench.DigestAt(2.0) == expected, "does not count as the end of its range");
            }
        }
    });
}

void CheckTimes(CheckContext& context) {
    static const double kTimes[] = {0.0,
                                    -0.0,
                                    -1.0,
                                    -1e9,
                                    -1e300,
                                    1e-300,
                                    1e6,
                                    71582788.0,  // the frame number reaches its maximum
                                    71582789.0,
                                    1e18,
                                    1e300,
                                    std::numeric_limits<double>::max(),
                                    std::numeric_limits<double>::denorm_min(),
                                    std::numeric_limits<double>::infinity(),
                                    -std::numeric_limits<double>::infinity(),
                                    std::numeric_limits<double>::quiet_NaN()};
    constexpr double kLongestFrame = 5.0;  // seconds: far more than a small frame takes on any machine
    ForEachBench(context, [&](Bench& bench) {
        ChooseFull(bench.host, bench.facts);
        for (const double time : kTimes) {
            SetPlace("%s at %g s", bench.facts.name.c_str(), time);
            const auto start = std::chrono::steady_clock::now();
            const std::uint64_t digest = bench.DigestAt(time);
            const std::chrono::duration<double> took = std::chrono::steady_clock::now() - start;
            Require(took.count() < kLongestFrame, "takes too long");
            Require(bench.DigestAt(time) == digest, "repeated at once, another picture");
        }
        SetPlace("%s", bench.facts.name.c_str());
        const std::uint64_t atZero = bench.DigestAt(0.0);
        Require(bench.DigestAt(std::numeric_limits<double>::quiet_NaN()) == atZero,
                "NaN does not count as time 0");
    });
}

void CheckMenus(CheckContext& context) {
    ForEachBench(context, [&](Bench& bench) {
        for (std::size_t i = 0; i < bench.facts.params.size(); ++i) {
            if (bench.facts.params[i].kind != kKindMenu) continue;
            const auto count = static_cast<std::int32_t>(bench.facts.params[i].minimum.count);
            ChooseFull(bench.host, bench.facts);
            for (std::int32_t item = 0; item < count; ++item) {
                bench.host.values[i].item = item;
                const std::uint64_t digest = bench.DigestAt(1.0);
                for (const std::int32_t beyond :
                     {-1, count, count + 1, 10, 1000, 2000, 0x7FFFFFFF, -0x7FFFFFFF - 1}) {
                    SetPlace("%s, item %d after %d", bench.facts.name.c_str(), beyond, item);
                    bench.host.values[i].item = beyond;
                    Require(bench.DigestAt(1.0) == digest, "an item that does not exist changes the choice");
                }
            }
        }
    });
}

void CheckHostileValues(CheckContext& context) {
    ForEachBench(context, [&](Bench& bench) {
        for (int i = 0; i < context.Rounds(150, 8000); ++i) {
            SetPlace("%s, round %d", bench.facts.name.c_str(), i);
            ChooseHostile(bench.host, bench.facts, context.dice);
            bench.host.answers = !context.dice.OneIn(20);
            // Sometimes a time of any magnitude.
            const double time = context.dice.OneIn(3)
                                    ? std::ldexp(context.dice.Unit(), context.dice.Between(-900, 900))
                                    : context.dice.Between(-1000, 1000) / 30.0;
            const std::uint64_t digest = bench.DigestAt(time);
            Require(bench.DigestAt(time) == digest, "repeated at once, another picture");
        }
    });
}

// Renders with other effects, sizes and values in between. Frames with the same number all start from the same random
// state, so none of this may show.
void CheckAlternating(CheckContext& context) {
    const OpenLibrary library(context.libraryPath);
    std::vector<std::unique_ptr<Bench>> benches;
    for (std::uint32_t i = 0; i < 2 * kEffectCount; ++i) {
        benches.push_back(std::make_unique<Bench>(library, i % kEffectCount, context.dice));
    }
    for (int round = 0; round < context.Rounds(6, 200); ++round) {
        const double time = round / 2.0;
        std::vector<std::uint64_t> digests;
        for (const auto& bench : benches) {
            ChooseFair(bench->host, bench->facts, context.dice);
            digests.push_back(bench->DigestAt(time));
        }
        const Layout other{context.dice.Between(1, 200), context.dice.Between(1, 100)};
        Frame source(other), destination(other);
        for (std::size_t i = benches.size(); i-- > 0;) {
            Bench& bench = *benches[i];
            RenderInside(*bench.effect, bench.host, source, destination, time);
            SetPlace("%s, round %d", bench.facts.name.c_str(), round);
            Require(bench.DigestAt(time) == digests[i], "another effect's frames affect the picture");
        }
    }
}

void CheckReplay(CheckContext& context) {
    ForEachBench(context, [&](Bench& bench) {
        ChooseFull(bench.host, bench.facts);
        for (int frame = 0; frame < context.Rounds(30, 500); ++frame) {
            SetPlace("%s, frame %d", bench.facts.name.c_str(), frame);
            const std::uint64_t digest = bench.DigestAt(frame / 30.0);
            Require(bench.DigestAt(frame / 30.0) == digest, "repeated at once, another picture");
        }
    });
}

}  // namespace velmora::reelcheck
