// What a frame costs, as a ratio to a memcpy of one frame that is timed beside it in the same loop. Buffers
// rotate through more memory than the caches hold, so that every frame comes from memory and goes to memory.
//
// The result is printed as Markdown; Google Benchmark's own options select and repeat.

#include <benchmark/benchmark.h>

#include <algorithm>
#include <chrono>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <string>
#include <string_view>
#include <vector>

#include "bench/bench_cases.h"
#include "effects/effect_session.h"
#include "plugin/frame_processor.h"

namespace velmora::bench {
namespace {

using Clock = std::chrono::steady_clock;

struct Size {
    std::int32_t width;
    std::int32_t height;
};
constexpr Size kFullHd = {1920, 1080};
constexpr Size kUltraHd = {3840, 2160};

// A picture with gradients, texture and highlights, so that no stage meets only one kind of pixel.
void Paint(std::uint8_t* pixels, Size size, std::uint32_t seed) {
    std::uint32_t noise = seed * 2654435761u + 1;
    for (std::int32_t y = 0; y < size.height; ++y) {
        for (std::int32_t x = 0; x < size.width; ++x, pixels += 4) {
            noise = noise * 1664525u + 1013904223u;
            const auto grain = static_cast<std::int32_t>(noise >> 27);
            pixels[0] = static_cast<std::uint8_t>(std::min(255, 200 * y / size.height + grain));
            pixels[1] = static_cast<std::uint8_t>(std::min(255, 220 * x / size.width + grain));
            pixels[2] = static_cast<std::uint8_t>((x / 64 + y / 64) % 4 == 0 ? 235 + grain / 2 : 60 + grain);
            pixels[3] = 255;
        }
    }
}

class FramePool {
  public:
    explicit FramePool(Size size) : m_size(size) {
        constexpr std::size_t kTotal = 130u << 20;
        const std::size_t pairs = std::max<std::size_t>(2, kTotal / (2 * Bytes()));
        for (std::size_t i = 0; i < pairs; ++i) {
            m_sources.emplace_back(Bytes());
            m_destinations.emplace_back(Bytes(), std::uint8_t{1});
            Paint(m_sources.back().data(), size, static_cast<std::uint32_t>(i));
        }
    }
    [[nodiscard]] std::size_t Bytes() const {
        return static_cast<std::size_t>(m_size.width) * static_cast<std::size_t>(m_size.height) * 4;
    }
    void Next() { m_at = (m_at + 1) % m_sources.size(); }
    [[nodiscard]] std::uint8_t* Source() { return m_sources[m_at].data(); }
    [[nodiscard]] std::uint8_t* Destination() { return m_destinations[m_at].data(); }
    [[nodiscard]] FrameRecord Record(std::uint8_t* pixels) const {
        return {pixels, m_size.width, m_size.height, m_size.width * 4, 0, 0, 0};
    }

  private:
    Size m_size;
    std::vector<std::vector<std::uint8_t>> m_sources, m_destinations;
    std::size_t m_at = 0;
};

double Seconds(Clock::time_point start) { return std::chrono::duration<double>(Clock::now() - start).count(); }

// The lower quartile: what a run costs when nothing else wants the machine.
double Typical(std::vector<double> values) {
    if (values.empty()) return 0;
    const auto at = values.begin() + static_cast<std::ptrdiff_t>(values.size() / 4);
    std::nth_element(values.begin(), at, values.end());
    return *at;
}

// Alternates a memcpy and the work on the next pair of frames; reports the ratio.
template <typename Work>
void RunPaired(benchmark::State& state, FramePool& pool, Work&& work) {
    std::vector<double> copies, works;
    for (auto _ : state) {
        pool.Next();
        auto start = Clock::now();
        std::memcpy(pool.Destination(), pool.Source(), pool.Bytes());
        benchmark::ClobberMemory();
        copies.push_back(Seconds(start));
        pool.Next();
        start = Clock::now();
        work();
        benchmark::ClobberMemory();
        works.push_back(Seconds(start));
        state.SetIterationTime(works.back());
    }
    state.counters["x_memcpy"] = Typical(works) / Typical(copies);
    state.counters["memcpy_ms"] = 1000 * Typical(copies);
}

void SetUp(effects::EffectSession& session, const BenchCase& test) {
    const effects::EffectTable& effect = session.Effect();
    for (std::uint32_t i = 0; i < effect.presetNames.size(); ++i) {
        if (std::string_view(effect.presetNames[i]) == "Reset To None") session.ApplyPreset(i);
    }
    for (const CaseValue& value : test.values) {
        ValueWord word = {};
        switch (effect.params[value.parameter].kind) {
            case kKindSlider:
                word.number = static_cast<float>(value.value);
                break;
            default:
                word.bits = static_cast<std::uint32_t>(value.value);
        }
        session.SetValue(value.parameter, word);
    }
}

void RunCase(benchmark::State& state, const BenchCase& test, Size size, double startSeconds) {
    FramePool pool(size);
    const auto session = effects::EffectSession::Create(*effects::kAllEffects[test.effect]);
    SetUp(*session, test);
    double frame = startSeconds * 30.0;
    RunPaired(state, pool, [&] {
        const bool done = session->Render(pool.Record(pool.Source()), pool.Record(pool.Destination()), frame / 30.0);
        if (!done) state.SkipWithError("frame refused");
        frame += 1.0;
    });
}

// The frame processor's conversion to 32 bits or back; the 4:2:2 frame lies in the first half of its buffer.
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

void RegisterConversion(const char* name, bool toBgra) {
    benchmark::RegisterBenchmark(name, [toBgra](benchmark::State& state) { RunConversion(state, toBgra); })
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
                        run.GetAdjustedRealTime(), run.counters.at("x_memcpy").value);
            std::fflush(stdout);
        }
    }
};

// The library keeps what is registered until the program ends.
void Register(const std::string& name, const BenchCase& test, Size size, double startSeconds) {
    benchmark::RegisterBenchmark(name.c_str(), [&test, size, startSeconds](benchmark::State& state) {
        RunCase(state, test, size, startSeconds);
    })->UseManualTime()->Unit(benchmark::kMillisecond)->MinTime(0.4);
}

}  // namespace
}  // namespace velmora::bench

int main(int argc, char** argv) {
    using namespace velmora::bench;
    for (const BenchCase& test : BenchCases()) {
        Register(test.name + std::string(" (goal ") + std::to_string(test.goalNative).substr(0, 3) + ")", test,
                 kFullHd, 1.0);
    }
    const BenchCase& everything = BenchCases()[7];
    Register("Film Pro, everything, played at 10 h", everything, kFullHd, 36000.0);
    Register("Film Pro, everything, 3840x2160", everything, kUltraHd, 1.0);
    RegisterConversion("frame processor, 4:2:2 to 32 bits (goal 1.5)", true);
    RegisterConversion("frame processor, 32 bits to 4:2:2 (goal 1.5)", false);
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv)) return 2;
    MarkdownReporter reporter;
    benchmark::RunSpecifiedBenchmarks(&reporter);
    return 0;
}
