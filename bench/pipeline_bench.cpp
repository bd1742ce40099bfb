// The gain from more workers in reelfx: "Film Pro" on frames in memory, through reelfx's pipeline but without decoding
// and encoding. Copies of the frames, through the same pipeline, show what the memory allows. Prints a Markdown table.

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstring>
#include <functional>
#include <iterator>
#include <memory>
#include <stdexcept>
#include <vector>

#include "programs/common/frame_pool.h"
#include "programs/common/bench_cases.h"
#include "programs/reelfx/pipeline/frame_pipeline.h"

namespace velmora::bench {
namespace {

constexpr int kFrames = 150;
constexpr int kRounds = 9;

hosts::FramePipeline::Worker RenderWorker(FramePool& pool, const BenchCase& test) {
    std::shared_ptr<effects::EffectSession> session = SessionOf(test);
    return [&pool, session](hosts::PipelineItem& item) {
        const auto at = static_cast<std::size_t>(item.index);
        const bool done = session->Render(pool.Record(pool.SourceAt(at)), pool.Record(pool.DestinationAt(at)),
                                          item.seconds);
        if (!done) throw std::runtime_error("frame refused");
    };
}

hosts::FramePipeline::Worker CopyWorker(FramePool& pool) {
    return [&pool](hosts::PipelineItem& item) {
        const auto at = static_cast<std::size_t>(item.index);
        std::memcpy(pool.DestinationAt(at), pool.SourceAt(at), pool.Bytes());
    };
}

using MakeWorker = std::function<hosts::FramePipeline::Worker()>;

// Frames per second, from the start of the first frame to the end of the last.
double FramesPerSecond(const MakeWorker& makeWorker, std::size_t workerCount) {
    std::vector<hosts::FramePipeline::Worker> workers;
    for (std::size_t i = 0; i < workerCount; ++i) workers.push_back(makeWorker());
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

void PrintRows(const char* work, PictureSize size, const MakeWorker& makeWorker) {
    constexpr std::size_t kWorkers[] = {1, 2, 4};
    std::vector<double> rates[std::size(kWorkers)];
    const int rounds = size.width == kFullHd.width ? kRounds : kRounds / 2;
    for (int round = 0; round < rounds; ++round) {
        for (std::size_t i = 0; i < std::size(kWorkers); ++i)
            rates[i].push_back(FramesPerSecond(makeWorker, kWorkers[i]));
    }
    const double alone = Typical(rates[0]);
    for (std::size_t i = 0; i < std::size(kWorkers); ++i) {
        const double rate = Typical(rates[i]);
        std::printf("| %s, %dx%d | %zu | %.0f | %.2f |\n", work, size.width, size.height, kWorkers[i], rate,
                    rate / alone);
    }
}

void PrintTable() {
    const BenchCase& test = EverythingCase();
    std::printf("| work | workers | frames a second | x one worker (two: goal 1.9) |\n|---|---|---|---|\n");
    for (const PictureSize size : {kFullHd, kUltraHd}) {
        FramePool pool(size);
        PrintRows(test.name, size, [&] { return RenderWorker(pool, test); });
        PrintRows("copies", size, [&] { return CopyWorker(pool); });
    }
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
