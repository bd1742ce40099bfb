#include "effects/effect_queries.h"

#include <algorithm>
#include <span>

#include "platform/float_guard.h"
#include "effects/params.h"
#include "render/rounding.h"
#include "text/names.h"

namespace velmora::effects {
namespace {

void DescribeSlider(const ParamRow& param, bool marked, ParamDescriptor& descriptor) noexcept {
    descriptor.defaultValue = param.defaultValue;
    descriptor.minimum.number = param.minimum;
    descriptor.slider.maximum.number = param.maximum;
    if (marked) descriptor.slider.afterMaximum = 1;
}

void DescribeMenu(const ParamRow& param, ParamDescriptor& descriptor) noexcept {
    descriptor.defaultValue = param.defaultValue;
    descriptor.minimum.count = static_cast<std::uint32_t>(param.items.size());
    char(*text)[kMenuTextWidth] = descriptor.itemTexts;
    for (const char* item : param.items) CopyBounded(*text++, kMenuTextWidth, item);
}

// The depth rises fastest while there are few scratches: the single slider of a simple effect goes from a few faint
// scratches to many deep ones. The host guarantees the range of the amount; it is not checked here.
float DepthOfAmount(float amount) noexcept {
    const FloatGuard guard;
    const float rest = render::Narrow(1.0 - SanitizeNormalised(amount));
    return render::Narrow(1.0 - double{rest} * rest);
}

std::optional<std::uint32_t> Find(std::span<const char* const> names, std::string_view name) {
    for (std::size_t i = 0; i < names.size(); ++i) {
        if (IsSameName(names[i], name)) return static_cast<std::uint32_t>(i);
    }
    return std::nullopt;
}

}  // namespace

bool DescribeParam(const EffectTable& effect, std::uint32_t index, ParamDescriptor* descriptor) noexcept {
    if (index >= effect.params.size() || descriptor == nullptr) return false;
    const ParamRow& param = effect.params[index];
    switch (param.kind) {
        case kKindSlider:
            DescribeSlider(param, effect.marksSliders, *descriptor);
            break;
        case kKindMenu:
            DescribeMenu(param, *descriptor);
            break;
        case kKindColour:
            descriptor->defaultValue = param.defaultValue;
            break;
        case kKindCheckBox:
            descriptor->defaultValue.flag = param.defaultValue.flag;
            break;
        case kKindGroup:
            descriptor->minimum.flag = param.isGroupEnd ? 1 : 0;
            break;
        case kKindNone:
            break;
    }
    descriptor->kind = param.kind;
    CopyBounded(descriptor->name, kParamNameWidth, param.name);
    descriptor->x = param.layout.x;
    descriptor->y = param.layout.y;
    descriptor->width = param.layout.width;
    descriptor->height = param.layout.height;
    descriptor->visible = 1;
    return true;
}

const char* PresetName(const EffectTable& effect, std::uint32_t preset) noexcept {
    return preset < effect.presetNames.size() ? effect.presetNames[preset] : nullptr;
}

bool CopyPresetValue(const EffectTable& effect, std::uint32_t preset, std::uint32_t parameter,
                     PresetCell* cell) noexcept {
    const std::size_t paramCount = effect.params.size();
    if (cell == nullptr || preset >= effect.presetNames.size() || parameter >= paramCount) return false;
    *cell = effect.presetCells[preset * paramCount + parameter];
    return true;
}

bool AnswerMaster(const EffectTable& effect, IVideoHost* host, std::uint32_t index, ValueCell* cell,
                  std::uint32_t kind) {
    if (host == nullptr || cell == nullptr) return false;
    cell->kind = kind;
    if (index >= kMasterCount) return false;
    const MasterAnswer& answer = effect.answers[index];
    switch (answer.source) {
        case MasterAnswer::Source::kOwn:
            return host->GetParamValue(answer.own, cell, kind);
        case MasterAnswer::Source::kWord:
            cell->value = answer.fixed;
            return true;
        case MasterAnswer::Source::kFlag:
            cell->value.flag = answer.fixed.flag;
            return true;
        case MasterAnswer::Source::kDepthOf:
            // Done whether or not the host answers: the depth is computed from whatever the cell then holds.
            host->GetParamValue(answer.own, cell, kind);
            cell->value.number = DepthOfAmount(cell->value.number);
            return true;
    }
    return false;
}

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
