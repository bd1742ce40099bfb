#include "programs/reelfx/common/effect_choice.h"

#include <new>

#include "effects/effect_queries.h"
#include "effects/effect_table.h"
#include "programs/common/usage_error.h"
#include "programs/reelfx/common/preset_io.h"

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

EffectChoice::EffectChoice(const EffectOptions& options) : m_options(options) {
    std::optional<PresetRecord> record;
    if (options.presetFile) record = LoadPresetFile(*options.presetFile);
    std::string effect = options.effect;
    if (effect.empty() && record) effect = PresetEffect(*record);
    if (effect.empty()) throw UsageError("--effect is missing; reelfx list shows the effects");
    m_index = FindEffect(CoreEffects(), effect);
    m_info = &CoreEffects()[m_index];
    if (options.preset) m_preset = FindPreset(*m_info, *options.preset);
    if (record) m_settings = PresetSettings(*record, *m_info, *options.presetFile);
    for (const std::string& text : options.settings) m_settings.push_back(ParseSetting(*m_info, text));
}

std::unique_ptr<effects::EffectSession> EffectChoice::NewSession(std::optional<std::uint32_t> preset) const {
    auto session = effects::EffectSession::Create(*effects::kAllEffects[m_index]);
    if (!session) throw std::bad_alloc();
    if (preset) {
        session->ApplyPreset(*preset);
    } else {
        if (m_preset) session->ApplyPreset(*m_preset);
        for (const Setting& setting : m_settings) session->SetValue(setting.parameter, setting.value);
    }
    if (m_options.randomState) {
        session->StartRandom(*m_options.randomState);
    } else {
        session->PinRandom(m_options.seed);
    }
    return session;
}

}  // namespace velmora::hosts
