#include "programs/reelfx/commands/commands.h"

#include <CLI/CLI.hpp>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <limits>
#include <map>
#include <set>
#include <sstream>
#include <utility>

#include "text/names.h"
#include "text/number_text.h"
#include "programs/common/effect_info.h"
#include "programs/reelfx/commands/command_options.h"
#include "programs/reelfx/common/output_place.h"

namespace velmora::hosts {
namespace {

constexpr char kRateText[] = "a rate like 25 or 30000/1001";
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
        const std::int64_t most = end.value_or(std::numeric_limits<std::int64_t>::max());
        if (!first || *first < 0 || *first >= most || (!endText.empty() && !end)) {
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
    input.path = LocalPath(input.path);
    if (!typed.size.empty()) {
        input.rawSize = Parsed("--size", typed.size, ParseSize, "a size like 1920x1080");
    }
    if (!typed.rate.empty()) input.rate = Parsed("--rate", typed.rate, ParseRate, kRateText);
    if (!typed.startNumber.empty()) {
        input.startNumber = Parsed("--start-number", typed.startNumber, ParseInteger, "a whole number");
        if (*input.startNumber < 0) throw UsageError("--start-number takes a number from 0");
    }
    return input;
}

std::uint32_t ReadSeed(const std::string& text) {
    const auto seed = Parsed("--seed", text, ParseInteger, "a whole number");
    if (seed < 0 || seed > 0xFFFFFFFFll) throw UsageError("--seed takes a number from 0 to 4294967295");
    return static_cast<std::uint32_t>(seed);
}

std::string FromEnvironment(const char* name) {
    const char* const value = std::getenv(name);
    return value == nullptr ? "" : value;
}

// The effects of a command, told apart by the order in which the options were typed.
class EffectReader {
  public:
    EffectReader(const CLI::App& command, const TypedOptions& typed) : m_typed(typed) {
        if (const std::string seed = FromEnvironment("REELFX_SEED"); !seed.empty())
            m_list.front().seed = ReadSeed(seed);
        for (const CLI::Option* option : command.parse_order()) Take(option->get_name());
        EffectOptions& first = m_list.front();
        if (first.effect.empty() && !first.presetFile) first.effect = FromEnvironment("REELFX_EFFECT");
        if (typed.randomState.empty()) return;
        for (EffectOptions& effect : m_list) {
            effect.randomState =
                Parsed("--random-state", typed.randomState, ParseHexWord, "up to 8 hex digits");
        }
    }

    [[nodiscard]] const std::vector<EffectOptions>& List() const { return m_list; }

  private:
    void Take(const std::string& option) {
        EffectOptions& effect = m_list.back();
        if (option == "--then") {
            m_list.push_back({.seed = effect.seed});
            m_given.clear();
        } else if (option == "--set") {
            effect.settings.push_back(NextOf(option, m_typed.settings));
        } else if (option == "--effect") {
            effect.effect = OnlyOf(option, m_typed.effects);
        } else if (option == "--preset") {
            effect.preset = OnlyOf(option, m_typed.presets);
        } else if (option == "--preset-file") {
            effect.presetFile = OnlyOf(option, m_typed.presetFiles);
        } else if (option == "--mix") {
            effect.mix = OnlyOf(option, m_typed.mixes);
        } else if (option == "--seed") {
            effect.seed = ReadSeed(OnlyOf(option, m_typed.seeds));
        }
    }

    // `values` are all that were typed for the option.
    std::string NextOf(const std::string& option, const std::vector<std::string>& values) {
        return values.at(m_taken[option]++);
    }

    std::string OnlyOf(const std::string& option, const std::vector<std::string>& values) {
        if (!m_given.insert(option).second) {
            throw UsageError(option + " is given twice for one effect; --then begins another effect");
        }
        return NextOf(option, values);
    }

    const TypedOptions& m_typed;
    std::vector<EffectOptions> m_list = std::vector<EffectOptions>(1);
    std::map<std::string, std::size_t> m_taken;
    std::set<std::string> m_given;  // for the last effect
};

std::vector<EffectOptions> ReadEffects(const CLI::App& command, const TypedOptions& typed) {
    return EffectReader(command, typed).List();
}

ProgressKind ReadProgress(const TypedOptions& typed) {
    if (typed.quiet || typed.progress == "none") return ProgressKind::kNone;
    if (typed.progress == "auto") return ProgressKind::kAuto;
    if (typed.progress == "text") return ProgressKind::kText;
    if (typed.progress == "json") return ProgressKind::kJson;
    throw UsageError("--progress takes auto, none, text or json, not \"" + typed.progress + '"');
}

OutputOptions ReadOutput(const TypedOptions& typed) {
    OutputOptions output = typed.output;
    output.path = LocalPath(typed.outPath);
    output.format = Given(typed.format);
    output.codec = Given(typed.codec);
    output.pixelFormat = Given(typed.pixelFormat);
    if (!typed.crf.empty()) output.crf = Parsed("--crf", typed.crf, ParseNumber, "a number");
    output.needsAlpha = typed.matte;
    if (!typed.fps.empty()) output.fps = Parsed("--fps", typed.fps, ParseRate, kRateText);
    return output;
}

RenderOptions ReadRender(const CLI::App& command, const TypedOptions& typed) {
    RenderOptions options;
    options.input = ReadInput(typed);
    options.effects = ReadEffects(command, typed);
    options.section = ReadSection(typed);
    if (!typed.outPath.empty() || !typed.into.empty()) {
        options.output = ReadOutput(typed);
    } else if (!typed.digests) {
        throw UsageError("render needs OUT, or --hash to print digests only");
    }
    if (typed.digests && typed.outPath == "-")
        throw UsageError("--hash and OUT - both write to standard output");
    options.threads = typed.threads;
    if (typed.depth == "8") options.depth = SampleType::kBytes;
    if (typed.depth == "16") options.depth = SampleType::kWords;
    if (typed.depth == "float") options.depth = SampleType::kFloats;
    options.mayOverwrite = typed.overwrite;
    options.isMatte = typed.matte;
    options.withSound = !typed.noSound && !typed.matte && !options.section.farm;
    options.withDigests = typed.digests;
    options.isDryRun = typed.dryRun;
    options.progress = ReadProgress(typed);
    return options;
}

// One clip, or with --into many.
Command ReadRenders(const CLI::App& command, const TypedOptions& typed) {
    RenderOptions render = ReadRender(command, typed);
    if (typed.into.empty()) {
        if (!typed.more.empty()) throw UsageError("more than IN and OUT: several clips need --into FOLDER");
        return render;
    }
    if (typed.digests) throw UsageError("--hash prints the digests of one clip, not of several with --into");
    BatchOptions batch = {
        .render = std::move(render), .inputs = {typed.input.path}, .folder = LocalPath(typed.into)};
    if (!typed.outPath.empty()) batch.inputs.push_back(typed.outPath);
    batch.inputs.insert(batch.inputs.end(), typed.more.begin(), typed.more.end());
    for (std::string& input : batch.inputs) input = LocalPath(input);
    return batch;
}

PictureOptions ReadPicture(const CLI::App& command, const TypedOptions& typed) {
    PictureOptions options = typed.picture;
    options.input = ReadInput(typed);
    options.out = LocalPath(options.out);
    options.effects = ReadEffects(command, typed);
    options.mayOverwrite = typed.overwrite;
    if (!typed.start.empty()) options.place.start = Parsed("--start", typed.start, ParseTime, kTimeText);
    return options;
}

SheetOptions ReadSheet(const CLI::App& command, const TypedOptions& typed) {
    // An effect from the environment is only a default, which --all ignores.
    const bool isOfOne = std::ranges::any_of(command.parse_order(), [](const CLI::Option* option) {
        const std::string name = option->get_name();
        return name == "--effect" || name == "--set" || name == "--mix";
    });
    if (typed.allSheets && isOfOne) {
        throw UsageError("--all renders all presets of all effects: leave out --effect, --set and --mix");
    }
    return {.picture = ReadPicture(command, typed), .allEffects = typed.allSheets};
}

StripOptions ReadStrip(const CLI::App& command, const TypedOptions& typed) {
    StripOptions options = {.picture = ReadPicture(command, typed), .frames = typed.stripFrames, .crop = {}};
    if (!typed.crop.empty())
        options.crop = Parsed("--crop", typed.crop, ParseCrop, "a part like 160x540+880+270");
    return options;
}

PresetSaveOptions ReadPresetSave(const CLI::App& command, const TypedOptions& typed) {
    PresetSaveOptions options = typed.presetSave;
    options.effect = ReadEffects(command, typed).front();
    options.mayOverwrite = typed.overwrite;
    return options;
}

ListOptions ReadList(const TypedOptions& typed) {
    return {.effect = Given(typed.listEffect), .asJson = typed.list.asJson};
}

struct CommandReader {
    const char* command;  // the last word of it
    Command (*read)(const CLI::App& command, const TypedOptions& typed);
};
constexpr CommandReader kCommands[] = {
    {"list", [](const CLI::App&, const TypedOptions& typed) -> Command { return ReadList(typed); }},
    {"presets", [](const CLI::App&, const TypedOptions& typed) -> Command { return typed.presetsOf; }},
    {"render", ReadRenders},
    {"frame",
     [](const CLI::App& c, const TypedOptions& typed) -> Command {
         return FrameOptions{ReadPicture(c, typed)};
     }},
    {"sheet", [](const CLI::App& c, const TypedOptions& typed) -> Command { return ReadSheet(c, typed); }},
    {"strip", [](const CLI::App& c, const TypedOptions& typed) -> Command { return ReadStrip(c, typed); }},
    {"show", [](const CLI::App&, const TypedOptions& typed) -> Command { return typed.presetShow; }},
    {"save",
     [](const CLI::App& c, const TypedOptions& typed) -> Command { return ReadPresetSave(c, typed); }},
    {"info",
     [](const CLI::App&, const TypedOptions& typed) -> Command {
         return InfoOptions{ReadInput(typed), typed.info.asJson};
     }},
    {"studio", [](const CLI::App&, const TypedOptions& typed) -> Command { return typed.studio; }},
};

// The command that was typed, the inner one of "preset show".
const CLI::App& CommandOf(const CLI::App& app) {
    const CLI::App* command = &app;
    while (!command->get_subcommands().empty()) command = command->get_subcommands().front();
    return *command;
}

std::vector<std::string> OptionsOf(const CLI::App& command) {
    std::vector<std::string> names;
    for (const CLI::Option* option : command.get_options()) {
        if (option->get_name().starts_with("--")) names.push_back(option->get_name());
    }
    return names;
}

std::string CommandMissing(const CLI::App& group) {
    std::vector<std::string> names;
    for (const CLI::App* command : group.get_subcommands([](const CLI::App*) { return true; }))
        names.push_back(command->get_name());
    const std::vector<std::string> typed = group.remaining();
    if (typed.empty()) return "a command is missing; there are " + QuotedList(names);
    return std::string(typed.front().starts_with('-') ? "there is no option \"" : "there is no command \"") +
           typed.front() + '"' + InsteadOf(typed.front(), names, "there are the commands");
}

// In the order typed.
std::string Unexpected(const CLI::App& command, const std::string& otherwise) {
    const std::vector<std::string> typed = command.remaining();
    const auto option =
        std::ranges::find_if(typed, [](const std::string& word) { return word.starts_with('-'); });
    if (option != typed.end()) {
        const std::string name = option->substr(0, option->find('='));
        const auto nearest = NearestName(name, OptionsOf(command));
        return command.get_name() + " has no option \"" + name + '"' +
               (nearest ? "; did you mean \"" + *nearest + "\"?" : "");
    }
    return typed.empty() ? otherwise : "not expected: " + QuotedList(typed);
}

// What is wrong with a command line, for its user.
std::string Explain(const CLI::App& app, const CLI::ParseError& error) {
    const CLI::App& command = CommandOf(app);
    if (dynamic_cast<const CLI::ExtrasError*>(&error) != nullptr) return Unexpected(command, error.what());
    // The parser asks for a command before it looks at what was typed in its place.
    const bool isGroup = !command.get_subcommands([](const CLI::App*) { return true; }).empty();
    return dynamic_cast<const CLI::RequiredError*>(&error) != nullptr && isGroup ? CommandMissing(command)
                                                                                 : error.what();
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
        const std::string what = Explain(app, error);
        throw UsageError(what + (what.ends_with('?') ? " See" : "; see") + " reelfx --help");
    }
    const CLI::App& command = CommandOf(app);
    const auto* const reader = std::ranges::find(kCommands, command.get_name(), &CommandReader::command);
    return reader->read(command, typed);
}

namespace {

ExitCode Run(const TextCommand& command) {
    std::fputs(command.text.c_str(), stdout);
    return kExitDone;
}

}  // namespace

bool NeedsMedia(const Command& command) {
    return !std::holds_alternative<TextCommand>(command) && !std::holds_alternative<ListOptions>(command) &&
           !std::holds_alternative<PresetsOptions>(command) &&
           !std::holds_alternative<PresetShowOptions>(command) &&
           !std::holds_alternative<PresetSaveOptions>(command) &&
           !std::holds_alternative<StudioOptions>(command);
}

ExitCode RunCommand(const Command& command) {
    return std::visit([](const auto& options) { return Run(options); }, command);
}

}  // namespace velmora::hosts
