#include "effects/effect_session.h"

#include <new>
#include <span>

#include "api/host_api.h"
#include "effects/effect_queries.h"
#include "platform/float_guard.h"
#include "effects/render_session.h"
#include "render/renderer.h"
#include "render/rounding.h"

namespace velmora::effects {
namespace {

// Serves the values of the effect's own parameters.
class OwnValues final : public PlainHost {
  public:
    explicit OwnValues(std::span<const ValueWord> values) noexcept : m_values(values) {}
    bool VM_CALL GetParamValue(std::uint32_t index, ValueCell* cell, std::uint32_t kind) override {
        if (index >= m_values.size()) return false;
        *cell = {m_values[index], 0, kind};
        return true;
    }

  private:
    std::span<const ValueWord> m_values;
};

// Serves the master settings to the renderer, as an effect object's host interface does.
class MasterHost final : public PlainHost {
  public:
    MasterHost(const EffectTable& effect, std::span<const ValueWord> values) noexcept
        : m_effect(effect), m_own(values) {}
    bool VM_CALL GetParamValue(std::uint32_t index, ValueCell* cell, std::uint32_t kind) override {
        return AnswerMaster(m_effect, &m_own, index, cell, kind);
    }

  private:
    const EffectTable& m_effect;
    OwnValues m_own;
};

bool LeavesPicturesAlone(const render::StageSettings& s) noexcept {
    const render::StageSettings neutral;
    const bool isStill = s.yJitter == 0 && s.xJitter == 0 && s.flicker == 0.0f;
    const bool hasNoLook = s.glow == 0.0f && s.saturation == 0.0f && s.brightness == 0.0f &&
                           s.contrast == 0.0f && s.filmGamma == 0.0f && s.tintRed == neutral.tintRed &&
                           s.tintGreen == neutral.tintGreen && s.tintBlue == neutral.tintBlue;
    return isStill && hasNoLook && s.wear == 0.0f && s.scratchCount == 0 && s.spots == 0.0f;
}

}  // namespace

std::unique_ptr<EffectSession> EffectSession::Create(const EffectTable& effect) noexcept {
    std::unique_ptr<EffectSession> session(new (std::nothrow) EffectSession(effect));
    if (session == nullptr || !session->m_settings.Fill()) return nullptr;
    session->m_settings.ExposeAll();
    return session;
}

EffectSession::EffectSession(const EffectTable& effect) noexcept : m_effect(effect) {
    for (std::size_t i = 0; i < effect.params.size(); ++i) m_values[i] = effect.params[i].defaultValue;
}

void EffectSession::SetValue(std::uint32_t parameter, ValueWord value) noexcept {
    if (parameter < m_effect.params.size()) m_values[parameter] = value;
}

ValueWord EffectSession::Value(std::uint32_t parameter) const noexcept {
    return parameter < m_effect.params.size() ? m_values[parameter] : ValueWord{.bits = 0};
}

void EffectSession::ApplyPreset(std::uint32_t preset) noexcept {
    PresetCell cell;
    for (std::uint32_t i = 0; CopyPresetValue(m_effect, preset, i, &cell); ++i) m_values[i] = cell.value;
}

void EffectSession::PinRandom(std::uint32_t seed) noexcept {
    m_isPinned = true;
    m_seed = seed;
}

void EffectSession::StartRandom(std::uint32_t state) noexcept {
    m_isPinned = false;
    m_state.random.Seed(state);
}

render::StageSettings EffectSession::PresentSettings() noexcept {
    const FloatGuard guard;
    MasterHost host(m_effect, m_values);
    m_settings.ReadFromHost(host);
    return ReadStageSettings(m_settings);
}

std::uint32_t EffectSession::DrawsPerFrame(std::int32_t width) noexcept {
    const FloatGuard guard;
    return render::DrawsPerFrame(PresentSettings(), width);
}

void EffectSession::KeepArrangement() noexcept {
    m_arrangement = render::OwnArrangement(PresentSettings());
}

bool EffectSession::RenderDeep(const render::DeepFrame& frame, double seconds) noexcept {
    const FloatGuard guard;
    if (m_isPinned) m_state.random.Pin(m_seed, render::TruncateTolerant(seconds * render::kFramesPerSecond));
    MasterHost host(m_effect, m_values);
    const std::uint32_t hostSeed = m_isPinned ? m_seed : 0;
    return RenderDeepFrame({&m_settings, &m_state, m_options, hostSeed, m_arrangement}, m_deep, host, frame,
                           seconds);
}

bool EffectSession::IsNeutral() noexcept {
    return LeavesPicturesAlone(PresentSettings());
}

bool EffectSession::NeedsWholePicture() noexcept {
    const render::StageSettings settings = PresentSettings();
    return settings.glow > 0.0f || settings.xJitter != 0 || settings.yJitter != 0;
}

bool EffectSession::Render(const FrameRecord& source, const FrameRecord& destination, double seconds,
                           const render::RowRange& rows) noexcept {
    const FloatGuard guard;
    if (m_isPinned) m_state.random.Pin(m_seed, render::TruncateTolerant(seconds * render::kFramesPerSecond));
    MasterHost host(m_effect, m_values);
    const TimingRecord timing = {0.0, 0.0, seconds};
    const std::uint32_t hostSeed = m_isPinned ? m_seed : 0;
    render::RenderOptions options = m_options;
    options.rows = rows;
    return RenderFrame({&m_settings, &m_state, options, hostSeed, m_arrangement}, host, &source, &destination,
                       &timing);
}

}  // namespace velmora::effects
