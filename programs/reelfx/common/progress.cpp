#include "programs/reelfx/common/progress.h"

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
    // The container's count is only an estimate: the clip may be longer.
    const std::int64_t end = std::max(total, done);
    std::string line = "frame " + std::to_string(done) + "/" + std::to_string(end) + "  " +
                       std::to_string(done * 100 / end) + "%" + text;
    if (rate > 0.0) line += "  " + ClockText(static_cast<double>(end - done) / rate) + " left";
    return line;
}

std::string ProgressJson(std::int64_t done, std::int64_t total, double seconds, bool isEnd) {
    const std::string frames =
        total > 0 ? R"(,"frames":)" + std::to_string(isEnd ? done : std::max(total, done)) : "";
    char rest[96];
    std::snprintf(rest, sizeof rest, R"(,"seconds":%.3f,"fps":%.1f,"progress":"%s"})", seconds,
                  seconds > 0.0 ? static_cast<double>(done) / seconds : 0.0, isEnd ? "end" : "continue");
    return R"({"frame":)" + std::to_string(done) + frames + rest;
}

ProgressKind Resolved(ProgressKind kind) {
    if (kind != ProgressKind::kAuto) return kind;
    return isatty(STDERR_FILENO) != 0 ? ProgressKind::kText : ProgressKind::kNone;
}

Progress::Progress(std::int64_t total, ProgressKind kind) : m_total(total), m_kind(Resolved(kind)) {}

Progress::~Progress() {
    if (m_kind != ProgressKind::kText || m_done == 0) return;
    Write(true);
    std::fputc('\n', stderr);
}

void Progress::Update(std::int64_t done) {
    m_done = done;
    const Clock::time_point now = Clock::now();
    if (now - m_lastLine < kBetweenLines) return;
    m_lastLine = now;
    Write(false);
}

void Progress::End() {
    if (m_kind == ProgressKind::kJson) Write(true);
}

void Progress::Write(bool isEnd) const {
    const double seconds = std::chrono::duration<double>(Clock::now() - m_begin).count();
    if (m_kind == ProgressKind::kText) {
        // Blanks erase the rest of a longer previous line.
        std::fprintf(stderr, "\r%s\x1b[K", ProgressText(m_done, m_total, seconds).c_str());
    } else if (m_kind == ProgressKind::kJson) {
        std::fprintf(stderr, "%s\n", ProgressJson(m_done, m_total, seconds, isEnd).c_str());
    }
    std::fflush(stderr);
}

}  // namespace velmora::hosts
