#include "programs/reelhost/measurements.h"

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <string>
#include <vector>

#include "programs/common/frame_pool.h"
#include "text/number_text.h"
#include "programs/common/effect_run.h"

#include <psapi.h>

namespace velmora::hosts {
namespace {

using Clock = std::chrono::steady_clock;

constexpr FrameRate kRate = {30, 1};
// Enough frames of each preset for a lower quartile, and enough rounds for a trend.
constexpr std::int64_t kMostFramesOfPreset = 40, kRounds = 32;
// In an hour, a leak of 16 bytes a frame or of a handle a round goes far beyond these.
constexpr std::size_t kMemoryTolerance = std::size_t{512} << 10;
constexpr std::size_t kHandleTolerance = 1;
constexpr std::size_t kLeastRoundsForCost = 16;
constexpr double kCostTolerance = 1.2;

struct Sample {
    double frameMs = 0;      // the mean of the presets' lower quartiles
    double processorMs = 0;  // mean processor time per frame, whatever else was running
    std::size_t workingSet = 0, privateBytes = 0, handles = 0, drawingObjects = 0;
};

// Memory committed for this process alone. Not every system maintains its own counter of this.
std::size_t PrivateBytes() {
    std::size_t bytes = 0;
    MEMORY_BASIC_INFORMATION range = {};
    for (const char* at = nullptr; VirtualQuery(at, &range, sizeof range) != 0;
         at = static_cast<const char*>(range.BaseAddress) + range.RegionSize) {
        if (range.State == MEM_COMMIT && range.Type == MEM_PRIVATE) bytes += range.RegionSize;
    }
    return bytes;
}

// Counted one by one for the same reason. Handles are multiples of 4.
std::size_t Handles() {
    constexpr std::uintptr_t kMostHandles = 16384;
    std::size_t count = 0;
    for (std::uintptr_t number = 1; number < kMostHandles; ++number) {
        DWORD flags = 0;
        if (GetHandleInformation(reinterpret_cast<HANDLE>(number * 4), &flags) != FALSE) ++count;
    }
    return count;
}

// The number of a new object; it grows when others leak.
std::size_t DrawingObjects() {
    const HBRUSH brush = CreateSolidBrush(RGB(1, 2, 3));
    DeleteObject(brush);
    return reinterpret_cast<std::uintptr_t>(brush) & 0xFFFF;
}

double ProcessorMs() {
    FILETIME begun, ended, kernel, user;
    GetThreadTimes(GetCurrentThread(), &begun, &ended, &kernel, &user);
    const auto ms = [](const FILETIME& time) {
        return (4294967296.0 * time.dwHighDateTime + time.dwLowDateTime) / 10000;
    };
    return ms(kernel) + ms(user);
}

void TakeStock(Sample& sample) {
    PROCESS_MEMORY_COUNTERS memory = {};
    GetProcessMemoryInfo(GetCurrentProcess(), &memory, sizeof memory);
    sample.workingSet = memory.WorkingSetSize;
    sample.privateBytes = PrivateBytes();
    sample.handles = Handles();
    sample.drawingObjects = DrawingObjects();
}

class Soak {
  public:
    Soak(const EffectLibrary& library, std::int64_t frames) : m_library(library), m_pool(bench::kFullHd) {
        for (const EffectInfo& effect : library.Effects()) m_presets += std::ssize(effect.presets);
        m_framesOfPreset = std::clamp<std::int64_t>(frames / (m_presets * kRounds), 1, kMostFramesOfPreset);
        while (m_frame < frames) Round();
    }

    [[nodiscard]] bool Tell() const;

  private:
    void Round();
    double FrameMs(std::uint32_t effect, std::uint32_t preset);
    // The largest value in a quarter of the run: the first quarter after the round that fills the caches, or the
    // last.
    template <typename Member>
    [[nodiscard]] Member Largest(Member Sample::*member, bool atEnd) const {
        const auto quarter = static_cast<std::ptrdiff_t>(std::max<std::size_t>(m_samples.size() / 4, 1));
        const auto first =
            atEnd ? m_samples.end() - quarter : m_samples.begin() + (m_samples.size() > 1 ? 1 : 0);
        const auto last = std::min(first + quarter, m_samples.end());
        return (*std::max_element(first, last,
                                  [=](const Sample& a, const Sample& b) { return a.*member < b.*member; })).*
               member;
    }
    [[nodiscard]] double MedianCost(double Sample::*member, bool atEnd) const;
    bool IsFlat(const char* name, std::size_t Sample::*member, std::size_t unit, std::size_t tolerance) const;

    const EffectLibrary& m_library;
    bench::FramePool m_pool;
    std::int64_t m_presets = 0, m_framesOfPreset = 1, m_frame = 0;
    std::vector<Sample> m_samples;
    Clock::time_point m_begin = Clock::now();
};

void Soak::Round() {
    Sample sample;
    const std::int64_t firstFrame = m_frame;
    const double before = ProcessorMs();
    for (std::uint32_t effect = 0; effect < m_library.Effects().size(); ++effect) {
        for (std::uint32_t preset = 0; preset < m_library.Effects()[effect].presets.size(); ++preset) {
            sample.frameMs += FrameMs(effect, preset) / static_cast<double>(m_presets);
        }
    }
    sample.processorMs = (ProcessorMs() - before) / static_cast<double>(m_frame - firstFrame);
    TakeStock(sample);
    m_samples.push_back(sample);
    std::printf(
        "frame %7lld  %6.2f ms  %5.2f ms of a processor  working set %zu KiB  private %zu KiB  handles %zu  "
        "drawing "
        "objects %zu\n",
        static_cast<long long>(m_frame), sample.frameMs, sample.processorMs, sample.workingSet >> 10,
        sample.privateBytes >> 10, sample.handles, sample.drawingObjects);
    std::fflush(stdout);
}

double Soak::FrameMs(std::uint32_t effect, std::uint32_t preset) {
    EffectRun run(m_library, effect);
    run.ApplyPreset(preset);
    std::vector<double> times;
    for (std::int64_t i = 0; i < m_framesOfPreset; ++i, ++m_frame) {
        m_pool.Next();
        const auto start = Clock::now();
        run.Render(m_pool.Record(m_pool.Source()), m_pool.Record(m_pool.Destination()),
                   kRate.SecondsAt(m_frame));
        times.push_back(std::chrono::duration<double, std::milli>(Clock::now() - start).count());
    }
    const auto quartile = times.begin() + std::ssize(times) / 4;
    std::nth_element(times.begin(), quartile, times.end());
    return *quartile;
}

double Soak::MedianCost(double Sample::*member, bool atEnd) const {
    const std::size_t count = std::max<std::size_t>(m_samples.size() / 4, 1);
    const std::size_t first = atEnd ? m_samples.size() - count : 0;
    std::vector<double> costs;
    for (std::size_t i = first; i < first + count; ++i) costs.push_back(m_samples[i].*member);
    std::sort(costs.begin(), costs.end());
    return costs[costs.size() / 2];
}

bool Soak::IsFlat(const char* name, std::size_t Sample::*member, std::size_t unit,
                  std::size_t tolerance) const {
    const std::size_t before = Largest(member, false), after = Largest(member, true);
    const bool isFlat = after <= before + tolerance;
    std::printf("figure: soak %s = %zu to %zu%s\n", name, before / unit, after / unit,
                isFlat ? "" : ", GROWS");
    return isFlat;
}

bool Soak::Tell() const {
    std::printf("figure: soak ms a frame = %.2f to %.2f\n", MedianCost(&Sample::frameMs, false),
                MedianCost(&Sample::frameMs, true));
    const double before = MedianCost(&Sample::processorMs, false),
                 after = MedianCost(&Sample::processorMs, true);
    const bool isCostFlat = m_samples.size() < kLeastRoundsForCost || after <= before * kCostTolerance;
    std::printf("figure: soak processor ms a frame = %.2f to %.2f%s\n", before, after,
                isCostFlat ? "" : ", GROWS");
    bool isFlat = isCostFlat;
    isFlat &= IsFlat("working set, KiB", &Sample::workingSet, 1024, kMemoryTolerance);
    isFlat &= IsFlat("private memory, KiB", &Sample::privateBytes, 1024, kMemoryTolerance);
    isFlat &= IsFlat("handles", &Sample::handles, 1, kHandleTolerance);
    isFlat &= IsFlat("drawing objects", &Sample::drawingObjects, 1, kHandleTolerance);
    const double minutes = std::chrono::duration<double>(Clock::now() - m_begin).count() / 60;
    std::printf("soak: %lld frames, %zu rounds through %lld presets, %.1f min: %s\n",
                static_cast<long long>(m_frame), m_samples.size(), static_cast<long long>(m_presets), minutes,
                isFlat ? "flat" : "NOT FLAT");
    return isFlat;
}

}  // namespace

bool RunSoak(const EffectLibrary& library, std::int64_t frames) {
    return Soak(library, frames).Tell();
}

}  // namespace velmora::hosts
