// Numbers of the program's resources; the resource compiler reads this too.
#pragma once

#define VM_ICON_REELVIEW 1
#define VM_KEYS_REELVIEW 2
