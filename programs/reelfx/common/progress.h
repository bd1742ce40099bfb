// How far a command is, on standard error: for a person a line that stands still, with frame, share, frames
// per second and time left; for programs a line of JSON each time.
#pragma once

#include <chrono>
#include <cstdint>
#include <string>

namespace velmora::hosts {

enum class ProgressKind {
    kAuto,  // text at a terminal, else none
    kNone,
    kText,
    kJson,
};

class Progress {
  public:
    // `total` 0: not known.
    Progress(std::int64_t total, ProgressKind kind);
    ~Progress();  // ends a person's line
    Progress(const Progress&) = delete;
    Progress& operator=(const Progress&) = delete;

    void Update(std::int64_t done);
    // All is done and written. Programs are told so; without it the command has failed.
    void End();

  private:
    using Clock = std::chrono::steady_clock;

    void Write(bool isEnd) const;

    std::int64_t m_total;
    ProgressKind m_kind;
    Clock::time_point m_begin = Clock::now();
    Clock::time_point m_lastLine{};
    std::int64_t m_done = 0;
};

// "frame 12/41  29%  8.3 fps  0:03 left"; without the share and the time where `total` is 0.
std::string ProgressText(std::int64_t done, std::int64_t total, double seconds);

// {"frame":12,"frames":41,"seconds":1.446,"fps":8.3,"progress":"continue"}; without "frames" where `total` is
// 0, and "end" for "continue" when all is done.
std::string ProgressJson(std::int64_t done, std::int64_t total, double seconds, bool isEnd);

}  // namespace velmora::hosts
