// SIGINT, SIGTERM and broken pipes. The first signal asks the running command to finish what it has begun,
// the second to give up at once; the third ends the program immediately.
#pragma once

namespace velmora::hosts {

// Installs the handlers; called once at the start of the program.
void WatchInterrupts();
// The number of signals so far.
int Interrupts();

}  // namespace velmora::hosts
