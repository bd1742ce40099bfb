#include "hosts/reelfx/command_line.h"

#include <CLI/CLI.hpp>

#include <cstdio>
#include <sstream>

#include "hosts/common/number_text.h"
#include "hosts/common/usage_error.h"

namespace velmora::hosts {
namespace {

constexpr const char* kExitCodes =
    "Exit codes: 0 done, 1 internal failure, 2 command line, 3 input, 4 output, 130 interrupted.\n"
    "Ctrl-C keeps the frames finished so far as a playable file, unless OUT replaces an older one; a second "
    "Ctrl-C keeps nothing.";

// Runs `parse` over an option's text; nothing read is a usage error that says what is expected.
template <class Parse>
auto Parsed(const char* option, const std::string& text, Parse parse, const char* expected) {
    const auto value = parse(text);
    if (!value) throw UsageError(std::string(option) + " takes " + expected + ", not \"" + text + '"');
    return *value;
}

// Options as they are typed, before they are read.
struct Typed {
    InputOptions input;
    EffectOptions effect;
    OutputOptions output;
    std::string outPath, size, rate, seed = "0", randomState, preset, presetFile, frames, start, duration;
    std::string format, codec, crf, pixelFormat;
    int threads = 0;
    bool overwrite = false, noSound = false, digests = false, quiet = false;
    ListOptions list;
    std::string listEffect;
    PictureOptions picture;
    PresetShowOptions presetShow;
    PresetSaveOptions presetSave;
};

std::optional<std::string> Given(const std::string& text) {
    return text.empty() ? std::nullopt : std::optional(text);
}

void AddInput(CLI::App& command, Typed& typed) {
    command
        .add_option("IN", typed.input.path, "Clip, still, image sequence (frames-%03d.png) or - (YUV4MPEG2)")
        ->required();
    command.add_option("--size", typed.size, "IN is raw BGRA of this size")->type_name("WxH");
    command.add_option("--rate", typed.rate, "Frame rate of raw BGRA and image sequences")->type_name("FPS");
}

void AddEffect(CLI::App& command, Typed& typed) {
    command.add_option("--effect,-e", typed.effect.effect, "Effect, see reelfx list")
        ->type_name("NAME")
        ->envname("REELFX_EFFECT");
    command.add_option("--preset,-p", typed.preset, "Preset of the effect")->type_name("NAME");
    command.add_option("--preset-file", typed.presetFile, "Preset file, as editors save it")
        ->type_name("FILE");
    command.add_option("--set,-s", typed.effect.settings, "One parameter, after the preset; repeatable")
        ->type_name("NAME=VALUE")
        ->allow_extra_args(false);
}

void AddRandom(CLI::App& command, Typed& typed) {
    command.add_option("--seed", typed.seed, "Another seed gives other damage")
        ->type_name("N")
        ->capture_default_str()
        ->envname("REELFX_SEED");
    command
        .add_option("--random-state", typed.randomState,
                    "Play one random sequence from this state, as a host of the library does")
        ->type_name("HEX");
}

void AddRender(CLI::App& app, Typed& typed) {
    CLI::App& render = *app.add_subcommand("render", "Render a clip through an effect");
    AddInput(render, typed);
    render.add_option("OUT", typed.outPath, "File, image pattern, or - (YUV4MPEG2)");
    AddEffect(render, typed);
    AddRandom(render, typed);
    render.add_option("--frames", typed.frames, "Frames A up to but not including B; either may be left out")
        ->type_name("A:B");
    render.add_option("--start", typed.start, "Begin at this time of the clip")->type_name("TIME");
    render.add_option("--duration", typed.duration, "Length of the part")->type_name("TIME");
    render.add_option("--threads,-j", typed.threads, "Frames rendered at once; 0: all processors")
        ->check(CLI::Range(0, 256))
        ->envname("REELFX_THREADS");
    render.add_option("--format", typed.format, "Container, where OUT's ending does not tell");
    render.add_option("--codec", typed.codec, "Codec of the picture")->envname("REELFX_CODEC");
    render.add_option("--crf", typed.crf, "Quality in the codec's own scale")->envname("REELFX_CRF");
    render.add_option("--pix-fmt", typed.pixelFormat, "Pixel format; default: the source's");
    render.add_flag("--raw-bgra", typed.output.isRawBgra, "OUT is raw BGRA frames");
    render.add_flag("--hash", typed.digests, "Print the MD5 of each frame's BGRA; OUT may be left out");
    render.add_flag("--no-sound", typed.noSound, "Leave sound and subtitles out");
    render.add_flag("--overwrite,-y", typed.overwrite, "Replace an existing OUT");
    render.add_flag("--quiet,-q", typed.quiet, "No progress line");
}

CLI::App& AddPicture(CLI::App& app, Typed& typed, const char* name, const char* what) {
    CLI::App& command = *app.add_subcommand(name, what);
    AddInput(command, typed);
    command.add_option("OUT", typed.picture.out, "PNG or JPEG")->required();
    AddEffect(command, typed);
    AddRandom(command, typed);
    command.add_option("--frame,-n", typed.picture.frame, "Frame of the clip, counted from 0")
        ->type_name("N")
        ->check(CLI::NonNegativeNumber);
    command.add_option("--width", typed.picture.width, "Width of each picture in pixels")
        ->type_name("W")
        ->check(CLI::Range(16, 8192));
    command.add_flag("--overwrite,-y", typed.overwrite, "Replace an existing OUT");
    return command;
}

void AddPreset(CLI::App& app, Typed& typed) {
    CLI::App& preset = *app.add_subcommand("preset", "Show and save preset files");
    preset.require_subcommand(1);
    CLI::App& show = *preset.add_subcommand("show", "Print what a preset file holds");
    show.add_option("FILE", typed.presetShow.file)->required();
    show.add_flag("--json", typed.presetShow.asJson, "As JSON");
    CLI::App& save = *preset.add_subcommand("save", "Write settings as a preset file");
    save.add_option("FILE", typed.presetSave.file)->required();
    AddEffect(save, typed);
    save.add_option("--name", typed.presetSave.name, "The preset's name; default: the file's");
    save.add_flag("--overwrite,-y", typed.overwrite, "Replace an existing FILE");
}

void AddList(CLI::App& app, Typed& typed) {
    CLI::App& list = *app.add_subcommand("list", "List effects, parameters and presets");
    list.add_option("EFFECT", typed.listEffect, "Only this effect");
    list.add_flag("--json", typed.list.asJson, "As JSON");
}

SectionOptions ReadSection(const Typed& typed) {
    SectionOptions section;
    if (!typed.frames.empty()) {
        const std::size_t colon = typed.frames.find(':');
        const auto first = ParseInteger(colon == 0 ? "0" : typed.frames.substr(0, colon));
        const std::string endText = colon == std::string::npos ? "?" : typed.frames.substr(colon + 1);
        const auto end = endText.empty() ? std::nullopt : ParseInteger(endText);
        if (!first || *first < 0 || (!endText.empty() && (!end || *end <= *first))) {
            throw UsageError("--frames takes A:B with A below B, counted from 0, not \"" + typed.frames +
                             '"');
        }
        section.firstFrame = *first;
        section.endFrame = end;
    }
    constexpr const char* kTime = "seconds or HH:MM:SS";
    if (!typed.start.empty()) section.start = Parsed("--start", typed.start, ParseTime, kTime);
    if (!typed.duration.empty()) {
        section.duration = Parsed("--duration", typed.duration, ParseTime, kTime);
        if (*section.duration <= 0.0) throw UsageError("--duration must be longer than nothing");
    }
    if (!typed.frames.empty() && (section.start || section.duration)) {
        throw UsageError("--frames does not go with --start and --duration");
    }
    return section;
}

InputOptions ReadInput(const Typed& typed) {
    InputOptions input = typed.input;
    if (!typed.size.empty()) {
        input.rawSize = Parsed("--size", typed.size, ParseSize, "a size like 1920x1080");
    }
    if (!typed.rate.empty())
        input.rate = Parsed("--rate", typed.rate, ParseRate, "a rate like 25 or 30000/1001");
    return input;
}

EffectOptions ReadEffect(const Typed& typed) {
    EffectOptions effect = typed.effect;
    effect.preset = Given(typed.preset);
    effect.presetFile = Given(typed.presetFile);
    const auto seed = Parsed("--seed", typed.seed, ParseInteger, "a whole number");
    if (seed < 0 || seed > 0xFFFFFFFFll) throw UsageError("--seed takes a number from 0 to 4294967295");
    effect.seed = static_cast<std::uint32_t>(seed);
    if (!typed.randomState.empty()) {
        effect.randomState = Parsed("--random-state", typed.randomState, ParseHexWord, "up to 8 hex digits");
    }
    return effect;
}

RenderOptions ReadRender(const Typed& typed) {
    RenderOptions options;
    options.input = ReadInput(typed);
    options.effect = ReadEffect(typed);
    options.section = ReadSection(typed);
    if (!typed.outPath.empty()) {
        OutputOptions output = typed.output;
        output.path = typed.outPath;
        output.format = Given(typed.format);
        output.codec = Given(typed.codec);
        output.pixelFormat = Given(typed.pixelFormat);
        if (!typed.crf.empty()) output.crf = Parsed("--crf", typed.crf, ParseNumber, "a number");
        options.output = output;
    } else if (!typed.digests) {
        throw UsageError("render needs OUT, or --hash for digests alone");
    }
    if (typed.digests && typed.outPath == "-")
        throw UsageError("--hash and OUT - both write standard output");
    options.threads = typed.threads;
    options.mayOverwrite = typed.overwrite;
    options.withSound = !typed.noSound;
    options.withDigests = typed.digests;
    options.isQuiet = typed.quiet;
    return options;
}

PictureOptions ReadPicture(const Typed& typed) {
    PictureOptions options = typed.picture;
    options.input = ReadInput(typed);
    options.effect = ReadEffect(typed);
    options.mayOverwrite = typed.overwrite;
    return options;
}

PresetSaveOptions ReadPresetSave(const Typed& typed) {
    PresetSaveOptions options = typed.presetSave;
    options.effect = ReadEffect(typed);
    options.mayOverwrite = typed.overwrite;
    return options;
}

}  // namespace

Command ReadCommandLine(int count, const char* const* arguments) {
    Typed typed;
    CLI::App app("The look of old film for any footage.", "reelfx");
    app.footer(kExitCodes);
    app.set_version_flag("--version", "reelfx 1.0");
    app.require_subcommand(1);
    AddList(app, typed);
    AddRender(app, typed);
    AddPicture(app, typed, "frame", "Write one frame before and after, side by side");
    AddPicture(app, typed, "sheet", "Write one frame through all presets of an effect")
        .add_option("--columns", typed.picture.columns, "Pictures in a row")
        ->check(CLI::Range(1, 32));
    AddPreset(app, typed);
    try {
        app.parse(count, arguments);
    } catch (const CLI::Success& wish) {
        std::ostringstream text;
        app.exit(wish, text, text);  // writes the help or the version
        return TextCommand{text.str()};
    } catch (const CLI::ParseError& error) {
        throw UsageError(std::string(error.what()) + "; see reelfx --help");
    }
    if (app.got_subcommand("list")) {
        typed.list.effect = Given(typed.listEffect);
        return typed.list;
    }
    if (app.got_subcommand("frame")) return FrameCommand{ReadPicture(typed)};
    if (app.got_subcommand("sheet")) return SheetCommand{ReadPicture(typed)};
    if (const CLI::App* preset = app.get_subcommand("preset"); preset->parsed()) {
        if (preset->got_subcommand("show")) return typed.presetShow;
        return ReadPresetSave(typed);
    }
    return ReadRender(typed);
}

namespace {

ExitCode Run(const TextCommand& command) {
    std::fputs(command.text.c_str(), stdout);
    return kExitDone;
}
ExitCode Run(const ListOptions& options) {
    return RunList(options);
}
ExitCode Run(const RenderOptions& options) {
    return RunRender(options);
}
ExitCode Run(const FrameCommand& command) {
    return RunFrame(command.options);
}
ExitCode Run(const SheetCommand& command) {
    return RunSheet(command.options);
}
ExitCode Run(const PresetShowOptions& options) {
    return RunPresetShow(options);
}
ExitCode Run(const PresetSaveOptions& options) {
    return RunPresetSave(options);
}

}  // namespace

ExitCode RunCommand(const Command& command) {
    return std::visit([](const auto& options) { return Run(options); }, command);
}

}  // namespace velmora::hosts
