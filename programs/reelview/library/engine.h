// Reads the clip and renders it through the library, on the rendering thread only. Windows only.
#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <stdexcept>
#include <vector>

#include "programs/common/effect_library.h"
#include "programs/common/effect_run.h"
#include "programs/reelview/document/settings_history.h"
#include "programs/reelview/source/open_clip_win32.h"

namespace velmora::reelview {

// Its text is a key of the user-visible texts.
class EngineError : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

class Engine {
  public:
    // `library` must outlive the engine.
    explicit Engine(const hosts::EffectLibrary& library);
    ~Engine();
    Engine(const Engine&) = delete;
    Engine& operator=(const Engine&) = delete;

    // If the new clip cannot be opened, the current one stays open. Throws SourceError.
    const ClipFacts& Open(const ClipRequest& request);
    [[nodiscard]] const ClipFacts& Facts() const { return m_clip->Facts(); }
    // The nearest frame that the clip has. Throws SourceError.
    [[nodiscard]] SharedPicture Frame(std::int64_t frame);

    struct Rendered {
        SharedPicture picture;
        double milliseconds = 0.0;
    };
    // Throws EngineError.
    [[nodiscard]] Rendered Render(std::uint32_t effect, const Values& values, const Picture& source,
                                  double seconds);
    // The values of a built-in preset.
    [[nodiscard]] static Values PresetValues(IVideoEffect& effect, const hosts::EffectInfo& info,
                                             std::uint32_t preset);

  private:
    hosts::EffectRun& RunOf(std::uint32_t effect);

    const hosts::EffectLibrary& m_library;
    std::unique_ptr<ClipSource> m_clip;
    std::vector<std::unique_ptr<hosts::EffectRun>> m_runs;  // by effect
    SharedPicture m_lastFrame;
    std::int64_t m_lastIndex = -1;
    bool m_isBroken = false;
};

}  // namespace velmora::reelview
