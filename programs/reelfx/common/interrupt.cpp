#include "programs/reelfx/common/failure.h"

#include <atomic>
#include <csignal>
#include <fcntl.h>
#include <unistd.h>

namespace velmora::hosts {
namespace {

std::atomic<int> g_interrupts = 0;
static_assert(std::atomic<int>::is_always_lock_free, "touched by a signal handler");

extern "C" void CountInterrupt(int number) {
    // If nothing checks the count any more, for example while writing to a pipe that nobody reads, only the
    // default action ends the program.
    if (g_interrupts.fetch_add(1, std::memory_order_relaxed) >= 1) std::signal(number, SIG_DFL);
}

}  // namespace

void OccupyStandardStreams() {
    for (const int stream : {STDIN_FILENO, STDOUT_FILENO, STDERR_FILENO}) {
        if (fcntl(stream, F_GETFD) >= 0) continue;
        // The lowest free number is taken, which is this one.
        if (open("/dev/null", stream == STDIN_FILENO ? O_WRONLY : O_RDONLY) != stream) return;
    }
}

void WatchInterrupts() {
    std::signal(SIGINT, CountInterrupt);
    std::signal(SIGTERM, CountInterrupt);
    // The terminal was closed; nohup ignores that.
    if (std::signal(SIGHUP, CountInterrupt) == SIG_IGN) std::signal(SIGHUP, SIG_IGN);
    // A closed pipe and a file size limit are write errors, like a full disk.
    std::signal(SIGPIPE, SIG_IGN);
    std::signal(SIGXFSZ, SIG_IGN);
}

int Interrupts() {
    return g_interrupts.load(std::memory_order_relaxed);
}

}  // namespace velmora::hosts
