#include "programs/reelfx/common/timed_setting.h"

#include <algorithm>
#include <cmath>
#include <optional>

#include "text/number_text.h"

namespace velmora::hosts {
namespace {

struct Position {
    double value;
    std::optional<bool> isInSeconds;  // nothing for 0, which is the same in both
};

// "125", "5s".
Position ParsePosition(std::string_view text, std::string_view setting) {
    const bool isInSeconds = text.ends_with('s');
    if (isInSeconds) text.remove_suffix(1);
    const auto seconds = isInSeconds ? ParseNumber(text) : std::nullopt;
    const auto frame = isInSeconds ? std::nullopt : ParseInteger(text);
    const double value = seconds.value_or(static_cast<double>(frame.value_or(-1)));
    if (value < 0.0) {
        throw UsageError(
            "a value is followed by @ and a frame of the clip, as in 60@125, or a time in seconds, as in "
            "60@5s, not \"" +
            std::string(setting) + '"');
    }
    return {value, value == 0.0 ? std::nullopt : std::optional(isInSeconds)};
}

std::uint32_t MixedColour(std::uint32_t from, std::uint32_t to, double share) {
    std::uint32_t mixed = 0;
    for (const int shift : {0, 8, 16}) {
        const double low = from >> shift & 0xFFu, high = to >> shift & 0xFFu;
        mixed |= static_cast<std::uint32_t>(std::lround(low + (high - low) * share)) << shift;
    }
    return mixed;
}

}  // namespace

TimedSetting::TimedSetting(const EffectInfo& effect, std::string_view text) {
    const std::size_t equals = text.find('=');
    if (equals != std::string_view::npos && text.find('@', equals) != std::string_view::npos) {
        AddPoints(effect, text.substr(0, equals), text.substr(equals + 1));
    } else {
        const Setting setting = ParseSetting(effect, text);
        m_parameter = setting.parameter;
        m_points = {{0.0, setting.value, 0.0}};
    }
    const ParamInfo& param = effect.params[m_parameter];
    m_kind = param.kind;
    m_range = {param.minimum, param.maximum};
}

void TimedSetting::AddPoints(const EffectInfo& effect, std::string_view name, std::string_view text) {
    const std::string whole = std::string(name) + '=' + std::string(text);
    std::optional<bool> isInSeconds;
    while (!text.empty()) {
        // A menu item's text may hold blanks, a position does not.
        const std::size_t at = std::min(text.find('@'), text.size() - 1);
        const std::size_t end = std::min(text.find(' ', at), text.size());
        const Position position = ParsePosition(text.substr(at + 1, end - at - 1), whole);
        const Setting setting =
            ParseSetting(effect, std::string(name) + '=' + std::string(text.substr(0, at)));
        if (!m_points.empty() && setting.parameter != m_parameter) {
            throw UsageError("all values must be colours, or all numbers, in \"" + whole + '"');
        }
        if (!m_points.empty() && position.value < m_points.back().position) {
            throw UsageError("the frames or times must ascend in \"" + whole + '"');
        }
        if (isInSeconds && position.isInSeconds && isInSeconds != position.isInSeconds) {
            throw UsageError("there are either frames or seconds, not both, in \"" + whole + '"');
        }
        if (position.isInSeconds) isInSeconds = position.isInSeconds;
        m_parameter = setting.parameter;
        m_points.push_back({position.value, setting.value, ParseNumber(text.substr(0, at)).value_or(0.0)});
        text.remove_prefix(std::min(text.find_first_not_of(' ', end), text.size()));
    }
    m_isInSeconds = isInSeconds.value_or(false);
}

ValueWord TimedSetting::At(const ClipPlace& place) const {
    const double position = m_isInSeconds ? place.seconds : static_cast<double>(place.frame);
    const auto after = std::ranges::upper_bound(m_points, position, {}, &Point::position);
    if (after == m_points.begin()) return m_points.front().value;
    if (after == m_points.end()) return m_points.back().value;
    const Point& from = *(after - 1);
    const double share = (position - from.position) / (after->position - from.position);
    ValueWord value = from.value;
    if (m_kind == kKindSlider) {
        value.number = NormalisedSlider(m_range, from.shown + (after->shown - from.shown) * share);
    } else if (m_kind == kKindColour) {
        value.colour = MixedColour(from.value.colour, after->value.colour, share);
    }
    return value;
}

std::vector<ValueWord> TimedSetting::Values() const {
    std::vector<ValueWord> values;
    for (const Point& point : m_points) values.push_back(point.value);
    return values;
}

ValueWord TimedSetting::Largest() const {
    const auto isLess = [this](const Point& a, const Point& b) {
        return m_kind == kKindSlider ? a.value.number < b.value.number : a.value.bits < b.value.bits;
    };
    return std::ranges::max_element(m_points, isLess)->value;
}

std::string TimedSetting::Text(const ParamInfo& param) const {
    if (!Fades()) return ShownValue(param, m_points.front().value);
    std::string text;
    for (const Point& point : m_points) {
        text += (text.empty() ? "" : " ") + ShownValue(param, point.value) + '@' + NumberText(point.position);
        if (m_isInSeconds && point.position > 0.0) text += 's';
    }
    return text;
}

}  // namespace velmora::hosts
