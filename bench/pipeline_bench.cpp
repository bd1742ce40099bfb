// The gain from more workers in reelfx: "Film Pro" on frames in memory, through reelfx's pipeline but without decoding
// and encoding. Threads that share the frames without a pipeline, and copies of the frames, show what the machine allows.
// Prints a Markdown table.

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstring>
#include <functional>
#include <iterator>
#include <memory>
#include <stdexcept>
#include <thread>
#include <vector>

#include "programs/common/frame_pool.h"
#include "programs/common/bench_cases.h"
#include "programs/reelfx/pipeline/frame_pipeline.h"

namespace velmora::bench {
namespace {

constexpr int kFrames = 300;
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

std::vector<hosts::FramePipeline::Worker> MakeWorkers(const MakeWorker& makeWorker, std::size_t count) {
    std::vector<hosts::FramePipeline::Worker> workers;
    for (std::size_t i = 0; i < count; ++i) workers.push_back(makeWorker());
    return workers;
}

void Place(hosts::PipelineItem& item, int frame) {
    item.index = frame;
    item.seconds = 1.0 + frame / 30.0;
}

// Frames per second, from the start of the first frame to the end of the last.
double FramesPerSecond(const std::function<void()>& work) {
    const auto start = std::chrono::steady_clock::now();
    work();
    return kFrames / std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
}

double RateInPipeline(std::vector<hosts::FramePipeline::Worker> workers) {
    int next = 0;
    const auto source = [&next]() -> hosts::PipelineItemPtr {
        if (next == kFrames) return nullptr;
        auto item = std::make_unique<hosts::PipelineItem>();
        Place(*item, next++);
        return item;
    };
    return FramesPerSecond([&] {
        hosts::FramePipeline pipeline(source, std::move(workers));
        while (pipeline.Next()) {
        }
    });
}

// Every worker has a thread and its share of the frames, and never waits.
double RateOfThreads(const std::vector<hosts::FramePipeline::Worker>& workers) {
    return FramesPerSecond([&] {
        std::vector<std::thread> threads;
        for (std::size_t first = 0; first < workers.size(); ++first) {
            threads.emplace_back([&workers, first] {
                hosts::PipelineItem item;
                const auto step = static_cast<int>(workers.size());
                for (auto frame = static_cast<int>(first); frame < kFrames; frame += step) {
                    Place(item, frame);
                    workers[first](item);
                }
            });
        }
        for (std::thread& thread : threads) thread.join();
    });
}

// The upper quartile, which is close to the rate on an idle machine.
double Typical(std::vector<double> values) {
    std::sort(values.begin(), values.end());
    return values[values.size() * 3 / 4];
}

void PrintRows(const char* work, PictureSize size, const MakeWorker& makeWorker) {
    constexpr std::size_t kWorkers[] = {1, 2, 4};
    std::vector<double> rates[std::size(kWorkers)], threadRates[std::size(kWorkers)];
    const int rounds = size.width == kFullHd.width ? kRounds : kRounds / 2;
    for (int round = 0; round < rounds; ++round) {
        for (std::size_t i = 0; i < std::size(kWorkers); ++i) {
            rates[i].push_back(RateInPipeline(MakeWorkers(makeWorker, kWorkers[i])));
            threadRates[i].push_back(RateOfThreads(MakeWorkers(makeWorker, kWorkers[i])));
        }
    }
    for (std::size_t i = 0; i < std::size(kWorkers); ++i) {
        const double rate = Typical(rates[i]), threadRate = Typical(threadRates[i]);
        std::printf("| %s, %dx%d | %zu | %.0f | %.2f | %.0f | %.2f |\n", work, size.width, size.height,
                    kWorkers[i], rate, rate / Typical(rates[0]), threadRate,
                    threadRate / Typical(threadRates[0]));
    }
}

void PrintTable() {
    const BenchCase& test = EverythingCase();
    std::printf(
        "| work | workers | frames a second | x one (two: goal 1.9) | without a pipeline | x one |\n");
    std::printf("|---|---|---|---|---|---|\n");
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
