// One instance of a plug-in: the host's handles of its clips and parameters, and sessions of the effect. Several threads
// may render frames of an instance at once; each takes a session of its own.
#pragma once

#include <array>
#include <cstdint>
#include <memory>
#include <mutex>
#include <optional>
#include <vector>

#include "effects/effect_session.h"
#include "faces/openfx/host.h"
#include "faces/openfx/plugin_params.h"

namespace velmora::hosts::openfx {

// What a frame is rendered with.
struct FrameValues {
    using Own = std::array<ValueWord, kPresetCellCapacity>;  // by parameter of the effect
    Own own{};
    // With the largest values that animated parameters have at their keys; nothing when none is animated.
    std::optional<Own> largest;
    double mix = 1.0;  // 0..1
    std::uint32_t seed = 0;
    int startFrame = 0;
    WorkingSpace space = WorkingSpace::kDisplay;
};

class Instance {
  public:
    // Throws ActionFailed when the host does not know a clip or a parameter that was described.
    Instance(const Suites& suites, OfxImageEffectHandle handle, const effects::EffectTable& effect);

    [[nodiscard]] const Suites& Host() const noexcept { return m_suites; }
    [[nodiscard]] OfxImageEffectHandle Handle() const noexcept { return m_handle; }
    [[nodiscard]] OfxImageClipHandle Source() const noexcept { return m_source; }
    [[nodiscard]] OfxImageClipHandle Output() const noexcept { return m_output; }
    // Null where the context has no mask or nothing is connected to it.
    [[nodiscard]] OfxImageClipHandle Mask() const;

    // The parameters' values at a time of the host.
    [[nodiscard]] FrameValues ValuesAt(OfxTime time) const;
    // Seconds from the start of the clip. Without a frame rate, the rate is the library's, 30 frames a second.
    [[nodiscard]] double ClipSeconds(OfxTime time, int startFrame) const;
    [[nodiscard]] bool IsAborted() const { return m_suites.effect->abort(m_handle) != 0; }

    // The user has chosen a preset or asked for a new seed. The host undoes each in one step.
    void ApplyChosenPreset() const;
    void DrawSeed() const;

    // A session with these values, given back with its memory warm. Throws std::bad_alloc.
    class Borrowed;
    [[nodiscard]] Borrowed Session(const FrameValues& values);
    // Frees the sessions that are not in use.
    void FreeSessions();

  private:
    [[nodiscard]] OfxImageClipHandle Clip(const char* name) const;
    [[nodiscard]] OfxParamHandle Param(const PluginParam& param) const;
    [[nodiscard]] ValueWord OwnAt(std::size_t index, OfxTime time) const;
    [[nodiscard]] std::optional<ValueWord> LargestKey(std::size_t index) const;
    void SetOwn(std::size_t index, ValueWord stored) const;
    [[nodiscard]] int IntOf(ParamRole role) const;
    [[nodiscard]] OfxParamHandle Of(ParamRole role) const;

    const Suites m_suites;
    OfxImageEffectHandle m_handle;
    const effects::EffectTable& m_effect;
    const std::vector<PluginParam> m_params;
    std::vector<OfxParamHandle> m_handles;  // of m_params; null for groups
    OfxParamSetHandle m_paramSet = nullptr;
    OfxImageClipHandle m_source = nullptr, m_output = nullptr, m_mask = nullptr;
    std::mutex m_mutex;  // guards the sessions
    std::vector<std::unique_ptr<effects::EffectSession>> m_sessions;
};

class Instance::Borrowed {
  public:
    Borrowed(Instance& owner, std::unique_ptr<effects::EffectSession> session) noexcept
        : m_owner(owner), m_session(std::move(session)) {}
    ~Borrowed();
    Borrowed(const Borrowed&) = delete;
    Borrowed& operator=(const Borrowed&) = delete;

    effects::EffectSession* operator->() const noexcept { return m_session.get(); }
    effects::EffectSession& operator*() const noexcept { return *m_session; }

  private:
    Instance& m_owner;
    std::unique_ptr<effects::EffectSession> m_session;
};

}  // namespace velmora::hosts::openfx
