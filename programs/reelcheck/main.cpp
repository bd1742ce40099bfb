// reelcheck: a host that does everything a host may do to the library, and much that it should not.

#include <cstdio>
#include <exception>

#include "programs/reelcheck/options.h"

namespace velmora::reelcheck {
namespace {

enum ExitCode { kAllPassed = 0, kSomeFailed = 1, kWrongUsage = 2 };

void List() {
    for (const Check& check : AllChecks()) {
        std::printf("%2d  %-24s %s\n", check.level, check.name, check.what);
    }
}

int Main(int count, char** arguments) try {
    const Options options = ReadOptions(count, arguments);
    if (options.help) return std::fputs(kHelp, stdout), kAllPassed;
    if (options.list) return List(), kAllPassed;
    if (options.childFrom) return RunChild(options);
    return RunChecks(options) ? kAllPassed : kSomeFailed;
} catch (const std::exception& error) {
    std::fprintf(stderr, "reelcheck: %s\n", error.what());
    return kWrongUsage;
}

}  // namespace
}  // namespace velmora::reelcheck

int main(int count, char** arguments) {
    return velmora::reelcheck::Main(count, arguments);
}
