// The command line of reelfx: its commands and options, and what they mean.
#pragma once

#include <string>
#include <variant>

#include "programs/reelfx/common/failure.h"
#include "programs/reelfx/commands/batch_command.h"
#include "programs/reelfx/commands/info_command.h"
#include "programs/reelfx/commands/list_command.h"
#include "programs/reelfx/commands/picture_commands.h"
#include "programs/reelfx/commands/preset_command.h"
#include "programs/reelfx/commands/presets_command.h"
#include "programs/reelfx/commands/render_command.h"
#include "programs/reelfx/commands/strip_command.h"
#include "programs/reelfx/commands/studio_command.h"

namespace velmora::hosts {

// A text to print and nothing else: the help, the version.
struct TextCommand {
    std::string text;
};
using Command = std::variant<TextCommand, ListOptions, RenderOptions, BatchOptions, FrameOptions,
                             SheetOptions, StripOptions, PresetShowOptions, PresetSaveOptions, PresetsOptions,
                             InfoOptions, StudioOptions>;

// Parses the arguments; opens and writes nothing. Throws UsageError.
Command ReadCommandLine(int count, const char* const* arguments);

// Runs the command. Throws Failure or UsageError; the caller prints their text.
ExitCode RunCommand(const Command& command);

}  // namespace velmora::hosts
