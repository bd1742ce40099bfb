// What a host knows about an effect: its parameters and presets by name, read from the descriptors that the
// effect fills in, so that the DLL and the linked core look the same.
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
    std::vector<std::string> items;                    // menu
    bool isGroupEnd = false;                           // group marker
    std::int32_t x = 0, y = 0, width = 0, height = 0;  // layout, in the host's dialog units
    bool isVisible = true;

    [[nodiscard]] bool HoldsValue() const { return kind != kKindGroup && kind != kKindNone; }
};

struct EffectInfo {
    std::string name;
    std::vector<ParamInfo> params;  // in the effect's order, group markers included
    std::vector<std::string> presets;
};

ParamInfo ReadDescriptor(const ParamDescriptor& descriptor);

// The index of the effect or preset with that name (text/names.h). If there is none, throws a UsageError that lists
// those that exist and says which one was probably meant.
std::size_t FindEffect(std::span<const EffectInfo> effects, std::string_view name);
std::uint32_t FindPreset(const EffectInfo& effect, std::string_view name);

// "slider", "menu", "colour", "check box" or "group".
const char* KindName(std::uint32_t kind);

// `"A", "B", "C"`
std::string QuotedList(std::span<const std::string> names);

// How a message about an unknown name ends: `; did you mean "A"? It has "A", "B"`, or `; it has "A", "B"` if none of the
// names is near. `listing` is "it has" or the like.
std::string InsteadOf(std::string_view name, std::span<const std::string> names, std::string listing);

}  // namespace velmora::hosts
