#include "programs/reelfx/media/av_handles.h"

#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <mutex>
#include <unistd.h>

extern "C" {
#include <libavutil/log.h>
}

namespace velmora::hosts {
namespace {

std::mutex guard;
std::string lastError;

std::string Trimmed(std::string text) {
    while (!text.empty() && (text.back() == '\n' || text.back() == '.' || text.back() == ' '))
        text.pop_back();
    return text.substr(0, text.find('\n'));
}

void Keep(void*, int level, const char* format, va_list arguments) {
    if (level > AV_LOG_ERROR) return;
    char line[512];
    if (std::vsnprintf(line, sizeof line, format, arguments) <= 0) return;
    const std::lock_guard lock(guard);
    lastError = Trimmed(line);
}

}  // namespace

void KeepLibraryLog() {
    av_log_set_callback(Keep);
}

void ForgetLibraryErrors() {
    const std::lock_guard lock(guard);
    lastError.clear();
}

std::string ErrorWords(int error) {
    const std::lock_guard lock(guard);
    // These names say nothing; a YUV4MPEG2 file of an impossible size is "busy".
    const bool isVague = error == AVERROR(EINVAL) || error == AVERROR_EXTERNAL || error == AVERROR_UNKNOWN ||
                         error == AVERROR_EXPERIMENTAL || error == AVERROR_INVALIDDATA ||
                         error == AVERROR_BUG || error == AVERROR(EBUSY);
    if (error == AVERROR(EPERM) && !lastError.empty()) return ": " + lastError;
    if (!isVague) return ": " + AvText(error);
    if (lastError.empty() && error == AVERROR_INVALIDDATA)
        return ": not a clip or picture in a format that is known";
    return lastError.empty() ? " (the library gives no reason)" : ": " + lastError;
}

StandardErrorCapture::StandardErrorCapture() {
    std::fflush(stderr);
    char path[] = "/tmp/reelfx-XXXXXX";
    m_file = mkstemp(path);
    if (m_file < 0) return;
    unlink(path);
    m_kept = dup(STDERR_FILENO);
    if (m_kept >= 0) dup2(m_file, STDERR_FILENO);
}

StandardErrorCapture::~StandardErrorCapture() {
    std::fflush(stderr);
    if (m_kept >= 0) {
        dup2(m_kept, STDERR_FILENO);
        close(m_kept);
    }
    if (m_file >= 0) close(m_file);
}

std::string StandardErrorCapture::Warning() const {
    if (m_file < 0) return {};
    std::fflush(stderr);
    char text[4096];
    const ssize_t size = pread(m_file, text, sizeof text, 0);
    const std::string all(text, size > 0 ? static_cast<std::size_t>(size) : 0);
    constexpr char kMark[] = "[warning]: ";
    const std::size_t at = all.find(kMark);
    return at == std::string::npos ? std::string() : Trimmed(all.substr(at + sizeof kMark - 1));
}

}  // namespace velmora::hosts
