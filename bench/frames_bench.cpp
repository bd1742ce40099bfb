// The cost of a frame at each SIMD level, as a ratio to a memcpy of one frame timed in the same loop. The buffers rotate
// through more memory than the caches hold, so every frame is read from and written to main memory.
//
// Prints the result as Markdown. Google Benchmark's options select and repeat cases.

#include <benchmark/benchmark.h>

#include <bit>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "programs/common/bench_cases.h"
#include "programs/common/frame_pool.h"
#include "programs/common/level_times.h"
#include "library/frame_processor.h"

namespace velmora::bench {
namespace {

// By the names that Google Benchmark has for their runs.
std::map<std::string, LevelTimes>& AllTimes() {
    static std::map<std::string, LevelTimes> times;
    return times;
}

void RunCase(benchmark::State& state, LevelTimes& times, const BenchCase& test, PictureSize size,
             double startSeconds) {
    FramePool pool(size);
    const auto sessions = MakeAtEachLevel([&] { return SessionOf(test); });
    while (state.KeepRunning()) {
        const double seconds = startSeconds + static_cast<double>(times.Rounds()) / 30.0;
        times.AddRound(pool, [&](std::size_t level) {
            if (!sessions[level]->Render(pool.Record(pool.Source()), pool.Record(pool.Destination()),
                                         seconds)) {
                state.SkipWithError("frame refused");
            }
        });
    }
}

// Deep frames, still as a ratio to a memcpy of an 8-bit one. The pictures are larger than the caches by themselves.
void RunDeep(benchmark::State& state, LevelTimes& times, const BenchCase& test, render::DeepSamples samples) {
    FramePool pool(kFullHd);
    const render::DeepFormat format = {samples, 4, false};
    const std::ptrdiff_t step = kFullHd.width * format.PixelBytes();
    std::vector<float> source(static_cast<std::size_t>(step * kFullHd.height / 4)),
        destination(source.size());
    for (std::size_t i = 0; i < source.size(); ++i) {
        const std::uint8_t byte = pool.Source()[i % (std::size_t{kFullHd.width} * kFullHd.height * 4)];
        source[i] = samples == render::DeepSamples::kFloat ? static_cast<float>(byte) / 255.0f
                                                           : std::bit_cast<float>(byte * 0x01010101u);
    }
    const auto frame = render::DeepFrame::Whole(kFullHd.width, kFullHd.height, format, {source.data(), step},
                                                {destination.data(), step});
    const auto sessions = MakeAtEachLevel([&] { return SessionOf(test); });
    while (state.KeepRunning()) {
        const double seconds = 1.0 + static_cast<double>(times.Rounds()) / 30.0;
        times.AddRound(pool, [&](std::size_t level) {
            if (!sessions[level]->RenderDeep(frame, seconds)) state.SkipWithError("frame refused");
        });
    }
}

// The first frame after a jump to 10 h.
void RunJumps(benchmark::State& state, LevelTimes& times, const BenchCase& test) {
    FramePool pool(kFullHd);
    const auto sessions = MakeAtEachLevel([&] { return SessionOf(test); });
    while (state.KeepRunning()) {
        times.AddJump(pool, [&](std::size_t level, double seconds) {
            if (!sessions[level]->Render(pool.Record(pool.Source()), pool.Record(pool.Destination()),
                                         seconds)) {
                state.SkipWithError("frame refused");
            }
        });
    }
}

// The frame processor's conversion to 32 bits or back. The 4:2:2 frame is in the first half of its buffer.
void RunConversion(benchmark::State& state, LevelTimes& times, bool toBgra) {
    FramePool pool(kFullHd);
    const auto processors = MakeAtEachLevel([] { return std::make_unique<FrameProcessor>(); });
    while (state.KeepRunning()) {
        times.AddRound(pool, [&](std::size_t level) {
            FrameProcessor& processor = *processors[level];
            FrameRecord source = pool.Record(pool.Source()), destination = pool.Record(pool.Destination());
            (toBgra ? source : destination).rowStep /= 2;
            const bool done = toBgra ? processor.ConvertYcbcrToBgra(&source, &destination, 255)
                                     : processor.ConvertBgraToYcbcr(&source, &destination, 0);
            if (!done) state.SkipWithError("frame refused");
        });
    }
}

// `run(state, times)` measures the case. Registered benchmarks stay alive until the program ends.
template <typename Run>
void Register(const std::string& name, int rounds, Run&& run) {
    benchmark::RegisterBenchmark(name.c_str(), [name, run](benchmark::State& state) {
        LevelTimes& times = AllTimes()[name];
        times = {};
        run(state, times);
    })->Iterations(rounds);
}

class MarkdownReporter : public benchmark::BenchmarkReporter {
  public:
    bool ReportContext(const Context&) override {
        PrintTableHead();
        return true;
    }
    void ReportRuns(const std::vector<Run>& runs) override {
        const std::string& name = runs.front().run_name.function_name;
        PrintTableRow(name, AllTimes().at(name));
    }
};

void RegisterCase(const std::string& name, const BenchCase& test, PictureSize size, double startSeconds) {
    const int rounds = size.width == kFullHd.width ? 80 : 30;
    Register(name, rounds, [&test, size, startSeconds](benchmark::State& state, LevelTimes& times) {
        RunCase(state, times, test, size, startSeconds);
    });
}

}  // namespace
}  // namespace velmora::bench

int main(int argc, char** argv) {
    using namespace velmora::bench;
    for (const BenchCase& test : BenchCases()) {
        RegisterCase(TitleOf(test, test.goalNative), test, kFullHd, 1.0);
    }
    const BenchCase& everything = EverythingCase();
    RegisterCase("Film Pro, everything, played at 10 h", everything, kFullHd, 36000.0);
    using benchmark::State;
    Register("Film Pro, everything, first frame after a jump to 10 h (at most 30 ms)", 30,
             [&everything](State& state, LevelTimes& times) { RunJumps(state, times, everything); });
    RegisterCase("Film Pro, everything, 3840x2160", everything, kUltraHd, 1.0);
    Register("Film Pro, everything, 16 bits", 40, [&everything](State& state, LevelTimes& times) {
        RunDeep(state, times, everything, velmora::render::DeepSamples::kUnsigned16);
    });
    Register("Film Pro, everything, float", 40, [&everything](State& state, LevelTimes& times) {
        RunDeep(state, times, everything, velmora::render::DeepSamples::kFloat);
    });
    Register("frame processor, 4:2:2 to 32 bits (goal 1.5)", 80,
             [](State& state, LevelTimes& times) { RunConversion(state, times, true); });
    Register("frame processor, 32 bits to 4:2:2 (goal 1.5)", 80,
             [](State& state, LevelTimes& times) { RunConversion(state, times, false); });
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv)) return 2;
    MarkdownReporter reporter;
    benchmark::RunSpecifiedBenchmarks(&reporter);
    return 0;
}
