// Calls into a third-party library that may crash. Windows on i386 only.
#pragma once

namespace velmora::reelview {

// Runs call(argument) on this thread. False when it ended in a processor fault (a bad address, an illegal
// instruction, a division by zero). The call is then abandoned without running destructors, so anything that it
// worked with must not be used again. Endless calls and library code that ends the process cannot be caught.
bool RunGuarded(void (*call)(void*), void* argument) noexcept;

// The same for any callable that returns nothing.
template <class Callable>
bool RunGuarded(Callable& callable) noexcept {
    return RunGuarded([](void* object) { (*static_cast<Callable*>(object))(); }, &callable);
}

}  // namespace velmora::reelview
