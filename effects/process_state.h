// The state that the library keeps for the whole process. It is not locked, as hosts of this kind expect: frames are
// rendered one at a time.
#pragma once

#include <cstdint>
#include <memory>

#include "effects/master_settings.h"
#include "effects/render_session.h"

namespace velmora {

// Number of live library objects; changed atomically. Effects and other objects are not counted: the host may unload
// the library as soon as all library objects are gone.
class DLLDependentObject {
  public:
    DLLDependentObject() noexcept;
    virtual ~DLLDependentObject();
    DLLDependentObject(const DLLDependentObject&) = delete;
    DLLDependentObject& operator=(const DLLDependentObject&) = delete;

    [[nodiscard]] static std::int32_t LiveObjectCount() noexcept;
};

// The only build mode value under which the master settings are filled and read.
inline constexpr std::int32_t kBuildModeReady = 2;

void SetBuildMode(std::int32_t mode) noexcept;
[[nodiscard]] std::int32_t BuildMode() noexcept;

// Makes a new master settings list the current one; false when there is not enough memory (the current list stays).
// Earlier lists are kept until the process ends: effects that read them may outlive their library object.
[[nodiscard]] bool RenewMasterSettings() noexcept;
[[nodiscard]] MasterSettingsList* CurrentMasterSettings() noexcept;

// The session of all effects created through the library. Its random numbers start from the system's tick
// count at load, so that damage differs from run to run.
[[nodiscard]] RenderSession ProcessSession(const render::RenderOptions& options = {}) noexcept;

// The session of one frame: that of the process, or, while a frame on another thread has it, one of its own. A host that
// renders on two threads in spite of the contract then gets other random damage, but no mixture of settings and no
// damaged memory. Waiting instead would be no help: the other frame may be waiting for this thread. A host that renders a
// frame while it answers another frame's request for a value gets the session of the process in both: no pixel is touched
// before the last answer.
class FrameSession {
  public:
    explicit FrameSession(const render::RenderOptions& options) noexcept;
    ~FrameSession();
    FrameSession(const FrameSession&) = delete;
    FrameSession& operator=(const FrameSession&) = delete;

    // Without settings when there are none yet, or not enough memory.
    [[nodiscard]] const RenderSession& Session() const noexcept { return m_session; }

  private:
    struct Own;
    bool m_isOutermost = false;
    std::unique_ptr<Own> m_own;
    RenderSession m_session;
};

}  // namespace velmora
