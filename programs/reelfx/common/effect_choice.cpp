#include "programs/reelfx/common/effect_choice.h"

#include <algorithm>
#include <new>

#include "effects/effect_queries.h"
#include "effects/effect_table.h"
#include "text/number_text.h"

namespace velmora::hosts {
namespace {

EffectInfo Describe(const effects::EffectTable& table) {
    EffectInfo info;
    info.name = table.name;
    ParamDescriptor descriptor{};
    for (std::uint32_t i = 0; effects::DescribeParam(table, i, &descriptor); ++i) {
        info.params.push_back(ReadDescriptor(descriptor));
        descriptor = {};
    }
    for (std::uint32_t i = 0; const char* name = effects::PresetName(table, i); ++i) {
        info.presets.emplace_back(name);
    }
    return info;
}

// --mix is read as if it were a parameter.
const EffectInfo& MixInfo() {
    static const EffectInfo info = [] {
        ParamInfo mix;
        mix.name = "--mix";
        mix.kind = kKindSlider;
        mix.maximum = 100.0f;
        return EffectInfo{.name = "", .params = {mix}, .presets = {}};
    }();
    return info;
}

}  // namespace

const std::vector<EffectInfo>& CoreEffects() {
    static const std::vector<EffectInfo> all = [] {
        std::vector<EffectInfo> list;
        list.reserve(effects::kAllEffects.size());
        for (const effects::EffectTable* table : effects::kAllEffects) list.push_back(Describe(*table));
        return list;
    }();
    return all;
}

EffectChoice::EffectChoice(const EffectOptions& options)
    : m_options(options), m_mix(MixInfo(), "--mix=" + options.mix) {
    std::optional<PresetRecord> record;
    if (options.presetFile) record = LoadPresetFile(*options.presetFile);
    std::string effect = options.effect;
    if (effect.empty() && record) effect = PresetEffect(*record);
    if (effect.empty()) throw UsageError("--effect is missing; reelfx list shows the effects");
    m_index = FindEffect(CoreEffects(), effect);
    m_info = &CoreEffects()[m_index];
    if (options.preset) m_preset = FindPreset(*m_info, *options.preset);
    if (record) m_fileSettings = PresetSettings(*record, *m_info, *options.presetFile);
    for (const std::string& text : options.settings) m_settings.emplace_back(*m_info, text);
}

std::string EffectChoice::Title() const {
    return m_info->name + (m_preset ? ": " + m_info->presets[*m_preset] : "");
}

EffectChoice EffectChoice::WithPreset(std::uint32_t preset) const {
    EffectChoice choice = *this;
    choice.m_preset = preset;
    choice.m_fileSettings.clear();
    return choice;
}

std::unique_ptr<effects::EffectSession> EffectChoice::NewSession() const {
    auto session = effects::EffectSession::Create(*effects::kAllEffects[m_index]);
    if (!session) throw std::bad_alloc();
    if (m_preset) session->ApplyPreset(*m_preset);
    for (const Setting& setting : m_fileSettings) session->SetValue(setting.parameter, setting.value);
    if (Fades()) {
        // Else every frame of a fade would have scratches and flicker of its own.
        for (const TimedSetting& setting : m_settings)
            session->SetValue(setting.Parameter(), setting.Largest());
        session->KeepArrangement();
    }
    MoveTo({}, *session);
    if (m_options.randomState) {
        session->StartRandom(*m_options.randomState);
    } else {
        session->PinRandom(m_options.seed);
    }
    return session;
}

bool EffectChoice::Fades() const {
    return std::ranges::any_of(m_settings, &TimedSetting::Fades);
}

void EffectChoice::MoveTo(const ClipPlace& place, effects::EffectSession& session) const {
    for (const TimedSetting& setting : m_settings) session.SetValue(setting.Parameter(), setting.At(place));
}

std::string EffectChoice::MixText() const {
    return m_mix.Text(MixInfo().params.front());
}

const TimedSetting* EffectChoice::TimedSettingOf(std::uint32_t parameter) const {
    // The last one counts.
    const auto found =
        std::find_if(m_settings.rbegin(), m_settings.rend(),
                     [parameter](const TimedSetting& setting) { return setting.Parameter() == parameter; });
    return found == m_settings.rend() ? nullptr : &*found;
}

std::string EffectChoice::ShownSetting(std::uint32_t parameter) const {
    const ParamInfo& param = m_info->params[parameter];
    const TimedSetting* setting = TimedSettingOf(parameter);
    return setting ? setting->Text(param) : ShownValue(param, NewSession()->Value(parameter));
}

std::vector<ValueWord> EffectChoice::ValuesOf(std::uint32_t parameter) const {
    const TimedSetting* setting = TimedSettingOf(parameter);
    return setting ? setting->Values() : std::vector{NewSession()->Value(parameter)};
}

}  // namespace velmora::hosts
