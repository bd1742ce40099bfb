// What a host knows of an effect: its parameters and presets by name, taken from the descriptors that the
// effect fills in, so that the DLL and the linked core are seen alike.
#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "api/host_api.h"

namespace velmora::hosts {

struct ParamInfo {
    std::string name;
    std::uint32_t kind = kKindNone;  // ParamKind
    float minimum = 0.0f;            // slider: shown range
    float maximum = 0.0f;
    ValueWord defaultValue = {};
    std::vector<std::string> items;  // menu
    bool isGroupEnd = false;         // group marker

    [[nodiscard]] bool HoldsValue() const { return kind != kKindGroup && kind != kKindNone; }
};

struct EffectInfo {
    std::string name;
    std::vector<ParamInfo> params;  // in the effect's order, group markers included
    std::vector<std::string> presets;
};

ParamInfo ReadDescriptor(const ParamDescriptor& descriptor);

// The index of the effect or preset of that name (text/names.h). Throws UsageError that says which ones exist.
std::size_t FindEffect(std::span<const EffectInfo> effects, std::string_view name);
std::uint32_t FindPreset(const EffectInfo& effect, std::string_view name);

// "slider", "menu", "colour", "check box" or "group".
const char* KindName(std::uint32_t kind);

// `"A", "B", "C"`
std::string QuotedList(std::span<const std::string> names);

}  // namespace velmora::hosts
