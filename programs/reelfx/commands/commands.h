// The commands of reelfx. Each has a record of what the user asked for and a function Run, in a file of its own, such as
// render_command.cpp, or with those that it resembles, as in picture_commands.cpp. Run throws Failure, or UsageError for
// what only shows when the command is at work.
#pragma once

#include <cstdint>
#include <filesystem>
#include <optional>
#include <string>
#include <utility>
#include <variant>
#include <vector>

#include "programs/reelfx/common/effect_choice.h"
#include "programs/reelfx/common/failure.h"
#include "programs/reelfx/common/progress.h"
#include "programs/reelfx/conversion/picture_view.h"
#include "programs/reelfx/media/encoder_choice.h"
#include "programs/reelfx/media/media_reader.h"
#include "programs/reelfx/pipeline/clip_pictures.h"
#include "programs/reelfx/pipeline/clip_section.h"
#include "text/number_text.h"

namespace velmora::hosts {

// `reelfx render`: a clip through one or several effects.
struct RenderOptions {
    InputOptions input;
    std::vector<EffectOptions> effects;  // in order, one at least
    SectionOptions section;
    std::optional<OutputOptions> output;  // none: digests only
    int threads = 0;                      // 0: one per processor
    bool mayOverwrite = false;
    bool withSound = true;
    bool withDigests = false;         // a line for each frame on standard output
    std::optional<SampleType> depth;  // that the effects work in; none: as SamplesFor says
    bool isMatte = false;             // only the damage, without the picture
    bool isDryRun = false;            // checks and reports, but writes nothing
    ProgressKind progress = ProgressKind::kAuto;
};
ExitCode Run(const RenderOptions& options);

// `reelfx render IN... --into DIR`: many clips with the same options, each to a file of its own.
struct BatchOptions {
    RenderOptions render;  // for each clip; it has an output, whose path is not used
    std::vector<std::string> inputs;
    std::string folder;  // created if needed
};
// The file that a clip is written to: the clip's own name in the folder, with the extension of the container if one is
// chosen.
std::string BatchOutput(const BatchOptions& options, const std::string& input);
// A clip that fails is reported, and the next one is rendered. Returns the code of the first that failed. Throws
// UsageError before anything is rendered if two clips would have the same output, or an output is one of the clips.
ExitCode Run(const BatchOptions& options);

// `reelfx frame`: one frame before and after.
struct PictureOptions {
    InputOptions input;
    std::vector<EffectOptions> effects;  // in order, one at least; of a sheet, one
    std::string out;                     // .png or .jpg
    FramePlace place;                    // of the clip
    std::int32_t width = 0;              // of each picture; 0: the command's own
    int columns = 0;                     // pictures in a row; 0: the command's own
    bool mayOverwrite = false;
};
struct FrameOptions {
    PictureOptions picture;
};
ExitCode Run(const FrameOptions& command);

// `reelfx sheet`: one frame through all presets of an effect, or of each effect. Settings and mix of the effect apply to
// each preset.
struct SheetOptions {
    PictureOptions picture;
    // Write a sheet for each effect: `out` is a folder, which is created if needed, or a name with "%s" for
    // the effect's name, such as "film-pro". Of the effect, only the randomness is used.
    bool allEffects = false;
};
ExitCode Run(const SheetOptions& command);

// `reelfx strip`: successive frames side by side at 100 %, for judging motion where no video can be played.

// A part of a picture, in pixels.
struct Crop {
    FrameSize size;
    std::optional<std::pair<std::int32_t, std::int32_t>>
        corner;  // left, top; nothing: in the middle of the picture
};
// "160x540+880+270", or "160x540".
std::optional<Crop> ParseCrop(const std::string& text);

struct StripOptions {
    PictureOptions picture;  // its width is not used; without a place, the frames in the middle of the clip
    int frames = 12;         // fewer if the clip ends earlier
    // Nothing: the middle of the picture, wide enough for a row of frames to fill a screen.
    std::optional<Crop> crop;
};
ExitCode Run(const StripOptions& options);

// `reelfx list`: the effects with their parameters and presets. UsageError when there is no such effect.
struct ListOptions {
    std::optional<std::string> effect;  // only this one
    bool asJson = false;
};
ExitCode Run(const ListOptions& options);

// `reelfx presets`: the built-in presets of an effect with their settings. UsageError when there is no such effect.
struct PresetsOptions {
    std::string effect;
    bool asJson = false;
};
ExitCode Run(const PresetsOptions& options);

// `reelfx preset show` and `reelfx preset save`: preset files, which editors can also read and write.
struct PresetShowOptions {
    std::string file;
    bool asJson = false;
};
ExitCode Run(const PresetShowOptions& options);

struct PresetSaveOptions {
    std::string file;
    std::string name;  // empty: the file name without its extension
    EffectOptions effect;
    bool mayOverwrite = false;
};
ExitCode Run(const PresetSaveOptions& options);

// `reelfx info`: describes a clip and how it would be rendered.
struct InfoOptions {
    InputOptions input;
    bool asJson = false;
};
ExitCode Run(const InfoOptions& options);

// `reelfx studio`: the effects to play with, on a page in the browser, which the desktop is asked to open. Failure when
// there is no page or no desktop that opens it.
struct StudioOptions {
    bool isPathOnly = false;  // print where the page lies instead of opening it
};
ExitCode Run(const StudioOptions& options);

// A text to print and nothing else: the help, the version.
struct TextCommand {
    std::string text;
};

using Command = std::variant<TextCommand, ListOptions, RenderOptions, BatchOptions, FrameOptions,
                             SheetOptions, StripOptions, PresetShowOptions, PresetSaveOptions, PresetsOptions,
                             InfoOptions, StudioOptions>;

// Parses the arguments (command_line.cpp); opens and writes nothing. Throws UsageError.
Command ReadCommandLine(int count, const char* const* arguments);

// Whether the command reads or writes pictures, and so needs FFmpeg's libraries.
bool NeedsMedia(const Command& command);

// Runs the command. Throws Failure or UsageError; the caller prints their text.
ExitCode RunCommand(const Command& command);

}  // namespace velmora::hosts
