// What is measured: an effect with settings that make all of its stages work, and a session with them.
#pragma once

#include <cstdint>
#include <memory>
#include <new>
#include <span>
#include <string>
#include <string_view>

#include "effects/effect_session.h"

namespace velmora::bench {

// The value of one parameter in a case, in stored form: sliders normalised, flags 0 or 1, items and colours
// as they are.
struct CaseValue {
    std::uint32_t parameter;
    double value;
};

struct BenchCase {
    const char* name;
    std::uint32_t effect;               // index in the library's order
    std::span<const CaseValue> values;  // other parameters: "Reset To None"
    double goalNative;                  // with AVX2, as a ratio to a memcpy of a frame
    double goalDll;
    double goalBelow;  // the same with SSSE3, for both builds; 0: none
};

[[nodiscard]] std::span<const BenchCase> BenchCases() noexcept;
// The one of them that makes the most work.
[[nodiscard]] const BenchCase& EverythingCase() noexcept;
// The case's name with its goals.
[[nodiscard]] std::string TitleOf(const BenchCase& test, double goal);

// The case's effect with its values. Throws std::bad_alloc. Inline: reelhost, which measures the DLL, has no sessions.
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
