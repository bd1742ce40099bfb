// reelfx: the effects on the command line, for any footage that FFmpeg's libraries can read.

#include <cstdio>
#include <exception>
#include <new>
#include <system_error>

#include "text/number_text.h"
#include "programs/reelfx/commands/commands.h"
#include "programs/reelfx/common/failure.h"
#include "programs/reelfx/media/av_handles.h"

int main(int count, char** arguments) {
    using namespace velmora::hosts;
    OccupyStandardStreams();
    WatchInterrupts();
    try {
        const Command command = ReadCommandLine(count, arguments);
        if (NeedsMedia(command)) KeepLibraryLog();  // one clear line of ours instead
        const ExitCode code = RunCommand(command);
        // Texts and digests may still be buffered.
        if (std::fflush(stdout) != 0 || std::ferror(stdout) != 0) {
            throw Failure(kExitOutput, "standard output cannot be written");
        }
        return code;
    } catch (const Failure& failure) {
        std::fprintf(stderr, "reelfx: %s\n", failure.what());
        return failure.Code();
    } catch (const UsageError& error) {
        std::fprintf(stderr, "reelfx: %s\n", error.what());
        return kExitUsage;
    } catch (const std::bad_alloc&) {
        std::fprintf(stderr, "reelfx: not enough memory\n");
        return kExitInternal;
    } catch (const std::system_error& error) {
        std::fprintf(stderr, "reelfx: not enough memory or threads: %s\n", error.what());
        return kExitInternal;
    } catch (const std::exception& error) {
        std::fprintf(stderr, "reelfx: %s\n", error.what());
        return kExitInternal;
    }
}
