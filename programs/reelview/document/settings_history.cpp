#include "programs/reelview/document/settings_history.h"

#include <algorithm>
#include <utility>

namespace velmora::reelview {
namespace {

constexpr std::size_t kLongest = 500;

}  // namespace

bool ValuesAreEqual(const Values& a, const Values& b) {
    return std::ranges::equal(a, b, [](ValueWord x, ValueWord y) { return x.bits == y.bits; });
}

bool Settings::operator==(const Settings& other) const {
    return effect == other.effect && std::ranges::equal(values, other.values, ValuesAreEqual);
}

Values DefaultsOf(const hosts::EffectInfo& effect) {
    Values values;
    for (const hosts::ParamInfo& param : effect.params) {
        ValueWord word{};
        if (param.HoldsValue()) word = param.defaultValue;
        // Only the first byte of a flag counts; clear the others so that equal settings compare equal.
        if (param.kind == kKindCheckBox) word.bits = word.flag != 0 ? 1 : 0;
        values.push_back(word);
    }
    return values;
}

SettingsHistory::SettingsHistory(const std::vector<hosts::EffectInfo>& effects) {
    Settings first;
    for (const hosts::EffectInfo& effect : effects) first.values.push_back(DefaultsOf(effect));
    m_states.push_back(std::move(first));
}

void SettingsHistory::ChooseEffect(std::uint32_t effect) {
    Settings next = Now();
    next.effect = effect;
    Push(std::move(next));
}

void SettingsHistory::SetAll(const Values& values) {
    Settings next = Now();
    next.values[next.effect] = values;
    Push(std::move(next));
}

void SettingsHistory::Set(std::uint32_t parameter, ValueWord value, std::uint32_t gesture) {
    const bool continues =
        gesture != 0 && gesture == m_gesture && parameter == m_gestureParameter && CanUndo() && !CanRedo();
    if (continues) {
        Settings& now = m_states[m_now];
        now.values[now.effect][parameter] = value;
        return;
    }
    Settings next = Now();
    next.values[next.effect][parameter] = value;
    if (next == Now()) return;
    Push(std::move(next));
    m_gesture = gesture;
    m_gestureParameter = parameter;
}

void SettingsHistory::Push(Settings next) {
    m_gesture = 0;
    if (next == Now()) return;
    m_states.resize(m_now + 1);
    m_states.push_back(std::move(next));
    if (m_states.size() > kLongest) m_states.erase(m_states.begin());
    m_now = m_states.size() - 1;
}

void SettingsHistory::Undo() {
    m_gesture = 0;
    if (CanUndo()) --m_now;
}

void SettingsHistory::Redo() {
    m_gesture = 0;
    if (CanRedo()) ++m_now;
}

}  // namespace velmora::reelview
