// The command line of reelfx: its commands and options, and what they mean.
#pragma once

#include <string>
#include <variant>

#include "hosts/reelfx/failure.h"
#include "hosts/reelfx/info_command.h"
#include "hosts/reelfx/list_command.h"
#include "hosts/reelfx/picture_commands.h"
#include "hosts/reelfx/preset_command.h"
#include "hosts/reelfx/presets_command.h"
#include "hosts/reelfx/render_command.h"
#include "hosts/reelfx/strip_command.h"

namespace velmora::hosts {

// A text to print and nothing else: the help, the version.
struct TextCommand {
    std::string text;
};
struct FrameCommand {
    PictureOptions options;
};
struct SheetCommand {
    PictureOptions options;
};
using Command = std::variant<TextCommand, ListOptions, RenderOptions, FrameCommand, SheetCommand,
                             StripOptions, PresetShowOptions, PresetSaveOptions, PresetsOptions, InfoOptions>;

// What the arguments ask for; opens and writes nothing. Throws UsageError.
Command ReadCommandLine(int count, const char* const* arguments);

// Does it. Throws Failure or UsageError; the caller prints their line.
ExitCode RunCommand(const Command& command);

}  // namespace velmora::hosts
