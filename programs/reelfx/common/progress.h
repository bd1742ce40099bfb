// Progress of a command on standard error: for people one line that is updated, with frame, percentage,
// frames per second and time left; for programs a line of JSON for each update.
#pragma once

#include <chrono>
#include <cstdint>
#include <string>

namespace velmora::hosts {

enum class ProgressKind {
    kAuto,  // text at a terminal, otherwise none
    kNone,
    kText,
    kJson,
};

// Text or nothing instead of kAuto.
ProgressKind Resolved(ProgressKind kind);

class Progress {
  public:
    // `total` is 0 if unknown.
    Progress(std::int64_t total, ProgressKind kind);
    ~Progress();  // ends the line of text
    Progress(const Progress&) = delete;
    Progress& operator=(const Progress&) = delete;

    void Update(std::int64_t done);
    // Everything has been written. Reports this to programs; without this call the command has failed.
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

// "frame 12/41 29% 8.3 fps 0:03 left"; without percentage and time left if `total` is 0.
std::string ProgressText(std::int64_t done, std::int64_t total, double seconds);

// {"frame":12,"frames":41,"seconds":1.446,"fps":8.3,"progress":"continue"}; without "frames" if `total` is 0,
// and with "end" instead of "continue" when everything is done.
std::string ProgressJson(std::int64_t done, std::int64_t total, double seconds, bool isEnd);

}  // namespace velmora::hosts
