// Runs this program again in a child process, which may crash or hang without affecting the parent.
#pragma once

#include <chrono>
#include <memory>
#include <string>
#include <vector>

namespace velmora::reelcheck {

class ChildProcess {
  public:
    enum class Read { kLine, kEnd, kTimeout };

    // Starts the child; its standard output is read here. Throws std::runtime_error when it cannot be started.
    explicit ChildProcess(const std::vector<std::string>& arguments);
    ~ChildProcess();
    ChildProcess(const ChildProcess&) = delete;
    ChildProcess& operator=(const ChildProcess&) = delete;

    // Waits for the next line of output, for the end of output or for the time limit.
    [[nodiscard]] Read ReadLine(std::string& line, double seconds);
    void Kill();
    // Waits for the child to end. Empty when it ended normally, else how it ended.
    [[nodiscard]] std::string HowItEnded();

  private:
    struct System;
    // Appends what arrives within a short while; false at the end of the output.
    bool ReadSome();

    std::unique_ptr<System> m_system;
    std::string m_read;
};

inline ChildProcess::Read ChildProcess::ReadLine(std::string& line, double seconds) {
    using Clock = std::chrono::steady_clock;
    const auto end = Clock::now() + std::chrono::duration<double>(seconds);
    bool isOpen = true;
    for (;;) {
        const std::size_t length = m_read.find('\n');
        if (length != std::string::npos) {
            line = m_read.substr(0, length);
            if (line.ends_with('\r')) line.pop_back();
            m_read.erase(0, length + 1);
            return Read::kLine;
        }
        if (!isOpen) return Read::kEnd;
        if (Clock::now() > end) return Read::kTimeout;
        isOpen = ReadSome();
    }
}

// In the child: a crash ends the process with a line "crash TEXT" on standard output.
void ReportCrashes();
// In the child: writes a line to standard output at once, even while crashing.
void WriteLine(const char* text) noexcept;
// In the child: ends the process at once.
[[noreturn]] void EndNow(int code) noexcept;

}  // namespace velmora::reelcheck
