// The gain from a second worker in reelfx: "Film Pro" on frames in memory, through reelfx's pipeline but without
// decoding and encoding. Prints a Markdown table.

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <stdexcept>
#include <vector>

#include "programs/common/frame_pool.h"
#include "bench/session_of.h"
#include "programs/reelfx/pipeline/frame_pipeline.h"

namespace velmora::bench {
namespace {

constexpr int kFrames = 150;
constexpr int kRounds = 9;

// Frames per second, from the start of the first frame to the end of the last.
double FramesPerSecond(FramePool& pool, const BenchCase& test, std::size_t workerCount) {
    std::vector<hosts::FramePipeline::Worker> workers;
    for (std::size_t i = 0; i < workerCount; ++i) {
        std::shared_ptr<effects::EffectSession> session = SessionOf(test);
        workers.emplace_back([&pool, session](hosts::PipelineItem& item) {
            const auto at = static_cast<std::size_t>(item.index);
            const bool done = session->Render(pool.Record(pool.SourceAt(at)),
                                              pool.Record(pool.DestinationAt(at)), item.seconds);
            if (!done) throw std::runtime_error("frame refused");
        });
    }
    int next = 0;
    const auto source = [&next]() -> hosts::PipelineItemPtr {
        if (next == kFrames) return nullptr;
        auto item = std::make_unique<hosts::PipelineItem>();
        item->index = next;
        item->seconds = 1.0 + next++ / 30.0;
        return item;
    };
    const auto start = std::chrono::steady_clock::now();
    hosts::FramePipeline pipeline(source, std::move(workers));
    while (pipeline.Next()) {
    }
    return kFrames / std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
}

// The upper quartile, which is close to the rate on an idle machine.
double Typical(std::vector<double> values) {
    std::sort(values.begin(), values.end());
    return values[values.size() * 3 / 4];
}

void PrintRows(const BenchCase& test, PictureSize size) {
    FramePool pool(size);
    std::vector<double> one, two;
    const int rounds = size.width == kFullHd.width ? kRounds : kRounds / 2;
    for (int round = 0; round < rounds; ++round) {
        one.push_back(FramesPerSecond(pool, test, 1));
        two.push_back(FramesPerSecond(pool, test, 2));
    }
    const double alone = Typical(one), both = Typical(two);
    std::printf("| %dx%d, one worker | %.0f | |\n", size.width, size.height, alone);
    std::printf("| %dx%d, two workers (goal 1.9) | %.0f | %.2f |\n", size.width, size.height, both,
                both / alone);
}

void PrintTable() {
    const BenchCase& test = EverythingCase();
    std::printf("| %s | frames a second | x one worker |\n|---|---|---|\n", test.name);
    PrintRows(test, kFullHd);
    PrintRows(test, kUltraHd);
}

}  // namespace
}  // namespace velmora::bench

int main() {
    try {
        velmora::bench::PrintTable();
    } catch (const std::exception& error) {
        std::fprintf(stderr, "pipeline_bench: %s\n", error.what());
        return 1;
    }
    return 0;
}
