// The table of commands and options: what the parser, --help, the man page and the shells' completion all
// know of reelfx.
#pragma once

#include <array>
#include <string>

#include "programs/reelfx/common/failure.h"
#include "programs/reelfx/commands/info_command.h"
#include "programs/reelfx/commands/list_command.h"
#include "programs/reelfx/commands/picture_commands.h"
#include "programs/reelfx/commands/preset_command.h"
#include "programs/reelfx/commands/presets_command.h"
#include "programs/reelfx/commands/render_command.h"
#include "programs/reelfx/commands/strip_command.h"

namespace CLI {
class App;
}

namespace velmora::hosts {

struct ExitMeaning {
    ExitCode code;
    const char* meaning;
    const char* detail;
};
inline constexpr std::array kExitMeanings = {
    ExitMeaning{kExitDone, "done", "done"},
    ExitMeaning{kExitInternal, "internal failure",
                "a fault of the program or of the machine, such as no memory"},
    ExitMeaning{kExitUsage, "command line",
                "the command line: an unknown effect, preset, parameter or option, a value out of range"},
    ExitMeaning{kExitInput, "input", "the input cannot be read or holds no picture"},
    ExitMeaning{kExitOutput, "output", "the output exists already, cannot be written, or the disk is full"},
    ExitMeaning{kExitInterrupted, "interrupted", "interrupted by Ctrl-C or a polite stop"},
};

inline constexpr char kOnInterrupt[] =
    "Ctrl-C keeps the frames finished so far as a playable file, unless OUT replaces an older one; a second "
    "Ctrl-C keeps nothing.";

// Options as they are typed, before they are read.
struct TypedOptions {
    InputOptions input;
    EffectOptions effect;
    OutputOptions output;
    std::string outPath, size, rate, seed = "0", randomState, preset, presetFile, frames, farm, start,
                                     duration;
    std::string format, codec, crf, pixelFormat, progress = "auto";
    int threads = 0;
    bool overwrite = false, noSound = false, digests = false, quiet = false, dryRun = false, matte = false;
    ListOptions list;
    std::string listEffect;
    PresetsOptions presets;
    InfoOptions info;
    PictureOptions picture;
    int stripFrames = 12;
    std::string crop;
    PresetShowOptions presetShow;
    PresetSaveOptions presetSave;
};

// Gives `app` the commands, whose options fill `typed`. An option's type name tells what completes it: EFFECT,
// PRESET, NAME=VALUE, FILE, CODEC, or the choices themselves, "one|other".
void AddCommands(CLI::App& app, TypedOptions& typed);

}  // namespace velmora::hosts
