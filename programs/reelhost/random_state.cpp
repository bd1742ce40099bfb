#include "programs/reelhost/measurements.h"

#include <array>
#include <optional>
#include <stdexcept>

#include "render/random.h"

namespace velmora::hosts {
namespace {

constexpr std::int32_t kSide = 64;  // of a probe frame; more than twice the jitter
constexpr std::int32_t kLargestShift = 10;
constexpr std::size_t kProbes = 6;                   // 21^12 combinations against 2^32 states
constexpr std::int64_t kFirstProbeNumber = 1000000;  // never the number of a real frame
// No frame draws this many; the search between two calls stops here.
constexpr std::uint32_t kMostDraws = 20000000;

std::vector<std::uint8_t> CoordinatePicture() {
    std::vector<std::uint8_t> picture;
    for (std::int32_t y = 0; y < kSide; ++y) {
        for (std::int32_t x = 0; x < kSide; ++x) {
            picture.insert(picture.end(),
                           {static_cast<std::uint8_t>(x), static_cast<std::uint8_t>(y), 0, 255});
        }
    }
    return picture;
}

std::uint32_t CameraIndex(const EffectLibrary& library) {
    return static_cast<std::uint32_t>(FindEffect(library.Effects(), "Film Camera"));
}

}  // namespace

RandomStateFinder::RandomStateFinder(const EffectLibrary& library)
    : m_camera(library, CameraIndex(library)),
      m_tickBefore(library.TickBefore()),
      m_tickAfter(library.TickAfter()) {
    const EffectInfo& info = library.Effects()[CameraIndex(library)];
    for (const char* setting : {"Y Jitter=10", "X Jitter=10"}) m_camera.Set(ParseSetting(info, setting));
}

RandomStateFinder::Shift RandomStateFinder::Probe() {
    static const std::vector<std::uint8_t> source = CoordinatePicture();
    std::vector<std::uint8_t> result(source.size());
    const double number = static_cast<double>(kFirstProbeNumber + m_probes++);
    m_camera.Render({kSide, kSide}, source, result, (number + 0.5) / 30.0);
    constexpr std::int32_t kMiddle = kSide / 2;
    const std::uint8_t* pixel = result.data() + (kMiddle * kSide + kMiddle) * 4;
    return {kMiddle - pixel[1], kMiddle - pixel[0]};
}

std::uint32_t RandomStateFinder::Find() {
    std::array<Shift, kProbes> seen{};
    for (Shift& shift : seen) shift = Probe();
    // The state after the probes when `state` was the one before them.
    const auto follow = [&](std::uint32_t state) -> std::optional<std::uint32_t> {
        render::Random random(state);
        for (const Shift& shift : seen) {
            if (random.Draw(-kLargestShift, kLargestShift) != shift.down) return std::nullopt;
            if (random.Draw(-kLargestShift, kLargestShift) != shift.right) return std::nullopt;
            random.Next();  // every frame draws once for wear, even without any
        }
        return random.State();
    };
    render::Random past(m_lastState);
    // One tick more on either side, since the counter is coarse. Unsigned, since it wraps.
    const std::uint32_t first = m_tickBefore - 1, ticks = m_tickAfter - m_tickBefore + 3;
    const std::uint32_t candidates = m_isFound ? kMostDraws : ticks;
    for (std::uint32_t i = 0; i < candidates; ++i) {
        if (const auto state = follow(m_isFound ? past.State() : first + i)) {
            m_isFound = true;
            return m_lastState = *state;
        }
        past.Next();
    }
    throw std::runtime_error("the library's random state cannot be found");
}

}  // namespace velmora::hosts
