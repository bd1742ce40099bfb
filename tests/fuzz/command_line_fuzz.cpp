// Lines of text as the arguments of reelfx or reelhost; the first line is the program's name. They must be refused
// with a one-line message for the user, or read into options that stay in range. Nothing is opened or run.

#include <algorithm>
#include <cstdint>
#include <string>
#include <string_view>
#include <variant>
#include <vector>

#include "text/number_text.h"
#include "programs/reelfx/commands/commands.h"
#include "programs/reelhost/host_options.h"
#include "tests/fuzz/fuzz_input.h"

namespace {

using namespace velmora::hosts;
using velmora::fuzz::Require;

bool IsSize(const FrameSize& size) {
    return size.width >= 1 && size.width <= 32768 && size.height >= 1 && size.height <= 32768;
}
bool IsRate(const FrameRate& rate) {
    return rate.numerator >= 1 && rate.denominator >= 1;
}

void CheckInput(const InputOptions& input) {
    Require(!input.rawSize || IsSize(*input.rawSize));
    Require(!input.rate || IsRate(*input.rate));
}

// The remaining effect options are read against the effect, except for preset files.
void CheckEffects(std::vector<EffectOptions> effects) {
    Require(!effects.empty());
    for (EffectOptions& effect : effects) effect.presetFile.reset();
    try {
        const EffectList list(effects);
        EffectListSession session = list.NewSession();
        for (const EffectChoice& choice : list.Choices()) {
            const double mix = choice.MixAt({.frame = 1000, .seconds = 33.4});
            Require(mix >= 0.0 && mix <= 1.0);
        }
    } catch (const UsageError& error) {
        Require(*error.what() != '\0');
    }
}

void CheckPicture(const PictureOptions& picture) {
    CheckInput(picture.input);
    CheckEffects(picture.effects);
    Require(picture.place.frame.value_or(0) >= 0 && picture.place.start.value_or(0.0) >= 0.0);
    Require(!picture.place.frame || !picture.place.start);
    Require(picture.columns >= 0 && picture.columns <= 32);
    Require(picture.width == 0 || (picture.width >= 16 && picture.width <= 8192));
}

void Check(const TextCommand& command) {
    Require(!command.text.empty());
}
void Check(const ListOptions&) {}
void Check(const StudioOptions&) {}
void Check(const PresetsOptions& options) {
    Require(!options.effect.empty());
}
void Check(const InfoOptions& options) {
    CheckInput(options.input);
}
void Check(const PresetShowOptions& options) {
    Require(!options.file.empty());
}
void Check(const PresetSaveOptions& options) {
    CheckEffects({options.effect});
}
void Check(const FrameOptions& options) {
    CheckPicture(options.picture);
}
void Check(const SheetOptions& options) {
    CheckPicture(options.picture);
}
void Check(const StripOptions& options) {
    CheckPicture(options.picture);
    Require(options.frames >= 1 && options.frames <= 240);
    Require(!options.crop || IsSize(options.crop->size));
    Require(!options.crop || !options.crop->corner ||
            (options.crop->corner->first >= 0 && options.crop->corner->second >= 0));
}
void Check(const velmora::hosts::RenderOptions& options) {
    CheckInput(options.input);
    CheckEffects(options.effects);
    const SectionOptions& section = options.section;
    Require(section.firstFrame >= 0 && (!section.endFrame || *section.endFrame > section.firstFrame));
    Require(!section.start || *section.start >= 0.0);
    Require(!section.duration || *section.duration > 0.0);
    Require(!section.farm || (section.farm->part >= 1 && section.farm->part <= section.farm->parts));
    Require(options.threads >= 0 && options.threads <= 256);
    Require(options.output || options.withDigests);
}

void Check(const BatchOptions& options) {
    Check(options.render);
    Require(!options.inputs.empty() && !options.folder.empty());
    for (const std::string& input : options.inputs) Require(!BatchOutput(options, input).empty());
}

void ReadForReelhost(std::vector<char*>& arguments) {
    const HostOptions options = ReadHostOptions(static_cast<int>(arguments.size()), arguments.data());
    Require(!options.size || (IsSize(*options.size) && options.rate));
    Require(!options.rate || IsRate(*options.rate));
    Require(!options.frameLimit || *options.frameLimit >= 0);
    Require(options.mode != HostMode::kRender || !options.effect.empty());
}

std::vector<std::string> LinesOf(std::string text) {
    std::replace(text.begin(), text.end(), '\0', ' ');  // a zero would end the argument
    std::vector<std::string> lines;
    for (std::size_t at = 0; at <= text.size() && lines.size() < 64;) {
        const std::size_t end = std::min(text.find('\n', at), text.size());
        lines.push_back(text.substr(at, end - at));
        at = end + 1;
    }
    return lines;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    std::vector<std::string> lines = LinesOf(std::string(reinterpret_cast<const char*>(data), size));
    if (lines.back().empty()) lines.pop_back();  // after the final line break
    if (lines.empty()) return 0;
    std::vector<char*> arguments;
    arguments.reserve(lines.size());
    for (std::string& line : lines) arguments.push_back(line.data());
    try {
        if (lines.front() == "reelhost") {
            ReadForReelhost(arguments);
        } else {
            const Command command = ReadCommandLine(static_cast<int>(arguments.size()), arguments.data());
            std::visit([](const auto& options) { Check(options); }, command);
        }
    } catch (const UsageError& error) {
        Require(*error.what() != '\0');
    }
    return 0;
}
