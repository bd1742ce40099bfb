#include "programs/common/effect_info.h"

#include <algorithm>

#include "text/number_text.h"
#include "text/names.h"

namespace velmora::hosts {
namespace {

// Texts that fill their field have no terminating zero.
std::string FieldText(const char* field, std::size_t width) {
    return std::string(field, std::find(field, field + width, '\0'));
}

}  // namespace

ParamInfo ReadDescriptor(const ParamDescriptor& descriptor) {
    ParamInfo info;
    info.name = FieldText(descriptor.name, kParamNameWidth);
    info.kind = descriptor.kind;
    info.defaultValue = descriptor.defaultValue;
    info.x = descriptor.x;
    info.y = descriptor.y;
    info.width = descriptor.width;
    info.height = descriptor.height;
    info.isVisible = descriptor.visible != 0;
    if (info.kind == kKindSlider) {
        info.minimum = descriptor.minimum.number;
        info.maximum = descriptor.slider.maximum.number;
    } else if (info.kind == kKindMenu) {
        const auto count = std::min<std::uint32_t>(descriptor.minimum.count, kMenuItemCapacity);
        for (std::uint32_t item = 0; item < count; ++item) {
            info.items.push_back(FieldText(descriptor.itemTexts[item], kMenuTextWidth));
        }
    } else if (info.kind == kKindGroup) {
        info.isGroupEnd = descriptor.minimum.flag != 0;
    }
    return info;
}

std::string QuotedList(std::span<const std::string> names) {
    std::string list;
    for (const std::string& name : names) {
        if (!list.empty()) list += ", ";
        list += '"' + name + '"';
    }
    return list;
}

std::string InsteadOf(std::string_view name, std::span<const std::string> names, std::string listing) {
    std::string text = "; ";
    if (const auto nearest = NearestName(name, names)) {
        text += "did you mean \"" + *nearest + "\"? ";
        listing.front() = static_cast<char>(listing.front() - 'a' + 'A');
    }
    return text + listing + ' ' + QuotedList(names);
}

std::size_t FindEffect(std::span<const EffectInfo> effects, std::string_view name) {
    std::vector<std::string> names;
    for (std::size_t i = 0; i < effects.size(); ++i) {
        if (IsSameName(effects[i].name, name)) return i;
        names.push_back(effects[i].name);
    }
    throw UsageError("there is no effect \"" + std::string(name) + "\"" +
                     InsteadOf(name, names, "there are"));
}

std::uint32_t FindPreset(const EffectInfo& effect, std::string_view name) {
    for (std::size_t i = 0; i < effect.presets.size(); ++i) {
        if (IsSameName(effect.presets[i], name)) return static_cast<std::uint32_t>(i);
    }
    throw UsageError('"' + effect.name + "\" has no preset \"" + std::string(name) + "\"" +
                     InsteadOf(name, effect.presets, "it has"));
}

const char* KindName(std::uint32_t kind) {
    switch (kind) {
        case kKindMenu:
            return "menu";
        case kKindSlider:
            return "slider";
        case kKindColour:
            return "colour";
        case kKindCheckBox:
            return "check box";
        case kKindGroup:
            return "group";
        default:
            return "none";
    }
}

}  // namespace velmora::hosts
