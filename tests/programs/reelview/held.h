// What a process holds: kernel handles, GDI objects, objects of the user interface, memory. Counted from the system's
// tables, because GetGuiResources and GetProcessHandleCount answer 0 under Wine.
#pragma once

#include <windows.h>

namespace velmora::reelview::test {

struct Held {
    unsigned handles = 0, gdi = 0;
    unsigned user = 0;  // of all processes, because their table is shared
    SIZE_T bytes = 0;
};

// Counts of 0 mean that the system does not show the table.
Held HeldBy(HANDLE process);

}  // namespace velmora::reelview::test
