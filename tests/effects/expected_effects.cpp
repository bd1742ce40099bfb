#include "tests/effects/expected_effects.h"

#include <bit>
#include <cstdlib>
#include <sstream>
#include <stdexcept>

namespace velmora::tests {
namespace {

constexpr char kText[] =
#include "effects_text.inc"
    ;

std::vector<std::string> SplitFields(const std::string& line) {
    std::vector<std::string> fields;
    constexpr char kBar[] = " | ";
    std::size_t from = 0;
    for (std::size_t to; (to = line.find(kBar, from)) != std::string::npos; from = to + 3) {
        fields.push_back(line.substr(from, to - from));
    }
    fields.push_back(line.substr(from));
    return fields;
}

std::vector<std::string> SplitWords(const std::string& text) {
    std::istringstream stream(text);
    std::vector<std::string> words;
    for (std::string word; stream >> word;) words.push_back(word);
    return words;
}

std::uint32_t HexWord(const std::string& text) {
    return static_cast<std::uint32_t>(std::stoul(text, nullptr, 16));
}

ParamKind KindOf(const std::string& word) {
    if (word == "slider") return kKindSlider;
    if (word == "colour") return kKindColour;
    if (word == "check") return kKindCheckBox;
    if (word == "menu") return kKindMenu;
    if (word == "group") return kKindGroup;
    throw std::runtime_error("unknown line: " + word);
}

ExpectedParam ReadParam(const std::vector<std::string>& fields) {
    ExpectedParam param;
    param.kind = KindOf(fields[0]);
    param.name = fields.at(1);
    param.defaultShown = fields.at(2);
    if (param.kind == kKindSlider) {
        const std::size_t dots = fields[2].find("..");
        param.minimum = std::stol(fields[2].substr(0, dots));
        param.maximum = std::stol(fields[2].substr(dots + 2));
        param.defaultShown = fields.at(3);
    } else if (param.kind == kKindGroup) {
        param.isGroupEnd = fields[2] == "end";
        param.groupWord = HexWord(fields.at(3));
    }
    const std::vector<std::string> layout = SplitWords(fields.back());
    for (std::size_t i = 0; i < 4; ++i) param.layout[i] = std::stoi(layout.at(i));
    return param;
}

std::vector<ExpectedEffect> ReadText() {
    std::vector<ExpectedEffect> effects;
    std::istringstream stream(kText);
    for (std::string line; std::getline(stream, line);) {
        if (line.empty() || line[0] == '#') continue;
        const std::vector<std::string> fields = SplitFields(line);
        if (line.starts_with("effect ")) {
            effects.push_back({line.substr(7), {}, {}, {}});
        } else if (fields[0] == "preset") {
            effects.back().presets.push_back({fields.at(1), SplitWords(fields.at(2))});
        } else if (fields[0] == "answers") {
            effects.back().answers.assign(fields.begin() + 1, fields.end());
        } else {
            effects.back().params.push_back(ReadParam(fields));
        }
    }
    return effects;
}

// "-57" and "32.5" as whole hundredths.
long Hundredths(const std::string& text) {
    const std::size_t point = text.find('.');
    if (point == std::string::npos) return std::stol(text) * 100;
    std::string digits = text.substr(point + 1);
    digits.resize(2, '0');
    const long whole = std::labs(std::stol(text.substr(0, point))) * 100 + std::stol(digits);
    return text[0] == '-' ? -whole : whole;
}

std::uint32_t ItemOf(const std::string& text) {
    const char* const items[] = {"Wavy", "Blotchy", "Grainy", "Fine", "Splotchy", "Lite", "Crackly"};
    for (std::uint32_t i = 0; i < 7; ++i) {
        if (text == items[i]) return i;
    }
    throw std::runtime_error("unknown pattern: " + text);
}

}  // namespace

const std::vector<ExpectedEffect>& ExpectedEffects() {
    static const std::vector<ExpectedEffect> effects = ReadText();
    return effects;
}

std::uint32_t FloatBits(float value) {
    return std::bit_cast<std::uint32_t>(value);
}

std::uint32_t StoredWord(const ExpectedParam& param, const std::string& shown) {
    switch (param.kind) {
        case kKindSlider: {
            const long above = Hundredths(shown) - param.minimum * 100;
            const long double span = static_cast<long double>(param.maximum - param.minimum) * 100;
            return FloatBits(static_cast<float>(static_cast<long double>(above) / span));
        }
        case kKindColour:
            return HexWord(shown);
        case kKindMenu:
            return ItemOf(shown);
        case kKindCheckBox:
            return shown == "on" ? 1 : 0;
        default:
            throw std::runtime_error("this parameter holds no value");
    }
}

}  // namespace velmora::tests
