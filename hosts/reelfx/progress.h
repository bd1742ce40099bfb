// The line that tells a person at a terminal how far a command is: frame, share, frames per second, time
// left. Nothing is written where standard error is not a terminal.
#pragma once

#include <chrono>
#include <cstdint>
#include <string>

namespace velmora::hosts {

class Progress {
  public:
    // `total` 0: not known.
    Progress(std::int64_t total, bool isQuiet);
    ~Progress();  // ends the line
    Progress(const Progress&) = delete;
    Progress& operator=(const Progress&) = delete;

    void Update(std::int64_t done);

  private:
    using Clock = std::chrono::steady_clock;

    std::int64_t m_total;
    bool m_isShown;
    Clock::time_point m_begin = Clock::now();
    Clock::time_point m_lastLine{};
    std::int64_t m_done = 0;
};

// "frame 12/41  29%  8.3 fps  0:03 left"; without the share and the time where `total` is 0.
std::string ProgressText(std::int64_t done, std::int64_t total, double seconds);

}  // namespace velmora::hosts
