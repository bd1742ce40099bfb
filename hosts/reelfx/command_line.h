// The command line of reelfx: its commands and options, and what they mean.
#pragma once

#include "hosts/reelfx/failure.h"

namespace velmora::hosts {

// Runs the command that the arguments name. Throws Failure or UsageError; the caller prints their line.
ExitCode RunCommandLine(int count, char** arguments);

}  // namespace velmora::hosts
