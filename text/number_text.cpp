#include "text/number_text.h"

#include <charconv>
#include <cmath>

namespace velmora::hosts {
namespace {

template <class Number, class... Format>
std::optional<Number> ParseWhole(std::string_view text, Format... format) {
    Number value{};
    const char* end = text.data() + text.size();
    const auto result = std::from_chars(text.data(), end, value, format...);
    if (result.ec != std::errc() || result.ptr != end) return std::nullopt;
    return value;
}

constexpr std::int64_t kLargestSide = 32768;
constexpr double kLongestTime = 1e9;  // seconds; times in the ticks of any clip then fit 64 bits

}  // namespace

std::optional<double> ParseNumber(std::string_view text) {
    if (text.starts_with('+')) text.remove_prefix(1);
    const auto value = ParseWhole<double>(text);
    return value && std::isfinite(*value) ? value : std::nullopt;
}

std::optional<std::int64_t> ParseInteger(std::string_view text) {
    return ParseWhole<std::int64_t>(text, 10);
}

std::optional<std::uint32_t> ParseHexWord(std::string_view text) {
    if (text.starts_with("0x") || text.starts_with("0X")) text.remove_prefix(2);
    return ParseWhole<std::uint32_t>(text, 16);
}

std::optional<FrameSize> ParseSize(std::string_view text) {
    const std::size_t cross = text.find('x');
    if (cross == std::string_view::npos) return std::nullopt;
    const auto width = ParseInteger(text.substr(0, cross));
    const auto height = ParseInteger(text.substr(cross + 1));
    if (!width || !height || *width < 1 || *height < 1) return std::nullopt;
    if (*width > kLargestSide || *height > kLargestSide) return std::nullopt;
    return FrameSize{static_cast<std::int32_t>(*width), static_cast<std::int32_t>(*height)};
}

std::optional<FrameRate> ParseRate(std::string_view text) {
    const std::size_t slash = text.find_first_of("/:");
    if (slash == std::string_view::npos) {
        const auto rate = ParseNumber(text);
        if (!rate || *rate < 0.001 || *rate > 10000.0) return std::nullopt;
        if (*rate == std::floor(*rate)) return FrameRate{static_cast<std::int32_t>(*rate), 1};
        // NTSC rates are usually written 23.976, 29.97 and 59.94.
        const double ntsc = std::round(*rate * 1.001);
        if (std::abs(ntsc / 1.001 - *rate) < 0.005) {
            return FrameRate{static_cast<std::int32_t>(ntsc) * 1000, 1001};
        }
        return FrameRate{static_cast<std::int32_t>(std::lround(*rate * 1000.0)), 1000};
    }
    const auto numerator = ParseInteger(text.substr(0, slash));
    const auto denominator = ParseInteger(text.substr(slash + 1));
    if (!numerator || !denominator || *numerator < 1 || *denominator < 1) return std::nullopt;
    if (*numerator > 1000000000 || *denominator > 1000000000) return std::nullopt;
    return FrameRate{static_cast<std::int32_t>(*numerator), static_cast<std::int32_t>(*denominator)};
}

std::optional<double> ParseTime(std::string_view text) {
    double seconds = 0.0;
    for (int part = 0; part < 3; ++part) {
        const std::size_t colon = text.find(':');
        const bool isLast = colon == std::string_view::npos;
        const auto value = ParseNumber(text.substr(0, colon));
        if (!value || *value < 0.0 || (!isLast && *value != std::floor(*value))) return std::nullopt;
        seconds = seconds * 60.0 + *value;
        if (seconds > kLongestTime) return std::nullopt;
        if (isLast) return seconds;
        text.remove_prefix(colon + 1);
    }
    return std::nullopt;
}

std::string NumberText(double value) {
    char buffer[32];
    const auto result = std::to_chars(buffer, buffer + sizeof buffer, value, std::chars_format::general, 6);
    return std::string(buffer, result.ptr);
}

std::string HexText(std::uint32_t word) {
    char digits[8];
    const auto result = std::to_chars(digits, digits + sizeof digits, word, 16);
    const std::string text(digits, result.ptr);
    return "0x" + std::string(8 - text.size(), '0') + text;
}

}  // namespace velmora::hosts
