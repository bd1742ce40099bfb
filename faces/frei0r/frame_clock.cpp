#include "faces/frei0r/frame_clock.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <string>

#include "text/names.h"

namespace velmora::hosts::frei0r {
namespace {

constexpr double kLibraryFrameRate = 30.0;
constexpr double kFastestUsualRate = 120.0;
constexpr double kLargestFrame = 1e15;  // keeps the result of llround and the sum with a start frame exact

struct KnownModule {
    std::string_view part;  // of the file name, in lower case
    TimeUnit unit;
};

constexpr std::array<KnownModule, 6> kKnownModules = {{
    {"avfilter", TimeUnit::kMilliseconds},
    {"ffmpeg", TimeUnit::kMilliseconds},
    {"ffplay", TimeUnit::kMilliseconds},
    {"ffprobe", TimeUnit::kMilliseconds},
    {"mltfrei0r", TimeUnit::kSeconds},
    {"gstfrei0r", TimeUnit::kSeconds},
}};

bool TakeSuffix(std::string_view& text, std::string_view suffix) {
    if (!text.ends_with(suffix)) return false;
    text.remove_suffix(suffix.size());
    return true;
}

}  // namespace

TimeUnit UnitOfModule(std::string_view fileName) {
    if (const auto slash = fileName.find_last_of("/\\"); slash != std::string_view::npos) {
        fileName.remove_prefix(slash + 1);
    }
    std::string lower(fileName);
    std::ranges::transform(lower, lower.begin(), ToLower);
    for (const KnownModule& known : kKnownModules) {
        if (lower.find(known.part) != std::string::npos) return known.unit;
    }
    return TimeUnit::kUnknown;
}

bool FrameClock::SetFrameRate(std::string_view text) noexcept {
    m_toldUnit = TakeSuffix(text, "ms")  ? TimeUnit::kMilliseconds
                 : TakeSuffix(text, "s") ? TimeUnit::kSeconds
                                         : TimeUnit::kUnknown;
    while (TakeSuffix(text, " ")) {
    }
    m_rate = ParseRate(text);
    return m_rate || text.empty() || IsSameButForCase(text, "none");
}

double FrameClock::ClipSeconds(double hostTime) noexcept {
    if (!std::isfinite(hostTime)) hostTime = 0.0;
    const double seconds = IsMilliseconds(hostTime) ? hostTime / 1000.0 : hostTime;
    if (!m_rate) return seconds + static_cast<double>(m_startFrame) / kLibraryFrameRate;
    const double frame =
        std::clamp(seconds * m_rate->numerator / m_rate->denominator, -kLargestFrame, kLargestFrame);
    return m_rate->SecondsAt(m_startFrame + std::llround(frame));
}

bool FrameClock::IsMilliseconds(double hostTime) noexcept {
    if (m_toldUnit != TimeUnit::kUnknown) return m_toldUnit == TimeUnit::kMilliseconds;
    if (m_unit != TimeUnit::kUnknown) return m_unit == TimeUnit::kMilliseconds;
    const double step = std::abs(hostTime - m_lastTime.value_or(hostTime));
    m_lastTime = hostTime;
    if (step == 0.0) return false;
    const double rate =
        m_rate ? static_cast<double>(m_rate->numerator) / m_rate->denominator : kFastestUsualRate;
    m_unit = step >= 500.0 / rate ? TimeUnit::kMilliseconds : TimeUnit::kSeconds;
    return m_unit == TimeUnit::kMilliseconds;
}

}  // namespace velmora::hosts::frei0r
