#include "programs/reelfx/commands/command_line.h"

#include <CLI/CLI.hpp>

#include <cstdio>
#include <cstdlib>
#include <sstream>

#include "text/number_text.h"
#include "programs/common/effect_info.h"
#include "programs/common/usage_error.h"
#include "programs/reelfx/commands/command_options.h"

namespace velmora::hosts {
namespace {

constexpr char kTimeText[] = "seconds or HH:MM:SS";

// Parses the text of an option; a failure is a usage error that says what is expected.
template <class Parse>
auto Parsed(const char* option, const std::string& text, Parse parse, const char* expected) {
    const auto value = parse(text);
    if (!value) throw UsageError(std::string(option) + " takes " + expected + ", not \"" + text + '"');
    return *value;
}

std::optional<std::string> Given(const std::string& text) {
    return text.empty() ? std::nullopt : std::optional(text);
}

FarmPart ReadFarm(const std::string& text) {
    const std::size_t slash = text.find('/');
    const auto part = ParseInteger(text.substr(0, slash));
    const auto parts = slash == std::string::npos ? std::nullopt : ParseInteger(text.substr(slash + 1));
    if (!part || !parts || *part < 1 || *part > *parts) {
        throw UsageError("--farm takes N/M, part N of M counted from 1, not \"" + text + '"');
    }
    return {*part, *parts};
}

SectionOptions ReadSection(const TypedOptions& typed) {
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
    if (!typed.farm.empty()) section.farm = ReadFarm(typed.farm);
    if (!typed.start.empty()) section.start = Parsed("--start", typed.start, ParseTime, kTimeText);
    if (!typed.duration.empty()) {
        section.duration = Parsed("--duration", typed.duration, ParseTime, kTimeText);
        if (*section.duration <= 0.0) throw UsageError("--duration must be greater than 0");
    }
    if (!typed.frames.empty() && (section.start || section.duration)) {
        throw UsageError("--frames cannot be combined with --start or --duration");
    }
    if (section.farm && (!typed.frames.empty() || section.start || section.duration)) {
        throw UsageError("--farm cannot be combined with --frames, --start or --duration");
    }
    if (section.farm && !typed.randomState.empty()) {
        throw UsageError(
            "--farm cannot be combined with --random-state, whose sequence runs through the whole clip");
    }
    return section;
}

InputOptions ReadInput(const TypedOptions& typed) {
    InputOptions input = typed.input;
    if (!typed.size.empty()) {
        input.rawSize = Parsed("--size", typed.size, ParseSize, "a size like 1920x1080");
    }
    if (!typed.rate.empty())
        input.rate = Parsed("--rate", typed.rate, ParseRate, "a rate like 25 or 30000/1001");
    return input;
}

EffectOptions ReadEffect(const TypedOptions& typed) {
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

ProgressKind ReadProgress(const TypedOptions& typed) {
    if (typed.quiet || typed.progress == "none") return ProgressKind::kNone;
    if (typed.progress == "auto") return ProgressKind::kAuto;
    if (typed.progress == "text") return ProgressKind::kText;
    if (typed.progress == "json") return ProgressKind::kJson;
    throw UsageError("--progress takes auto, none, text or json, not \"" + typed.progress + '"');
}

RenderOptions ReadRender(const TypedOptions& typed) {
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
        output.needsAlpha = typed.matte;
        options.output = output;
    } else if (!typed.digests) {
        throw UsageError("render needs OUT, or --hash to print digests only");
    }
    if (typed.digests && typed.outPath == "-")
        throw UsageError("--hash and OUT - both write to standard output");
    options.threads = typed.threads;
    options.mayOverwrite = typed.overwrite;
    options.isMatte = typed.matte;
    options.withSound = !typed.noSound && !typed.matte && !options.section.farm;
    options.withDigests = typed.digests;
    options.isDryRun = typed.dryRun;
    options.progress = ReadProgress(typed);
    return options;
}

PictureOptions ReadPicture(const TypedOptions& typed) {
    PictureOptions options = typed.picture;
    options.input = ReadInput(typed);
    options.effect = ReadEffect(typed);
    options.mayOverwrite = typed.overwrite;
    if (!typed.start.empty()) options.place.start = Parsed("--start", typed.start, ParseTime, kTimeText);
    return options;
}

// An effect from the environment is only a default, which --all ignores.
bool NamesEffect(const EffectOptions& effect) {
    const char* const fallback = std::getenv("REELFX_EFFECT");
    return (!effect.effect.empty() && (fallback == nullptr || effect.effect != fallback)) || effect.preset ||
           effect.presetFile || !effect.settings.empty();
}

PictureOptions ReadSheet(const TypedOptions& typed) {
    PictureOptions options = ReadPicture(typed);
    if (options.allEffects && NamesEffect(options.effect)) {
        throw UsageError(
            "--all renders all presets of all effects: leave out --effect, --preset, --preset-file and "
            "--set");
    }
    return options;
}

StripOptions ReadStrip(const TypedOptions& typed) {
    StripOptions options = {.picture = ReadPicture(typed), .frames = typed.stripFrames, .crop = {}};
    if (!typed.crop.empty())
        options.crop = Parsed("--crop", typed.crop, ParseCrop, "a part like 160x540+880+270");
    return options;
}

PresetSaveOptions ReadPresetSave(const TypedOptions& typed) {
    PresetSaveOptions options = typed.presetSave;
    options.effect = ReadEffect(typed);
    options.mayOverwrite = typed.overwrite;
    return options;
}

}  // namespace

namespace {

// The parser asks for a command before it looks at what was typed in its place.
std::string Explain(const CLI::App& app, const CLI::ParseError& error) {
    const CLI::App* group = &app;
    while (!group->get_subcommands().empty()) group = group->get_subcommands().front();
    const auto commands = group->get_subcommands([](const CLI::App*) { return true; });
    if (dynamic_cast<const CLI::RequiredError*>(&error) == nullptr || commands.empty()) return error.what();
    std::vector<std::string> names;
    names.reserve(commands.size());
    for (const CLI::App* command : commands) names.push_back(command->get_name());
    const std::vector<std::string> typed = group->remaining();
    if (typed.empty()) return "a command is missing; there are " + QuotedList(names);
    return std::string(typed.front().starts_with('-') ? "there is no option \"" : "there is no command \"") +
           typed.front() + "\"; there are the commands " + QuotedList(names);
}

}  // namespace

Command ReadCommandLine(int count, const char* const* arguments) {
    TypedOptions typed;
    CLI::App app;
    AddCommands(app, typed);
    try {
        app.parse(count, arguments);
    } catch (const CLI::Success& wish) {
        std::ostringstream text;
        app.exit(wish, text, text);  // writes the help or the version
        return TextCommand{text.str()};
    } catch (const CLI::ParseError& error) {
        throw UsageError(Explain(app, error) + "; see reelfx --help");
    }
    if (app.got_subcommand("list")) {
        typed.list.effect = Given(typed.listEffect);
        return typed.list;
    }
    if (app.got_subcommand("presets")) return typed.presets;
    if (app.got_subcommand("studio")) return typed.studio;
    if (app.got_subcommand("info")) return InfoOptions{ReadInput(typed), typed.info.asJson};
    if (app.got_subcommand("frame")) return FrameCommand{ReadPicture(typed)};
    if (app.got_subcommand("sheet")) return SheetCommand{ReadSheet(typed)};
    if (app.got_subcommand("strip")) return ReadStrip(typed);
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
ExitCode Run(const PresetsOptions& options) {
    return RunPresets(options);
}
ExitCode Run(const InfoOptions& options) {
    return RunInfo(options);
}
ExitCode Run(const StudioOptions& options) {
    return RunStudio(options);
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
ExitCode Run(const StripOptions& options) {
    return RunStrip(options);
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
