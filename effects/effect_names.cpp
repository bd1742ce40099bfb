#include "effects/effect_names.h"

#include <algorithm>
#include <span>

#include "text/names.h"

namespace velmora::effects {
namespace {

std::optional<std::uint32_t> Find(std::span<const char* const> names, std::string_view name) {
    for (std::size_t i = 0; i < names.size(); ++i) {
        if (IsSameName(names[i], name)) return static_cast<std::uint32_t>(i);
    }
    return std::nullopt;
}

}  // namespace

bool HoldsValue(const ParamRow& param) noexcept {
    return param.kind != kKindGroup && param.kind != kKindNone;
}

std::string UniqueName(const EffectTable& effect, const ParamRow& param) {
    const auto sharesName = [&](const ParamRow& other) {
        return &other != &param && HoldsValue(other) && IsSameName(other.name, param.name);
    };
    if (std::none_of(effect.params.begin(), effect.params.end(), sharesName)) return param.name;
    return std::string(param.name) + (param.kind == kKindColour ? " Colour" : " Amount");
}

std::string IdentifierOf(std::string_view name) {
    std::string identifier;
    for (const char c : name) identifier += c == ' ' ? '_' : ToLower(c);
    return identifier;
}

std::optional<std::uint32_t> FindPreset(const EffectTable& effect, std::string_view name) {
    return Find(effect.presetNames, name);
}

std::optional<std::uint32_t> FindItem(const ParamRow& menu, std::string_view text) {
    return Find(menu.items, text);
}

}  // namespace velmora::effects
