// Command numbers for menus and shortcuts, and the numbers of resources, which the resource compiler reads here too.
#pragma once

#define VM_ICON_REELVIEW 1
#define VM_KEYS_REELVIEW 2

#ifndef RC_INVOKED

namespace velmora::reelview {

enum Command : int {
    kCommandOpen = 100,
    kCommandOpenSequence,
    kCommandSaveFrame,
    kCommandSaveClip,
    kCommandLoadPreset,
    kCommandSavePreset,
    kCommandExit,
    kCommandUndo,
    kCommandRedo,
    kCommandCopyFrame,
    kCommandCopyCommand,
    kCommandDefaults,
    kCommandOptions,
    kCommandAfter,
    kCommandDivider,
    kCommandSideBySide,
    kCommandFit,
    kCommandFull,
    kCommandDouble,
    kCommandPlay,
    kCommandNextFrame,
    kCommandPreviousFrame,
    kCommandFirstFrame,
    kCommandLastFrame,
    kCommandLoop,
    kCommandHelp,
    kCommandEffectHelp,
    kCommandAbout,
    kCommandRecent = 160,  // and the numbers after it
    kCommandRecentEnd = 170,
    kControlEffect = 200,
    kControlPresets,
    kControlPicture,
    kControlStatus,
};

}  // namespace velmora::reelview

#endif
