// Ctrl-C, a polite stop and a broken pipe. The first signal asks the running command to finish what it has
// begun; the second to give up at once; the third ends the program where it stands.
#pragma once

namespace velmora::hosts {

// Installs the handlers; called once at the start of the program.
void WatchInterrupts();
// Signals so far.
int Interrupts();

}  // namespace velmora::hosts
