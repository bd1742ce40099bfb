#include "programs/reelfx/media/input_address.h"

#include <cerrno>
#include <new>
#include <optional>
#include <poll.h>
#include <sys/stat.h>
#include <unistd.h>

#include "programs/reelfx/common/failure.h"

extern "C" {
#include <libavutil/error.h>
#include <libavutil/mem.h>
}

namespace velmora::hosts {
namespace {

constexpr int kBufferBytes = 1 << 16;
constexpr int kPatience =
    100;  // milliseconds between checks for interrupts, because any thread may receive the signal

int Read(void*, std::uint8_t* buffer, int size) {
    for (;;) {
        if (Interrupts() > 0) return AVERROR_EXIT;
        pollfd input = {STDIN_FILENO, POLLIN, 0};
        if (poll(&input, 1, kPatience) <= 0) continue;
        const ssize_t count = read(STDIN_FILENO, buffer, static_cast<std::size_t>(size));
        if (count > 0) return static_cast<int>(count);
        if (count == 0) return AVERROR_EOF;
        if (errno != EINTR && errno != EAGAIN) return AVERROR(errno);
    }
}

// Where a file that is redirected to standard input begins; nothing if it is a pipe or a terminal.
std::optional<off_t> StartOfFile() {
    struct stat status {};
    if (fstat(STDIN_FILENO, &status) != 0 || !S_ISREG(status.st_mode)) return std::nullopt;
    const off_t start = lseek(STDIN_FILENO, 0, SEEK_CUR);
    return start < 0 ? std::nullopt : std::optional(start);
}

// Files with their index at the end can only be read by going there first.
std::int64_t Seek(void* opaque, std::int64_t offset, int whence) {
    const off_t start = *static_cast<const off_t*>(opaque);
    struct stat status {};
    if (fstat(STDIN_FILENO, &status) != 0) return AVERROR(errno);
    if ((whence & AVSEEK_SIZE) != 0) return status.st_size - start;
    whence &= ~AVSEEK_FORCE;
    const off_t at = lseek(STDIN_FILENO, whence == SEEK_SET ? offset + start : offset, whence);
    return at < 0 ? AVERROR(errno) : at - start;
}

}  // namespace

void CloseInputStream::operator()(AVIOContext* stream) const {
    av_freep(static_cast<void*>(&stream->buffer));  // the library may have replaced it
    avio_context_free(&stream);
}

InputStreamPtr OpenStandardInput() {
    static std::optional<off_t> start;  // there is only one standard input
    if (!start) start = StartOfFile();
    auto* const buffer = static_cast<unsigned char*>(av_malloc(kBufferBytes));
    AVIOContext* const stream = buffer
                                    ? avio_alloc_context(buffer, kBufferBytes, 0, start ? &*start : nullptr,
                                                         Read, nullptr, start ? Seek : nullptr)
                                    : nullptr;
    if (!stream) {
        av_free(buffer);
        throw std::bad_alloc();
    }
    return InputStreamPtr(stream);
}

}  // namespace velmora::hosts
