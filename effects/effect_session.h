// An effect for hosts that link the core instead of loading the library: it has its own settings and its own renderer
// state, and nothing process-wide. One session per thread; sessions are independent of each other.
#pragma once

#include <array>
#include <cstdint>
#include <memory>
#include <optional>

#include "effects/effect_table.h"
#include "api/host_api.h"
#include "effects/master_settings.h"
#include "effects/render_session.h"
#include "render/deep/deep_renderer.h"
#include "render/render_state.h"
#include "render/stage_settings.h"

namespace velmora::effects {

class EffectSession {
  public:
    // A session with the parameters' defaults and its randomness fixed by seed 0. Null when there is not enough memory.
    [[nodiscard]] static std::unique_ptr<EffectSession> Create(const EffectTable& effect) noexcept;

    [[nodiscard]] const EffectTable& Effect() const noexcept { return m_effect; }

    // In stored format: a slider normalised to 0..1, a colour 0x00BBGGRR, an item index, a flag. When a frame reads
    // them, sliders are clamped and menu items outside the menu are ignored. Does nothing past the last parameter.
    void SetValue(std::uint32_t parameter, ValueWord value) noexcept;
    // Past the last parameter: 0.
    [[nodiscard]] ValueWord Value(std::uint32_t parameter) const noexcept;
    // Sets all parameters to the values of the built-in preset. Does nothing past the last preset.
    void ApplyPreset(std::uint32_t preset) noexcept;

    // From now on every frame's randomness depends only on the seed and the frame number: frames may be rendered in any
    // order, by any session. With seed 0, scratches and flicker are those of the library; any other seed changes them too.
    void PinRandom(std::uint32_t seed) noexcept;
    // From now on the random numbers are a running sequence from `state`, as in the library: each frame continues where
    // the previous one left off, and a frame rendered twice in a row is the same. Scratches and flicker are those of the
    // library.
    void StartRandom(std::uint32_t state) noexcept;
    // How many random numbers a frame of this processed width uses with the current values. A host can compute from it
    // the state that a later frame of a sequence starts from.
    [[nodiscard]] std::uint32_t DrawsPerFrame(std::int32_t width) noexcept;

    // From now on scratches and flicker keep the places and the rhythm that the current values give them, even while
    // values change from frame to frame. A frame with more scratches than now moves all of them.
    void KeepArrangement() noexcept;
    // From now on they follow the values again.
    void ReleaseArrangement() noexcept { m_arrangement.reset(); }

    // Whether the current values leave every picture as it is, at any time.
    [[nodiscard]] bool IsNeutral() noexcept;
    // Whether a pixel of the result depends on more of the source than the same pixel there: with jitter or diffusion.
    [[nodiscard]] bool NeedsWholePicture() noexcept;

    // From now on only wear, scratches and spots are drawn, with the same positions and strength as in the whole
    // effect; nothing moves the picture or changes its colours.
    void KeepDamageOnly() noexcept { m_options.isDamageOnly = true; }

    // Renders the frame at a clip time: the frame number is seconds * 30, truncated. With `rows`, only those rows are
    // guaranteed to be written. False, with nothing written, if a frame record is invalid.
    [[nodiscard]] bool Render(const FrameRecord& source, const FrameRecord& destination, double seconds,
                              const render::RowRange& rows = {}) noexcept;

    // The same for a deep frame (render/deep/deep_renderer.h). False, with nothing written, when the frame is invalid or
    // there is not enough memory.
    [[nodiscard]] bool RenderDeep(const render::DeepFrame& frame, double seconds) noexcept;

    // What the stages get from the current values, without seed and arrangement.
    [[nodiscard]] render::StageSettings PresentSettings() noexcept;

  private:
    explicit EffectSession(const EffectTable& effect) noexcept;

    const EffectTable& m_effect;
    std::array<ValueWord, kPresetCellCapacity> m_values{};  // by parameter
    MasterSettingsList m_settings;
    render::RenderState m_state;
    render::DeepMemory m_deep;
    render::RenderOptions m_options = ReadRenderOptions();
    std::optional<render::Arrangement> m_arrangement;
    bool m_isPinned = true;
    std::uint32_t m_seed = 0;
};

}  // namespace velmora::effects
