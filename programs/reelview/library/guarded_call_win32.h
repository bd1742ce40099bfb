// Calls into a third-party library that may crash or end the process. Windows on i386 only.
#pragma once

#include <windows.h>

namespace velmora::reelview {

// Runs call(argument) on this thread. False when it ended in a processor fault (a bad address, an illegal instruction,
// a division by zero), an exception that nobody caught or, in a watched module, in abort, exit or ExitProcess. The
// call is then abandoned without running destructors, so anything that it worked with must not be used again. An
// endless call cannot be stopped, nor can a system's fail-fast, with which the newer runtimes, linked statically,
// abort.
bool RunGuarded(void (*call)(void*), void* argument) noexcept;

// The same for any callable that returns nothing.
template <class Callable>
bool RunGuarded(Callable& callable) noexcept {
    return RunGuarded([](void* object) { (*static_cast<Callable*>(object))(); }, &callable);
}

// Watches what a loaded module imports, so that within RunGuarded its calls that would end the process only end the
// guarded call. Elsewhere they do what they always do. For one module.
void WatchEndings(HMODULE module) noexcept;

}  // namespace velmora::reelview
