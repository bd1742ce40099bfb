// What effects.txt says the effects show, read into plain records.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "api/host_api.h"

namespace velmora::tests {

struct ExpectedParam {
    ParamKind kind = kKindNone;
    std::string name;
    long minimum = 0;  // sliders
    long maximum = 0;
    std::string defaultShown;
    bool isGroupEnd = false;
    std::uint32_t groupWord = 0;
    std::int32_t layout[4] = {};
};

struct ExpectedPreset {
    std::string name;
    std::vector<std::string> shown;  // no entries for groups
};

struct ExpectedEffect {
    std::string name;
    std::vector<ExpectedParam> params;
    std::vector<ExpectedPreset> presets;
    std::vector<std::string>
        answers;  // "own 3", "number 0.5", "colour 0xFF000000", "item 1", "flag on", "depth 13"
};

// In the library's order.
const std::vector<ExpectedEffect>& ExpectedEffects();

// The stored word of a shown value, worked out in decimal fixed-point and extended precision.
std::uint32_t StoredWord(const ExpectedParam& param, const std::string& shown);

// The words in a slider's or a fixed number's bits.
std::uint32_t FloatBits(float value);

}  // namespace velmora::tests
