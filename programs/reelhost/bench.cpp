#include "programs/reelhost/measurements.h"

#include <memory>
#include <stdexcept>
#include <string>

#include "programs/common/bench_cases.h"
#include "programs/common/frame_pool.h"
#include "programs/common/effect_info.h"
#include "programs/common/effect_run.h"
#include "programs/common/level_times.h"

namespace velmora::hosts {
namespace {

using bench::FramePool;
using bench::LevelTimes;

std::unique_ptr<EffectRun> RunOf(const EffectLibrary& library, const bench::BenchCase& test) {
    auto run = std::make_unique<EffectRun>(library, test.effect);
    run->ApplyPreset(FindPreset(run->Info(), "Reset To None"));
    for (const bench::CaseValue& value : test.values) {
        ValueWord word = {};
        if (run->Info().params[value.parameter].kind == kKindSlider) {
            word.number = static_cast<float>(value.value);
        } else {
            word.bits = static_cast<std::uint32_t>(value.value);
        }
        run->Set({value.parameter, word});
    }
    return run;
}

constexpr int kFrames = 80, kJumps = 30;

// Frames from a time on, 30 a second.
LevelTimes Measure(const EffectLibrary& library, const bench::BenchCase& test, FramePool& pool,
                   double startSeconds) {
    auto runs = bench::MakeAtEachLevel([&] { return RunOf(library, test); });
    LevelTimes times;
    for (int i = 0; i < kFrames; ++i) {
        times.AddRound(pool, [&](std::size_t level) {
            runs[level]->Render(pool.Record(pool.Source()), pool.Record(pool.Destination()),
                                startSeconds + i / 30.0);
        });
    }
    return times;
}

LevelTimes MeasureJumps(const EffectLibrary& library, const bench::BenchCase& test, FramePool& pool) {
    auto runs = bench::MakeAtEachLevel([&] { return RunOf(library, test); });
    LevelTimes times;
    for (int i = 0; i < kJumps; ++i) {
        times.AddJump(pool, [&](std::size_t level, double seconds) {
            runs[level]->Render(pool.Record(pool.Source()), pool.Record(pool.Destination()), seconds);
        });
    }
    return times;
}

// The 4:2:2 frame uses the first half of its buffer.
LevelTimes MeasureConversion(const EffectLibrary& library, FramePool& pool, bool toBgra) {
    const auto processors = bench::MakeAtEachLevel([&] { return library.CreateFrameProcessor(); });
    LevelTimes times;
    for (int i = 0; i < kFrames; ++i) {
        times.AddRound(pool, [&](std::size_t level) {
            IFrameProcessor& processor = *processors[level];
            FrameRecord source = pool.Record(pool.Source()), destination = pool.Record(pool.Destination());
            (toBgra ? source : destination).rowStep /= 2;
            const bool done = toBgra ? processor.ConvertYcbcrToBgra(&source, &destination, 255)
                                     : processor.ConvertBgraToYcbcr(&source, &destination, 0);
            if (!done) throw std::runtime_error("the frame processor refuses a frame");
        });
    }
    return times;
}

}  // namespace

void PrintBench(const EffectLibrary& library) {
    using bench::PrintTableRow;
    bench::PrintTableHead();
    FramePool pool(bench::kFullHd);
    for (const bench::BenchCase& test : bench::BenchCases()) {
        PrintTableRow(TitleOf(test, test.goalDll), Measure(library, test, pool, 1.0));
    }
    const bench::BenchCase& everything = bench::EverythingCase();
    const std::string name = everything.name;
    PrintTableRow(name + ", played at 10 h", Measure(library, everything, pool, 36000.0));
    PrintTableRow(name + ", first frame after a jump to 10 h (at most 30 ms)",
                  MeasureJumps(library, everything, pool));
    PrintTableRow("frame processor, 4:2:2 to 32 bits (goal 1.5)", MeasureConversion(library, pool, true));
    PrintTableRow("frame processor, 32 bits to 4:2:2 (goal 1.5)", MeasureConversion(library, pool, false));
}

}  // namespace velmora::hosts
