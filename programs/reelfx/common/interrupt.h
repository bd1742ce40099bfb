// SIGINT, SIGTERM, SIGHUP, broken pipes and closed standard streams. The first signal asks the running command to
// finish what it has begun, the second to give up at once; the third ends the program immediately.
#pragma once

namespace velmora::hosts {

// Puts something that can neither be read nor written in the place of each standard stream that the caller has closed.
// Files that are opened later would else get their numbers, and messages would be written into them. Called before
// anything is opened.
void OccupyStandardStreams();
// Installs the handlers; called once at the start of the program.
void WatchInterrupts();
// The number of signals so far.
int Interrupts();

}  // namespace velmora::hosts
