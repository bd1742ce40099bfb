// What a frame is rendered with: the SIMD level, the list of master settings, which every frame reads again, and the
// state that outlives a frame. The library has one session for the whole process, as hosts expect; a host that links the
// core makes one for each of its threads.
#pragma once

#include <optional>
#include <string_view>

#include "api/host_api.h"
#include "effects/master_settings.h"
#include "render/deep/deep_renderer.h"
#include "render/image.h"
#include "render/render_state.h"
#include "render/renderer.h"
#include "render/stage_settings.h"

namespace velmora {

// The environment variable that limits the SIMD level, for tests or to track down a fault: plain, sse2, ssse3, avx2 or
// avx512. The output bytes are the same at every level.
inline constexpr const char* kSimdVariable = "VELMORA_SIMD";

// The level's name in the variable.
[[nodiscard]] std::string_view NameOf(render::SimdLevel level) noexcept;

// Reads the process's environment again. Values other than those above are ignored; a level that the processor lacks
// gives the best one that it has.
[[nodiscard]] render::RenderOptions ReadRenderOptions() noexcept;

struct RenderSession {
    MasterSettingsList* settings = nullptr;  // not owned
    render::RenderState* state = nullptr;    // not owned
    render::RenderOptions options;
    std::uint32_t hostSeed = 0;  // StageSettings::hostSeed; hosts of the library set none
    std::optional<render::Arrangement> arrangement = {};  // StageSettings::arrangement; likewise
};

// A host's frame in the renderer's terms.
[[nodiscard]] inline render::FrameDescription DescriptionOf(const FrameRecord& frame) noexcept {
    return {frame.pixels, frame.width, frame.height, frame.rowStep, frame.xOrigin, frame.yOrigin};
}

// Renders one frame: builds the views, advances the random state, reads every exposed setting through `host` (an
// effect's host interface) and runs the stages. False when a frame or `timing` is missing or invalid; then nothing is
// written and no parameter is read.
bool RenderFrame(const RenderSession& session, IVideoHost& host, const FrameRecord* source,
                 const FrameRecord* destination, const TimingRecord* timing) noexcept;

// The same for a deep frame.
bool RenderDeepFrame(const RenderSession& session, render::DeepMemory& memory, IVideoHost& host,
                     const render::DeepFrame& frame, double seconds) noexcept;

}  // namespace velmora
