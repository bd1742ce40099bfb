#include "hosts/reelhost/bench.h"

#include <cstdio>

#include "bench/bench_cases.h"
#include "bench/frame_pool.h"
#include "hosts/common/effect_info.h"
#include "hosts/reelhost/effect_run.h"

namespace velmora::hosts {
namespace {

using bench::FramePool;
using bench::PairedTimes;

EffectRun RunOf(const EffectLibrary& library, const bench::BenchCase& test) {
    EffectRun run(library, test.effect);
    run.ApplyPreset(FindPreset(run.Info(), "Reset To None"));
    for (const bench::CaseValue& value : test.values) {
        ValueWord word = {};
        if (run.Info().params[value.parameter].kind == kKindSlider) {
            word.number = static_cast<float>(value.value);
        } else {
            word.bits = static_cast<std::uint32_t>(value.value);
        }
        run.Set({value.parameter, word});
    }
    return run;
}

PairedTimes Measure(EffectRun& run, FramePool& pool, double startSeconds) {
    constexpr int kFrames = 80;
    PairedTimes times;
    for (int i = 0; i < kFrames; ++i) {
        RunPair(pool, times, [&] {
            run.Render(pool.Record(pool.Source()), pool.Record(pool.Destination()), startSeconds + i / 30.0);
        });
    }
    return times;
}

void PrintRow(const char* name, const PairedTimes& times, double goal) {
    std::printf("| %s | %.2f | %.2f | %.1f |\n", name, 1000 * times.Work(), times.Ratio(), goal);
    std::fflush(stdout);
}

}  // namespace

void PrintBench(const EffectLibrary& library) {
    std::printf("| case | ms | x memcpy | goal |\n|---|---|---|---|\n");
    FramePool pool(bench::kFullHd);
    for (const bench::BenchCase& test : bench::BenchCases()) {
        EffectRun run = RunOf(library, test);
        PrintRow(test.name, Measure(run, pool, 1.0), test.goalDll);
    }
}

}  // namespace velmora::hosts
