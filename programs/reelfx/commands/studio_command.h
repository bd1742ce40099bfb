// `reelfx studio`: the effects to play with, on a page in the browser.
#pragma once

#include <filesystem>

#include "programs/reelfx/common/failure.h"

namespace velmora::hosts {

struct StudioOptions {
    bool isPathOnly = false;  // print where the page lies instead of opening it
};

// The page beside a program: in share/ below the program's folder, as the tarball has it, or below the folder above, as
// installed. Empty when there is none.
[[nodiscard]] std::filesystem::path StudioPage(const std::filesystem::path& program);

// Asks the desktop to open the page. Throws Failure when there is no page or no desktop that opens it.
ExitCode Run(const StudioOptions& options);

}  // namespace velmora::hosts
