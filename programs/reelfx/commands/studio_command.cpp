#include "programs/reelfx/commands/commands.h"

#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstdio>
#include <filesystem>
#include <string>

namespace velmora::hosts {
namespace {

constexpr const char* kPage = "share/velmora-reel-effects/reel.html";

// The desktop's own opener returns as soon as it has handed the page on.
bool Open(const std::filesystem::path& page) {
    std::string opener = "xdg-open", file = page.string();
    char* const arguments[] = {opener.data(), file.data(), nullptr};
    pid_t child = 0;
    if (posix_spawnp(&child, opener.c_str(), nullptr, nullptr, arguments, environ) != 0) return false;
    int status = 0;
    return waitpid(child, &status, 0) == child && WIFEXITED(status) && WEXITSTATUS(status) == 0;
}

// The page beside a program: in share/ below the program's folder, as the tarball has it, or below the folder above, as
// installed. Empty when there is none.
std::filesystem::path StudioPage(const std::filesystem::path& program) {
    const std::filesystem::path folder = program.parent_path();
    for (const std::filesystem::path& root : {folder, folder.parent_path()}) {
        std::error_code ignored;
        if (std::filesystem::is_regular_file(root / kPage, ignored)) return root / kPage;
    }
    return {};
}

}  // namespace

ExitCode Run(const StudioOptions& options) {
    std::error_code error;
    const std::filesystem::path page = StudioPage(std::filesystem::read_symlink("/proc/self/exe", error));
    if (page.empty()) throw Failure(kExitInput, "the page reel.html is not installed beside reelfx");
    if (options.isPathOnly) {
        std::printf("%s\n", page.c_str());
        return kExitDone;
    }
    if (!Open(page)) throw Failure(kExitOutput, "no browser opened; open this file in one: " + page.string());
    return kExitDone;
}

}  // namespace velmora::hosts
