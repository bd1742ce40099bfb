// The table of commands and options, used by the parser, --help, the man page and the shell completions.
#pragma once

#include <array>
#include <string>
#include <vector>

#include "programs/reelfx/commands/commands.h"

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
    ExitMeaning{kExitInternal, "internal error",
                "an error in the program or the machine, such as not enough memory"},
    ExitMeaning{
        kExitUsage, "command line",
        "invalid command line: an unknown effect, preset, parameter or option, or a value out of range"},
    ExitMeaning{kExitInput, "input", "the input cannot be read or contains no video"},
    ExitMeaning{kExitOutput, "output", "the output already exists or cannot be written, or the disk is full"},
    ExitMeaning{kExitInterrupted, "interrupted", "interrupted by SIGINT, SIGTERM or SIGHUP"},
};

inline constexpr char kOnInterrupt[] =
    "Ctrl-C keeps the frames finished so far as a playable file, unless OUT replaces an older one. After a "
    "second Ctrl-C nothing is kept.";

// Options as typed, before they are parsed.
struct TypedOptions {
    InputOptions input;
    // Those of all effects of a list; the parser's order says which belongs to which.
    std::vector<std::string> effects, presets, presetFiles, settings, mixes, seeds;
    int thens = 0;
    std::vector<std::string> more;
    OutputOptions output;
    std::string outPath, into, size, rate, randomState, frames, farm, start, duration;
    std::string format, codec, crf, pixelFormat, progress = "auto", depth = "auto";
    int threads = 0;
    std::string startNumber, fps;
    bool overwrite = false, noSound = false, digests = false, quiet = false, dryRun = false, matte = false;
    ListOptions list;
    std::string listEffect;
    PresetsOptions presetsOf;
    InfoOptions info;
    StudioOptions studio;
    PictureOptions picture;
    bool allSheets = false;
    int stripFrames = 12;
    std::string crop;
    PresetShowOptions presetShow;
    PresetSaveOptions presetSave;
};

// Adds the commands to `app`; their options fill `typed`. An option's type name says how the shell completes
// it: EFFECT, PRESET, NAME=VALUE, FILE, CODEC, FORMAT, PIXELS, or the choices themselves, "one|other".
void AddCommands(CLI::App& app, TypedOptions& typed);

// Adds the usual codecs to the help of render's --codec. The parser does this for `reelfx render` only, because asking for
// codecs loads FFmpeg's libraries.
void NameUsualCodecs(CLI::App& render);

}  // namespace velmora::hosts
