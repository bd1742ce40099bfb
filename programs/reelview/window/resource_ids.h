// Resource numbers of the program; the resource compiler reads this file too.
#pragma once

#define VM_ICON_REELVIEW 1
#define VM_KEYS_REELVIEW 2
