// The cost of a frame, as a ratio to a memcpy of one frame timed in the same loop. The buffers rotate through more
// memory than the caches hold, so every frame is read from and written to main memory.
//
// Prints the result as Markdown. Google Benchmark's options select and repeat cases.

#include <benchmark/benchmark.h>

#include <cstdio>
#include <string>

#include "programs/common/bench_cases.h"
#include "programs/common/frame_pool.h"
#include "bench/session_of.h"
#include "library/frame_processor.h"

namespace velmora::bench {
namespace {

void Report(benchmark::State& state, const PairedTimes& times) {
    state.counters["x_memcpy"] = times.Ratio();
    state.counters["work_ms"] = 1000 * times.Work();
}

// Runs rounds and reports their times; `round(times)` adds a pair.
template <typename Round>
void RunRounds(benchmark::State& state, Round&& round) {
    PairedTimes times;
    for (auto _ : state) {
        round(times);
        state.SetIterationTime(times.works.back());
    }
    Report(state, times);
}

// Alternates a memcpy and the work; reports the ratio.
template <typename Work>
void RunPaired(benchmark::State& state, FramePool& pool, Work&& work) {
    RunRounds(state, [&](PairedTimes& times) { RunPair(pool, times, work); });
}

void RunCase(benchmark::State& state, const BenchCase& test, PictureSize size, double startSeconds) {
    FramePool pool(size);
    const auto session = SessionOf(test);
    double frame = startSeconds * 30.0;
    RunPaired(state, pool, [&] {
        const bool done =
            session->Render(pool.Record(pool.Source()), pool.Record(pool.Destination()), frame / 30.0);
        if (!done) state.SkipWithError("frame refused");
        frame += 1.0;
    });
}

// The first frame after a jump to 10 h.
void RunJumps(benchmark::State& state, const BenchCase& test) {
    FramePool pool(kFullHd);
    const auto session = SessionOf(test);
    const auto render = [&](double seconds) {
        const bool done =
            session->Render(pool.Record(pool.Source()), pool.Record(pool.Destination()), seconds);
        if (!done) state.SkipWithError("frame refused");
    };
    RunRounds(state, [&](PairedTimes& times) { RunJump(pool, times, render); });
}

// The frame processor's conversion to 32 bits or back. The 4:2:2 frame is in the first half of its buffer.
void RunConversion(benchmark::State& state, bool toBgra) {
    FramePool pool(kFullHd);
    FrameProcessor processor;
    RunPaired(state, pool, [&] {
        FrameRecord source = pool.Record(pool.Source()), destination = pool.Record(pool.Destination());
        (toBgra ? source : destination).rowStep /= 2;
        const bool done = toBgra ? processor.ConvertYcbcrToBgra(&source, &destination, 255)
                                 : processor.ConvertBgraToYcbcr(&source, &destination, 0);
        if (!done) state.SkipWithError("frame refused");
    });
}

// Registered benchmarks must stay alive until the program ends.
template <typename Run>
void Register(const std::string& name, Run&& run) {
    benchmark::RegisterBenchmark(name.c_str(), run)
        ->UseManualTime()
        ->Unit(benchmark::kMillisecond)
        ->MinTime(0.4);
}

// Prints one row of a Markdown table for each case.
class MarkdownReporter : public benchmark::BenchmarkReporter {
  public:
    bool ReportContext(const Context&) override {
        std::printf("| case | ms | x memcpy |\n|---|---|---|\n");
        return true;
    }
    void ReportRuns(const std::vector<Run>& runs) override {
        for (const Run& run : runs) {
            std::printf("| %s | %.2f | %.2f |\n", run.run_name.function_name.c_str(),
                        run.counters.at("work_ms").value, run.counters.at("x_memcpy").value);
            std::fflush(stdout);
        }
    }
};

void RegisterCase(const std::string& name, const BenchCase& test, PictureSize size, double startSeconds) {
    Register(name, [&test, size, startSeconds](benchmark::State& state) {
        RunCase(state, test, size, startSeconds);
    });
}

}  // namespace
}  // namespace velmora::bench

int main(int argc, char** argv) {
    using namespace velmora::bench;
    for (const BenchCase& test : BenchCases()) {
        RegisterCase(test.name + std::string(" (goal ") + std::to_string(test.goalNative).substr(0, 3) + ")",
                     test, kFullHd, 1.0);
    }
    const BenchCase& everything = BenchCases()[7];
    RegisterCase("Film Pro, everything, played at 10 h", everything, kFullHd, 36000.0);
    Register("Film Pro, everything, first frame after a jump to 10 h (at most 30 ms)",
             [&everything](benchmark::State& state) { RunJumps(state, everything); });
    RegisterCase("Film Pro, everything, 3840x2160", everything, kUltraHd, 1.0);
    Register("frame processor, 4:2:2 to 32 bits (goal 1.5)",
             [](benchmark::State& state) { RunConversion(state, true); });
    Register("frame processor, 32 bits to 4:2:2 (goal 1.5)",
             [](benchmark::State& state) { RunConversion(state, false); });
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv)) return 2;
    MarkdownReporter reporter;
    benchmark::RunSpecifiedBenchmarks(&reporter);
    return 0;
}
