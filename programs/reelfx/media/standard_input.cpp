#include "programs/reelfx/media/input_address.h"

#include <cerrno>
#include <new>
#include <poll.h>
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

}  // namespace

void CloseInputStream::operator()(AVIOContext* stream) const {
    av_freep(static_cast<void*>(&stream->buffer));  // the library may have replaced it
    avio_context_free(&stream);
}

InputStreamPtr OpenStandardInput() {
    auto* const buffer = static_cast<unsigned char*>(av_malloc(kBufferBytes));
    AVIOContext* const stream =
        buffer ? avio_alloc_context(buffer, kBufferBytes, 0, nullptr, Read, nullptr, nullptr) : nullptr;
    if (!stream) {
        av_free(buffer);
        throw std::bad_alloc();
    }
    return InputStreamPtr(stream);
}

}  // namespace velmora::hosts
