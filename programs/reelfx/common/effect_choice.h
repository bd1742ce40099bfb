// The effect and settings that a command applies, the sessions that render it, and the preset files that hold settings.
#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "api/host_api.h"
#include "effects/effect_session.h"
#include "programs/common/effect_info.h"
#include "programs/common/settings.h"
#include "programs/reelfx/common/timed_setting.h"

namespace velmora::hosts {

struct EffectOptions {
    std::string effect = {};  // may be empty if a preset file names it
    std::optional<std::string> preset = {};
    std::optional<std::string> presetFile = {};  // applied after the preset
    std::vector<std::string> settings = {};      // see timed_setting.h; applied last
    std::string mix = "100";                     // per cent; may fade as a setting does
    std::uint32_t seed = 0;
    // Use one continuous random sequence from this state, as a host that plays a clip through the library
    // does, instead of numbers that depend on seed and frame.
    std::optional<std::uint32_t> randomState = {};
};

// The five effects as the core describes them, in the library's order.
const std::vector<EffectInfo>& CoreEffects();

class EffectChoice {
  public:
    // Throws UsageError when the effect, the preset or a setting does not exist or does not fit, Failure when
    // the preset file cannot be read or belongs to another effect.
    explicit EffectChoice(const EffectOptions& options);

    [[nodiscard]] const EffectInfo& Info() const { return *m_info; }
    // The chosen built-in preset; nothing when none was named.
    [[nodiscard]] std::optional<std::uint32_t> Preset() const { return m_preset; }
    [[nodiscard]] const EffectOptions& Options() const { return m_options; }
    // Frames must come in order and to one session only.
    [[nodiscard]] bool IsSequence() const { return m_options.randomState.has_value(); }
    // "Film Look: Sepia", "Film Look".
    [[nodiscard]] std::string Title() const;

    // The same choice with another built-in preset and no preset file.
    [[nodiscard]] EffectChoice WithPreset(std::uint32_t preset) const;
    // Has the values of the clip's first frame. Each thread needs its own.
    [[nodiscard]] std::unique_ptr<effects::EffectSession> NewSession() const;

    // True if a setting changes over time, apart from the mix.
    [[nodiscard]] bool Fades() const;
    // Gives the session the values for a frame of the clip.
    void MoveTo(const ClipPlace& place, effects::EffectSession& session) const;
    // How much of the effect the frame gets, 0..1; the rest is the picture without it.
    [[nodiscard]] double MixAt(const ClipPlace& place) const { return m_mix.At(place).number; }
    [[nodiscard]] std::string MixText() const;
    // "10", or "10@0 60@5s" if the parameter fades.
    [[nodiscard]] std::string ShownSetting(std::uint32_t parameter) const;
    // Every value that the parameter is given at some time.
    [[nodiscard]] std::vector<ValueWord> ValuesOf(std::uint32_t parameter) const;

  private:
    [[nodiscard]] const TimedSetting* TimedSettingOf(std::uint32_t parameter) const;

    EffectOptions m_options;
    std::size_t m_index;
    const EffectInfo* m_info;
    std::optional<std::uint32_t> m_preset;
    std::vector<Setting> m_fileSettings;  // those of the preset file
    std::vector<TimedSetting> m_settings;
    TimedSetting m_mix;
};

// Preset files on the command line: read, checked against an effect, and written (preset_io.cpp).

// Throws Failure (kExitInput) when the file cannot be read or is not a preset.
PresetRecord LoadPresetFile(const std::string& path);

// The record's texts and values; names end at a zero or at the end of their field.
std::string PresetName(const PresetRecord& record);
std::string PresetEffect(const PresetRecord& record);

// The record's values for the effect's parameters. Throws Failure (kExitInput) when the preset belongs to
// another effect or library; `path` is for the message.
std::vector<Setting> PresetSettings(const PresetRecord& record, const EffectInfo& effect,
                                    const std::string& path);

// `values` are stored forms in the effect's parameter order. Throws Failure (kExitOutput).
void SavePresetFile(const std::string& path, const std::string& name, const EffectInfo& effect,
                    const std::vector<ValueWord>& values, bool mayOverwrite);

}  // namespace velmora::hosts
