// One filter on one source.
//
// The time of a frame, from which its damage follows, comes from one of two clocks:
//   the source's   the position of a source that plays a film. It stops in a pause and starts again with the film
//   OBS' own       the frames that OBS has made since the filter was first shown, at OBS' frame rate; for all other
//                  sources, and for all unless the filter follows its source
//
// Rendering runs on OBS' graphics thread, once per frame however often the source is drawn (preview, program,
// projectors). OBS delivers new settings on that thread too.
#pragma once

#include <obs.h>

#include <cstdint>
#include <memory>
#include <optional>

#include "effects/effect_session.h"
#include "faces/obs/filter_settings.h"
#include "faces/obs/frame_exchange.h"

namespace velmora::hosts::obs {

class FilmFilter {
  public:
    // `source` is the filter's own object and outlives it. Throws std::bad_alloc.
    FilmFilter(const FilterDescription& description, obs_source_t* source);

    // Reads the settings. A preset that a script has chosen is then written out on OBS' interface thread.
    void Update(obs_data_t* settings);
    // At each frame of OBS, before it is drawn.
    void Tick() noexcept;
    void Draw();

    [[nodiscard]] obs_source_t* Source() const noexcept { return m_source; }

  private:
    [[nodiscard]] double ClipSeconds();
    [[nodiscard]] double ClockSeconds();

    const FilterDescription& m_description;
    obs_source_t* m_source;
    std::unique_ptr<effects::EffectSession> m_session;
    FrameExchange m_exchange;
    std::optional<std::uint64_t> m_clockStart;  // ns
    bool m_isNeutral = true;
    bool m_followsSource = false;
    bool m_isDue = false;
    bool m_wasDrawn = false;  // since the last tick
    bool m_hasPicture = false;
};

// The clip time of a media source's position, which OBS gives in whole milliseconds, cut off. The first frame of a
// 30th of a second is taken at its beginning, as in the file.
[[nodiscard]] double SecondsOfPosition(std::int64_t milliseconds) noexcept;

}  // namespace velmora::hosts::obs
