#include "effects/process_state.h"

#include <atomic>
#include <memory>
#include <new>

#include "platform/platform.h"

namespace velmora {
namespace {

std::atomic<std::int32_t> g_liveObjects{0};
std::int32_t g_buildMode = 0;

struct KeptList {
    MasterSettingsList list;
    KeptList* earlier = nullptr;
};
KeptList* g_currentList = nullptr;

// Seeded when the library is loaded, by static initialisation.
struct SeededState : render::RenderState {
    SeededState() noexcept { random.Seed(support::TickCount()); }
} g_state;
std::atomic<std::uintptr_t> g_rendering{0};  // the thread that renders with g_state, or 0

}  // namespace

DLLDependentObject::DLLDependentObject() noexcept {
    g_liveObjects.fetch_add(1);
}
DLLDependentObject::~DLLDependentObject() {
    g_liveObjects.fetch_sub(1);
}
std::int32_t DLLDependentObject::LiveObjectCount() noexcept {
    return g_liveObjects.load();
}

void SetBuildMode(std::int32_t mode) noexcept {
    g_buildMode = mode;
}
std::int32_t BuildMode() noexcept {
    return g_buildMode;
}

bool RenewMasterSettings() noexcept {
    std::unique_ptr<KeptList> fresh(new (std::nothrow) KeptList);
    if (fresh == nullptr || (g_buildMode == kBuildModeReady && !fresh->list.Fill())) return false;
    fresh->earlier = g_currentList;
    g_currentList = fresh.release();
    return true;
}

MasterSettingsList* CurrentMasterSettings() noexcept {
    return g_currentList == nullptr ? nullptr : &g_currentList->list;
}

RenderSession ProcessSession(const render::RenderOptions& options) noexcept {
    return {CurrentMasterSettings(), &g_state, options};
}

struct FrameSession::Own {
    MasterSettingsList list;
    SeededState state;
};

FrameSession::FrameSession(const render::RenderOptions& options) noexcept {
    const std::uintptr_t self = support::ThreadId();
    std::uintptr_t other = 0;
    m_isOutermost = g_rendering.compare_exchange_strong(other, self, std::memory_order_acquire);
    if (m_isOutermost || other == self) {
        m_session = ProcessSession(options);
        return;
    }
    m_own.reset(new (std::nothrow) Own);
    if (m_own == nullptr || !m_own->list.Fill()) return;
    m_own->list.ExposeAll();
    m_session = {.settings = &m_own->list, .state = &m_own->state, .options = options};
}

FrameSession::~FrameSession() {
    if (m_isOutermost) g_rendering.store(0, std::memory_order_release);
}

}  // namespace velmora
