// Takes the picture under a filter from the graphics card, has it rendered, and draws the result.
//
// Reading back a picture right after it was drawn would stall the graphics card. So each frame starts the transfer of its
// own picture and renders that of the frame before, which has arrived meanwhile: one frame of delay. Only the first
// frame after a pause or a change of size waits for its own.
//
// Everything here runs on OBS' graphics thread. Textures and buffers are made when the size changes, not per frame.
#pragma once

#include <obs.h>

#include <cstdint>
#include <memory>
#include <vector>

#include "effects/effect_session.h"

namespace velmora::hosts::obs {

struct GraphicsDeleter {
    void operator()(gs_texrender_t* object) const noexcept { gs_texrender_destroy(object); }
    void operator()(gs_stagesurf_t* object) const noexcept { gs_stagesurface_destroy(object); }
    void operator()(gs_texture_t* object) const noexcept { gs_texture_destroy(object); }
};
template <class Object>
using GraphicsOwner = std::unique_ptr<Object, GraphicsDeleter>;

class FrameExchange {
  public:
    FrameExchange() = default;
    FrameExchange(const FrameExchange&) = delete;
    FrameExchange& operator=(const FrameExchange&) = delete;
    ~FrameExchange();  // on any thread

    // Takes the picture of the filter's target, whose clip time is `seconds`, and renders the one that is due with the
    // session. False when there is no picture to draw.
    [[nodiscard]] bool Exchange(obs_source_t* filter, double seconds, effects::EffectSession& session);
    // Drops the picture that is under way: the next frame waits for its own.
    void Forget() noexcept { m_hasEarlier = false; }

    // Draws what Exchange has rendered, into whatever OBS is drawing.
    void Draw() const;

  private:
    [[nodiscard]] bool Prepare(std::uint32_t width, std::uint32_t height);
    [[nodiscard]] bool DrawTarget(obs_source_t* filter);
    [[nodiscard]] bool RenderStaged(std::uint32_t index, effects::EffectSession& session);

    std::uint32_t m_width = 0;
    std::uint32_t m_height = 0;
    GraphicsOwner<gs_texrender_t> m_target;
    GraphicsOwner<gs_stagesurf_t> m_staged[2];
    double m_seconds[2] = {};  // of the staged pictures
    std::uint32_t m_next = 0;  // the surface for the next picture
    bool m_hasEarlier = false;
    std::vector<std::uint32_t> m_rendered;
    GraphicsOwner<gs_texture_t> m_result;
};

}  // namespace velmora::hosts::obs
