#include "programs/reelcheck/child_process.h"

#include <chrono>

namespace velmora::reelcheck {

ChildProcess::Read ChildProcess::ReadLine(std::string& line, double seconds) {
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

}  // namespace velmora::reelcheck
