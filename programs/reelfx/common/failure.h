// How a command ends: the exit codes, the exception that carries one with its single line of text, and the signals that
// interrupt it.
#pragma once

#include <cerrno>
#include <cstring>
#include <stdexcept>
#include <string>

namespace velmora::hosts {

enum ExitCode : int {
    kExitDone = 0,
    kExitInternal = 1,  // an error in the program or the machine, such as not enough memory
    kExitUsage = 2,   // invalid command line: unknown effect, preset, parameter or option, value out of range
    kExitInput = 3,   // the input cannot be read or contains no video
    kExitOutput = 4,  // the output already exists or cannot be written, or the disk is full
    kExitInterrupted = 130,  // SIGINT, SIGTERM or SIGHUP
};

class Failure : public std::runtime_error {
  public:
    Failure(ExitCode code, const std::string& text) : std::runtime_error(text), m_code(code) {}
    [[nodiscard]] ExitCode Code() const { return m_code; }

  private:
    ExitCode m_code;
};

// The system's reason for the call that failed last: ": No space left on device"; empty if there is none.
inline std::string SystemReason() {
    return errno == 0 ? std::string() : std::string(": ") + std::strerror(errno);
}

// SIGINT, SIGTERM, SIGHUP, broken pipes and closed standard streams (interrupt.cpp). The first signal asks the running
// command to finish what it has begun, the second to give up at once; the third ends the program immediately.

// Puts something that can neither be read nor written in the place of each standard stream that the caller has closed.
// Files that are opened later would else get their numbers, and messages would be written into them. Called before
// anything is opened.
void OccupyStandardStreams();
// Installs the handlers; called once at the start of the program.
void WatchInterrupts();
// The number of signals so far.
int Interrupts();

}  // namespace velmora::hosts
