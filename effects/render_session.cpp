#include "effects/render_session.h"

#include <algorithm>
#include <cstdlib>

#include "render/deep/deep_renderer.h"
#include "render/frame_context.h"
#include "render/renderer.h"

namespace velmora {
namespace {

struct NamedLevel {
    std::string_view name;
    render::SimdLevel level;
};
constexpr NamedLevel kLevels[] = {
    {"plain", render::SimdLevel::kPlain},   {"sse2", render::SimdLevel::kSse2},
    {"ssse3", render::SimdLevel::kSsse3},   {"avx2", render::SimdLevel::kAvx2},
    {"avx512", render::SimdLevel::kAvx512},
};

std::string_view Variable(const char* name) noexcept {
    const char* value = std::getenv(name);
    return value == nullptr ? std::string_view() : std::string_view(value);
}

}  // namespace

std::string_view NameOf(render::SimdLevel level) noexcept {
    for (const NamedLevel& named : kLevels) {
        if (named.level == level) return named.name;
    }
    return {};
}

render::RenderOptions ReadRenderOptions() noexcept {
    render::RenderOptions options;
    const std::string_view wanted = Variable(kSimdVariable);
    for (const NamedLevel& named : kLevels) {
        if (named.name == wanted) options.level = std::min(options.level, named.level);
    }
    return options;
}

bool RenderFrame(const RenderSession& session, IVideoHost& host, const FrameRecord* source,
                 const FrameRecord* destination, const TimingRecord* timing) noexcept {
    if (source == nullptr || destination == nullptr || timing == nullptr) return false;
    render::FrameContext context(DescriptionOf(*source), DescriptionOf(*destination));
    context.SetTime(timing->frameTime);
    // An invalid frame still counts as the last one.
    session.state->random.BeginFrame(context.FrameNumber());
    if (!context.IsValid(render::Slot::kSource) || !context.IsValid(render::Slot::kDestination)) return false;
    session.settings->ReadFromHost(host);
    render::StageSettings settings = ReadStageSettings(*session.settings);
    settings.hostSeed = session.hostSeed;
    settings.arrangement = session.arrangement;
    render::RenderStages(context, settings, *session.state, session.options);
    context.Finish(session.options.rows);
    return true;
}

bool RenderDeepFrame(const RenderSession& session, render::DeepMemory& memory, IVideoHost& host,
                     const render::DeepFrame& frame, double seconds) noexcept {
    render::FrameContext context(frame.width, frame.height);
    context.SetTime(seconds);
    session.state->random.BeginFrame(context.FrameNumber());
    if (!frame.IsValid()) return false;
    session.settings->ReadFromHost(host);
    render::StageSettings settings = ReadStageSettings(*session.settings);
    settings.hostSeed = session.hostSeed;
    settings.arrangement = session.arrangement;
    return render::RenderDeep(frame, context, settings, *session.state, memory, session.options);
}

}  // namespace velmora
