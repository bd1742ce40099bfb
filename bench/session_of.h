// A session for a case's effect with its settings.
#pragma once

#include <memory>
#include <new>
#include <string_view>

#include "programs/common/bench_cases.h"
#include "effects/effect_session.h"

namespace velmora::bench {

// Throws std::bad_alloc.
[[nodiscard]] inline std::unique_ptr<effects::EffectSession> SessionOf(const BenchCase& test) {
    const effects::EffectTable& effect = *effects::kAllEffects[test.effect];
    auto session = effects::EffectSession::Create(effect);
    if (!session) throw std::bad_alloc();
    for (std::uint32_t i = 0; i < effect.presetNames.size(); ++i) {
        if (std::string_view(effect.presetNames[i]) == "Reset To None") session->ApplyPreset(i);
    }
    for (const CaseValue& value : test.values) {
        ValueWord word = {};
        if (effect.params[value.parameter].kind == kKindSlider) {
            word.number = static_cast<float>(value.value);
        } else {
            word.bits = static_cast<std::uint32_t>(value.value);
        }
        session->SetValue(value.parameter, word);
    }
    return session;
}

}  // namespace velmora::bench
