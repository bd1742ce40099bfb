#include "programs/reelhost/measurements.h"

#include <cstdio>
#include <stdexcept>
#include <string>

#include "programs/common/bench_cases.h"
#include "programs/common/frame_pool.h"
#include "programs/common/effect_info.h"
#include "programs/common/effect_run.h"

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

PairedTimes MeasureJumps(EffectRun& run, FramePool& pool) {
    constexpr int kJumps = 30;
    PairedTimes times;
    for (int i = 0; i < kJumps; ++i) {
        RunJump(pool, times, [&](double seconds) {
            run.Render(pool.Record(pool.Source()), pool.Record(pool.Destination()), seconds);
        });
    }
    return times;
}

// The 4:2:2 frame uses the first half of its buffer.
PairedTimes MeasureConversion(IFrameProcessor& processor, FramePool& pool, bool toBgra) {
    constexpr int kFrames = 120;
    PairedTimes times;
    for (int i = 0; i < kFrames; ++i) {
        RunPair(pool, times, [&] {
            FrameRecord source = pool.Record(pool.Source()), destination = pool.Record(pool.Destination());
            (toBgra ? source : destination).rowStep /= 2;
            const bool done = toBgra ? processor.ConvertYcbcrToBgra(&source, &destination, 255)
                                     : processor.ConvertBgraToYcbcr(&source, &destination, 0);
            if (!done) throw std::runtime_error("the frame processor refuses a frame");
        });
    }
    return times;
}

void PrintRow(const std::string& name, const PairedTimes& times, const std::string& goal) {
    std::printf("| %s | %.2f | %.2f | %s |\n", name.c_str(), 1000 * times.Work(), times.Ratio(),
                goal.c_str());
    std::fflush(stdout);
}

std::string GoalText(double goal) {
    return std::to_string(goal).substr(0, 3);
}

}  // namespace

void PrintBench(const EffectLibrary& library) {
    std::printf("| case | ms | x memcpy | goal |\n|---|---|---|---|\n");
    FramePool pool(bench::kFullHd);
    for (const bench::BenchCase& test : bench::BenchCases()) {
        EffectRun run = RunOf(library, test);
        PrintRow(test.name, Measure(run, pool, 1.0), GoalText(test.goalDll));
    }
    const bench::BenchCase& everything = bench::BenchCases()[7];
    const std::string name = everything.name;
    EffectRun late = RunOf(library, everything), jumping = RunOf(library, everything);
    PrintRow(name + ", played at 10 h", Measure(late, pool, 36000.0), "");
    PrintRow(name + ", first frame after a jump to 10 h", MeasureJumps(jumping, pool), "30 ms");
    const Reference<IFrameProcessor> processor = library.CreateFrameProcessor();
    PrintRow("frame processor, 4:2:2 to 32 bits", MeasureConversion(*processor, pool, true), "1.5");
    PrintRow("frame processor, 32 bits to 4:2:2", MeasureConversion(*processor, pool, false), "1.5");
}

}  // namespace velmora::hosts
