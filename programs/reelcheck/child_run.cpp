#include "programs/reelcheck/options.h"

#include <atomic>
#include <chrono>
#include <cstdio>
#include <exception>
#include <string>
#include <thread>

#include "programs/reelcheck/allocation_ledger.h"
#include "programs/reelcheck/child_process.h"
#include "programs/reelcheck/dialog_answers.h"

namespace velmora::reelcheck {
namespace {

using Clock = std::chrono::steady_clock;

double SecondsSince(Clock::time_point start) {
    return std::chrono::duration<double>(Clock::now() - start).count();
}

// The current check's deadline in seconds of the clock; 0 between checks.
std::atomic<std::int64_t> g_deadline{0};

std::int64_t Now() {
    return std::chrono::duration_cast<std::chrono::seconds>(Clock::now().time_since_epoch()).count();
}

// Reports where a check hangs; the parent could only report that it does.
void WatchDeadline() {
    for (;;) {
        std::this_thread::sleep_for(std::chrono::milliseconds(200));
        const std::int64_t deadline = g_deadline.load();
        if (deadline == 0 || Now() <= deadline) continue;
        char line[512];
        std::snprintf(line, sizeof line, "crash %s: still running when the time was up\n", Place());
        WriteLine(line);
        EndNow(4);
    }
}

void RunOne(const Check& check, const Options& options) {
    CheckContext context{options.library, options.bundle, options.level, Dice(options.seed, check.name)};
    WriteLine("begin\n");
    const Clock::time_point start = Clock::now();
    g_deadline = Now() + options.timeoutSeconds;
    SetPlace("%s", "");
    std::string text;
    try {
        check.run(context);
    } catch (const std::exception& failure) {
        text = failure.what();
        if (text.empty()) text = "failed";
    }
    g_deadline = 0;
    const double seconds = SecondsSince(start);
    WriteLine((text.empty() ? Text("ok %.3f\n", seconds) : Text("failed %.3f %s\n", seconds, text.c_str()))
                  .c_str());
}

}  // namespace

int RunChild(const Options& options) {
    ReportCrashes();
#ifdef REELCHECK_LIBRARY
    InstallAllocationHooks();
    InstallDialogHooks();
#endif
    std::thread(WatchDeadline).detach();
    const std::vector<const Check*> checks = ChosenChecks(options);
    for (std::size_t i = static_cast<std::size_t>(*options.childFrom); i < checks.size(); ++i) {
        RunOne(*checks[i], options);
    }
    return 0;
}

}  // namespace velmora::reelcheck
