#include "hosts/reelfx/progress.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <unistd.h>

namespace velmora::hosts {
namespace {

constexpr std::chrono::milliseconds kBetweenLines{100};

std::string ClockText(double seconds) {
    const long long whole = std::llround(seconds);
    char text[48];
    if (whole >= 3600) {
        std::snprintf(text, sizeof text, "%lld:%02lld:%02lld", whole / 3600, whole / 60 % 60, whole % 60);
    } else {
        std::snprintf(text, sizeof text, "%lld:%02lld", whole / 60, whole % 60);
    }
    return text;
}

}  // namespace

std::string ProgressText(std::int64_t done, std::int64_t total, double seconds) {
    const double rate = seconds > 0.0 ? static_cast<double>(done) / seconds : 0.0;
    char text[64];
    std::snprintf(text, sizeof text, "  %.1f fps", rate);
    if (total <= 0) return "frame " + std::to_string(done) + text;
    // The container's count is a guess: a clip may turn out longer.
    const std::int64_t end = std::max(total, done);
    std::string line = "frame " + std::to_string(done) + "/" + std::to_string(end) + "  " +
                       std::to_string(done * 100 / end) + "%" + text;
    if (rate > 0.0) line += "  " + ClockText(static_cast<double>(end - done) / rate) + " left";
    return line;
}

Progress::Progress(std::int64_t total, bool isQuiet)
    : m_total(total), m_isShown(!isQuiet && isatty(STDERR_FILENO) != 0) {}

Progress::~Progress() {
    if (!m_isShown || m_done == 0) return;
    m_lastLine = {};
    Update(m_done);
    std::fputc('\n', stderr);
}

void Progress::Update(std::int64_t done) {
    m_done = done;
    const Clock::time_point now = Clock::now();
    if (!m_isShown || now - m_lastLine < kBetweenLines) return;
    m_lastLine = now;
    const double seconds = std::chrono::duration<double>(now - m_begin).count();
    // The rest of a longer line before is wiped.
    std::fprintf(stderr, "\r%s\x1b[K", ProgressText(done, m_total, seconds).c_str());
    std::fflush(stderr);
}

}  // namespace velmora::hosts
