#include "faces/obs/frame_exchange.h"

#include <limits>

namespace velmora::hosts::obs {
namespace {

// The effects work on blue, green, red, alpha.
constexpr gs_color_format kFormat = GS_BGRA;
constexpr std::uint32_t kLargestSide = 16384;

// Draws `texture`, whose colours are not multiplied by alpha, over what is there.
void DrawOver(gs_texture_t* texture, std::uint32_t width, std::uint32_t height) {
    gs_effect_t* effect = obs_get_base_effect(OBS_EFFECT_DEFAULT);
    gs_eparam_t* image = gs_effect_get_param_by_name(effect, "image");
    const bool isLinear = gs_get_linear_srgb();
    const bool previous = gs_framebuffer_srgb_enabled();
    gs_enable_framebuffer_srgb(isLinear);
    if (isLinear) {
        gs_effect_set_texture_srgb(image, texture);
    } else {
        gs_effect_set_texture(image, texture);
    }
    gs_blend_state_push();
    gs_blend_function_separate(GS_BLEND_SRCALPHA, GS_BLEND_INVSRCALPHA, GS_BLEND_ONE, GS_BLEND_INVSRCALPHA);
    while (gs_effect_loop(effect, "Draw")) gs_draw_sprite(texture, 0, width, height);
    gs_blend_state_pop();
    gs_enable_framebuffer_srgb(previous);
}

}  // namespace

FrameExchange::~FrameExchange() {
    obs_enter_graphics();
    m_target.reset();
    for (auto& surface : m_staged) surface.reset();
    m_result.reset();
    obs_leave_graphics();
}

bool FrameExchange::Prepare(std::uint32_t width, std::uint32_t height) {
    if (width == m_width && height == m_height) return m_result != nullptr;
    Forget();
    m_width = width;
    m_height = height;
    m_result.reset();
    if (width > kLargestSide || height > kLargestSide) return false;
    if (m_target == nullptr) m_target.reset(gs_texrender_create(kFormat, GS_ZS_NONE));
    for (auto& surface : m_staged) surface.reset(gs_stagesurface_create(width, height, kFormat));
    m_rendered.assign(std::size_t{width} * height, 0);
    if (m_target == nullptr || m_staged[0] == nullptr || m_staged[1] == nullptr) return false;
    m_result.reset(gs_texture_create(width, height, kFormat, 1, nullptr, GS_DYNAMIC));
    return m_result != nullptr;
}

// As 8-bit colours that are not multiplied by alpha, in OBS' own conversion from whatever the source delivers.
bool FrameExchange::DrawTarget(obs_source_t* filter) {
    const bool previous = gs_set_linear_srgb(false);
    bool isDrawn = false;
    if (obs_source_process_filter_begin(filter, GS_RGBA, OBS_NO_DIRECT_RENDERING)) {
        gs_texrender_reset(m_target.get());
        isDrawn = gs_texrender_begin(m_target.get(), m_width, m_height);
        if (isDrawn) {
            gs_ortho(0.0f, static_cast<float>(m_width), 0.0f, static_cast<float>(m_height), -100.0f, 100.0f);
            gs_blend_state_push();
            gs_blend_function(GS_BLEND_ONE, GS_BLEND_ZERO);
            obs_source_process_filter_tech_end(filter, obs_get_base_effect(OBS_EFFECT_DEFAULT), m_width,
                                               m_height, "DrawAlphaDivide");
            gs_blend_state_pop();
            gs_texrender_end(m_target.get());
        }
    }
    gs_set_linear_srgb(previous);
    return isDrawn;
}

bool FrameExchange::RenderStaged(std::uint32_t index, effects::EffectSession& session) {
    std::uint8_t* pixels = nullptr;
    std::uint32_t step = 0;
    gs_stagesurf_t* surface = m_staged[index].get();
    if (!gs_stagesurface_map(surface, &pixels, &step)) return false;
    const auto width = static_cast<std::int32_t>(m_width), height = static_cast<std::int32_t>(m_height);
    const FrameRecord source = {pixels, width, height, static_cast<std::int32_t>(step), 0, 0, 0};
    const FrameRecord destination = {m_rendered.data(), width, height, width * 4, 0, 0, 0};
    const bool isRendered = session.Render(source, destination, m_seconds[index]);
    gs_stagesurface_unmap(surface);
    if (!isRendered) return false;
    gs_texture_set_image(m_result.get(), reinterpret_cast<const std::uint8_t*>(m_rendered.data()),
                         m_width * 4, false);
    return true;
}

bool FrameExchange::Exchange(obs_source_t* filter, double seconds, effects::EffectSession& session) {
    obs_source_t* target = obs_filter_get_target(filter);
    const std::uint32_t width = obs_source_get_base_width(target);
    const std::uint32_t height = obs_source_get_base_height(target);
    if (width == 0 || height == 0 || !Prepare(width, height) || !DrawTarget(filter)) {
        Forget();
        return false;
    }
    gs_stage_texture(m_staged[m_next].get(), gs_texrender_get_texture(m_target.get()));
    m_seconds[m_next] = seconds;
    const std::uint32_t due = m_hasEarlier ? 1 - m_next : m_next;
    m_next = 1 - m_next;
    m_hasEarlier = true;
    return RenderStaged(due, session);
}

void FrameExchange::Draw() const {
    DrawOver(m_result.get(), m_width, m_height);
}

}  // namespace velmora::hosts::obs
