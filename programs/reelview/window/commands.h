// Command numbers for menus and shortcuts.
#pragma once

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
