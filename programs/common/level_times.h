// Measures work at all SIMD levels side by side: in each round a copy of a frame, then the work once at each level, so
// that whatever slows a part of the run slows all of them. Prints the costs as a Markdown table.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "programs/common/frame_pool.h"

namespace velmora::bench {

// The levels that this processor runs, by the names that the environment has for them. The one that most processors
// have comes first. Plain code is only there if there is nothing else.
[[nodiscard]] const std::vector<std::string_view>& MeasuredLevels();

// Sets the level of the effects, sessions and frame processors that are made from now on; empty: the fastest. They
// read it from the process's environment and keep it.
void SetLevel(std::string_view name);

// What make() returns at each level.
template <typename Make>
[[nodiscard]] auto MakeAtEachLevel(Make&& make) {
    std::vector<decltype(make())> made;
    for (const std::string_view level : MeasuredLevels()) {
        SetLevel(level);
        made.push_back(make());
    }
    SetLevel({});
    return made;
}

// The times of the copies and of the work at each level, in seconds.
class LevelTimes {
  public:
    // The lower quartiles: the cost of a run on an idle machine.
    [[nodiscard]] double Copy() const { return Typical(m_copies); }
    [[nodiscard]] double Work(std::size_t level) const { return Typical(m_works[level]); }
    [[nodiscard]] std::size_t Rounds() const { return m_copies.size(); }

    // A copy, then work(level) for each level, each on the next pair of frames. prepare(level) comes just before the
    // work and is not measured.
    template <typename Prepare, typename Work>
    void AddRound(FramePool& pool, Prepare&& prepare, Work&& work) {
        pool.Next();
        m_copies.push_back(Timed([&] { pool.Copy(); }));
        for (std::size_t level = 0; level < m_works.size(); ++level) {
            pool.Next();
            prepare(level);
            m_works[level].push_back(Timed([&] { work(level); }));
        }
    }
    template <typename Work>
    void AddRound(FramePool& pool, Work&& work) {
        AddRound(
            pool, [](std::size_t) {}, std::forward<Work>(work));
    }
    // The work is render(level, seconds) after a long jump, from near the start of the clip to 10 h. Each round jumps
    // to a different time, so that nothing kept from an earlier round helps.
    template <typename Render>
    void AddJump(FramePool& pool, Render&& render) {
        const auto round = static_cast<double>(Rounds());
        AddRound(
            pool, [&](std::size_t level) { render(level, 1.0 + round); },
            [&](std::size_t level) { render(level, 36000.0 + 7.0 * round); });
    }

  private:
    template <typename Action>
    static double Timed(Action&& action) {
        const double start = SecondsOfThisThread();
        action();
        return SecondsOfThisThread() - start;
    }
    static double Typical(std::vector<double> values);

    std::vector<double> m_copies;
    std::vector<std::vector<double>> m_works{MeasuredLevels().size()};
};

// The table's columns: milliseconds at the first level, then the ratios to the copy at each level.
void PrintTableHead();
void PrintTableRow(const std::string& name, const LevelTimes& times);

}  // namespace velmora::bench
