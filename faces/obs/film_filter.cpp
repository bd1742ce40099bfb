#include "faces/obs/film_filter.h"

#include <algorithm>
#include <cmath>
#include <new>

#include "render/stage_settings.h"
#include "text/number_text.h"

namespace velmora::hosts::obs {
namespace {

constexpr double kNanosecondsPerSecond = 1e9;

struct PresetTask {
    const FilterDescription& filter;
    obs_weak_source_t* source;
};

void WritePresetOut(void* param) {
    const std::unique_ptr<PresetTask> task(static_cast<PresetTask*>(param));
    obs_source_t* source = obs_weak_source_get_source(task->source);
    obs_weak_source_release(task->source);
    if (source == nullptr) return;
    obs_data_t* settings = obs_source_get_settings(source);
    if (WriteChosenPreset(task->filter, settings)) obs_source_update_properties(source);
    obs_data_release(settings);
    obs_source_release(source);
}

}  // namespace

double SecondsOfPosition(std::int64_t milliseconds) noexcept {
    constexpr double kBelowNext = 0.999;
    const double seconds = static_cast<double>(milliseconds) / 1000.0;
    const double frame =
        std::floor((static_cast<double>(milliseconds) + kBelowNext) / 1000.0 * render::kFramesPerSecond);
    return std::max(seconds, frame / render::kFramesPerSecond);
}

FilmFilter::FilmFilter(const FilterDescription& description, obs_source_t* source)
    : m_description(description),
      m_source(source),
      m_session(effects::EffectSession::Create(description.effect)) {
    if (m_session == nullptr) throw std::bad_alloc();
}

void FilmFilter::Update(obs_data_t* settings) {
    const FilterValues values = ReadValues(m_description, settings);
    for (std::uint32_t i = 0; i < values.own.size(); ++i) m_session->SetValue(i, values.own[i]);
    m_session->PinRandom(values.seed);
    m_followsSource = values.followsSource;
    m_isNeutral = IsNeutral(m_description, values);
    if (IsPresetPending(settings)) {
        std::unique_ptr<PresetTask> task(new PresetTask{m_description, obs_source_get_weak_source(m_source)});
        obs_queue_task(OBS_TASK_UI, WritePresetOut, task.release(), false);
    }
}

void FilmFilter::Tick() noexcept {
    // After a frame without a picture, as of a hidden source, the one that is under way is out of date.
    if (!m_wasDrawn) m_exchange.Forget();
    m_wasDrawn = false;
    m_isDue = true;
}

double FilmFilter::ClockSeconds() {
    const std::uint64_t now = obs_get_video_frame_time();
    if (!m_clockStart) m_clockStart = now;
    const double elapsed = static_cast<double>(now - *m_clockStart) / kNanosecondsPerSecond;
    // Not obs_get_video_info: it fills a record that may be longer in the OBS that runs.
    const video_output_info* video = video_output_get_info(obs_get_video());
    if (video == nullptr || video->fps_num == 0 || video->fps_den == 0) return elapsed;
    const FrameRate rate = {static_cast<std::int32_t>(video->fps_num),
                            static_cast<std::int32_t>(video->fps_den)};
    return rate.SecondsAt(std::llround(elapsed * rate.numerator / rate.denominator));
}

double FilmFilter::ClipSeconds() {
    const double clock = ClockSeconds();  // also runs while it is not shown
    obs_source_t* parent = obs_filter_get_parent(m_source);
    const bool hasPosition = (obs_source_get_output_flags(parent) & OBS_SOURCE_CONTROLLABLE_MEDIA) != 0;
    return m_followsSource && hasPosition ? SecondsOfPosition(obs_source_media_get_time(parent)) : clock;
}

void FilmFilter::Draw() {
    if (m_isNeutral || obs_filter_get_parent(m_source) == nullptr ||
        obs_filter_get_target(m_source) == nullptr) {
        obs_source_skip_video_filter(m_source);
        return;
    }
    if (m_isDue) {
        m_isDue = false;
        m_hasPicture = m_exchange.Exchange(m_source, ClipSeconds(), *m_session);
    }
    m_wasDrawn = true;
    if (m_hasPicture) {
        m_exchange.Draw();
    } else {
        obs_source_skip_video_filter(m_source);  // not enough memory, or too large for the card
    }
}

}  // namespace velmora::hosts::obs
