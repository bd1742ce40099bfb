#include "effects/render_session.h"

#include "render/deep/deep_renderer.h"
#include "render/frame_context.h"
#include "render/renderer.h"

namespace velmora {
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
