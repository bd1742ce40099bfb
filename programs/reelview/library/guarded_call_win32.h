// Calls into a library of another maker that may fail badly. Windows on i386 only.
#pragma once

namespace velmora::reelview {

// Runs call(argument) on this thread. False when it ended in a fault of the processor (a wrong address, an illegal
// instruction, a division by zero): the call is given up where it stood, without running destructors, so whatever it
// worked with must not be used again. Endless calls and library code that ends the process are beyond help.
bool RunGuarded(void (*call)(void*), void* argument) noexcept;

// The same for any callable without result.
template <class Callable>
bool RunGuarded(Callable& callable) noexcept {
    return RunGuarded([](void* object) { (*static_cast<Callable*>(object))(); }, &callable);
}

}  // namespace velmora::reelview
