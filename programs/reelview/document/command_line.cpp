#include "programs/reelview/document/command_line.h"

#include <cstddef>

#include "programs/common/settings.h"

namespace velmora::reelview {

ViewOptions ReadViewOptions(const std::vector<std::u16string>& arguments) {
    ViewOptions options;
    for (std::size_t i = 0; i < arguments.size(); ++i) {
        const std::u16string& argument = arguments[i];
        const bool isLibrary = argument == u"--library", isEffect = argument == u"--effect";
        if (isLibrary || isEffect) {
            if (i + 1 == arguments.size()) {
                options.isValid = false;
                break;
            }
            (isLibrary ? options.library : options.effect) = arguments[++i];
        } else if (argument == u"--sequence") {
            options.isSequence = true;
        } else if (argument.starts_with(u"--") || !options.file.empty()) {
            options.isValid = false;
        } else {
            options.file = argument;
        }
    }
    return options;
}

namespace {

// Quoted for the Windows shells. Neither file names nor parameter names contain quotation marks.
std::string Quoted(const std::string& text) {
    return '"' + text + '"';
}

std::string OutputName(const std::string& input) {
    const std::size_t name = input.find_last_of("\\/");
    const std::size_t dot = input.find_last_of('.');
    const bool hasExtension = dot != std::string::npos && (name == std::string::npos || dot > name);
    if (!hasExtension) return input + "-film.mp4";
    return input.substr(0, dot) + "-film" + input.substr(dot);
}

// reelfx itself finds pictures that begin with 0 or 1.
std::string NumberedOptions(const CommandInput& input) {
    if (!input.rate) return "";
    std::string options = " --rate " + std::to_string(input.rate->numerator);
    if (input.rate->denominator != 1) options += '/' + std::to_string(input.rate->denominator);
    if (input.firstNumber > 1) options += " --start-number " + std::to_string(input.firstNumber);
    if (input.count > 0) options += " --frames 0:" + std::to_string(input.count);
    return options;
}

}  // namespace

std::string CommandText(const CommandInput& input, const hosts::EffectInfo& effect, const Values& values) {
    std::string line = "reelfx render " + Quoted(input.path) + ' ' + Quoted(OutputName(input.path)) +
                       NumberedOptions(input) + " --effect " + Quoted(effect.name);
    const Values defaults = DefaultsOf(effect);
    for (std::size_t i = 0; i < effect.params.size() && i < values.size(); ++i) {
        const hosts::ParamInfo& param = effect.params[i];
        if (!param.HoldsValue() || values[i].bits == defaults[i].bits) continue;
        line += " --set " + Quoted(param.name + '=' + hosts::ShownValue(param, values[i]));
    }
    return line;
}

}  // namespace velmora::reelview
