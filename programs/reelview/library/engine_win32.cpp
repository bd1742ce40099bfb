#include <algorithm>
#include <chrono>
#include <exception>

#include "programs/reelview/library/engine.h"
#include "programs/reelview/library/guarded_call_win32.h"
#include "programs/reelview/base/texts.h"

namespace velmora::reelview {
namespace {

FrameRecord RecordOf(const Picture& picture) {
    // The records belong to the host; the effect does not write to the source.
    void* const pixels = const_cast<std::uint8_t*>(picture.pixels.data());
    return {pixels, picture.size.width, picture.size.height, picture.size.width * 4, 0, 0, 0};
}

}  // namespace

Engine::Engine(const hosts::EffectLibrary& library) : m_library(library), m_runs(library.Effects().size()) {}

Engine::~Engine() {
    for (auto& run : m_runs) {
        hosts::EffectRun* const last = run.release();
        auto end = [last] { delete last; };
        // Objects of a crashed library are not touched again.
        if (!m_isBroken) m_isBroken = !RunGuarded(end);
    }
}

const ClipFacts& Engine::Open(const ClipRequest& request) {
    std::unique_ptr<ClipSource> clip = OpenClip(request);
    static_cast<void>(clip->Read(0));  // a clip whose first frame cannot be read counts as unreadable
    m_clip = std::move(clip);
    m_lastFrame.reset();
    m_lastIndex = -1;
    return m_clip->Facts();
}

SharedPicture Engine::Frame(std::int64_t frame) {
    // A request may be older than the clip.
    frame = std::clamp<std::int64_t>(frame, 0, m_clip->Facts().frames - 1);
    if (frame != m_lastIndex || !m_lastFrame) {
        m_lastFrame = std::make_shared<const Picture>(m_clip->Read(frame));
        m_lastIndex = frame;
    }
    return m_lastFrame;
}

hosts::EffectRun& Engine::RunOf(std::uint32_t effect) {
    auto& run = m_runs.at(effect);
    if (!run) run = std::make_unique<hosts::EffectRun>(m_library, effect);
    return *run;
}

Engine::Rendered Engine::Render(std::uint32_t effect, const Values& values, const Picture& source,
                                double seconds) {
    if (m_isBroken) throw EngineError(text::kLibraryFailed);
    auto result = std::make_shared<Picture>();
    result->size = source.size;
    result->pixels.resize(source.pixels.size());
    const FrameRecord from = RecordOf(source), to = RecordOf(*result);
    bool isRefused = false;
    const auto start = std::chrono::steady_clock::now();
    auto render = [&] {
        try {
            hosts::EffectRun& run = RunOf(effect);
            for (std::uint32_t i = 0; i < values.size(); ++i) run.Set({i, values[i]});
            run.Render(from, to, seconds);
        } catch (const std::exception&) {
            isRefused = true;
        }
    };
    m_isBroken = !RunGuarded(render);
    if (m_isBroken) throw EngineError(text::kLibraryFailed);
    if (isRefused) throw EngineError(text::kEffectRefuses);
    const std::chrono::duration<double, std::milli> time = std::chrono::steady_clock::now() - start;
    return {std::move(result), time.count()};
}

Values Engine::PresetValues(IVideoEffect& effect, const hosts::EffectInfo& info, std::uint32_t preset) {
    Values values = DefaultsOf(info);
    for (std::uint32_t i = 0; i < values.size(); ++i) {
        PresetCell cell{};
        if (info.params[i].HoldsValue() && effect.GetPresetValue(preset, i, &cell)) values[i] = cell.value;
    }
    return values;
}

}  // namespace velmora::reelview
