#include "programs/reelview/panel/panel_layout.h"

#include <algorithm>
#include <charconv>
#include <cmath>

#include "text/number_text.h"

namespace velmora::reelview {
namespace {

constexpr int kMostDecimals = 6;

int DecimalsOf(const hosts::ParamInfo& param) {
    const double range = std::abs(double{param.maximum} - param.minimum);
    if (!(range > 0.0) || !std::isfinite(range)) return 0;
    return std::clamp(static_cast<int>(std::ceil(3.0 - std::log10(range) - 1e-6)), 0, kMostDecimals);
}

std::string_view Trimmed(std::string_view text) {
    const std::size_t start = text.find_first_not_of(" \t");
    if (start == std::string_view::npos) return {};
    return text.substr(start, text.find_last_not_of(" \t") - start + 1);
}

std::uint32_t SwapRedAndBlue(std::uint32_t word) {
    return (word & 0x00FF00u) | ((word >> 16) & 0xFFu) | ((word & 0xFFu) << 16);
}

}  // namespace

std::string SliderText(const hosts::ParamInfo& param, double value, char decimalPoint) {
    const double shown = param.minimum + value * (double{param.maximum} - param.minimum);
    if (!std::isfinite(shown) || std::abs(shown) > 1e15) return "?";
    char buffer[64];
    const auto result =
        std::to_chars(buffer, buffer + sizeof buffer, shown, std::chars_format::fixed, DecimalsOf(param));
    std::string text(buffer, result.ptr);
    if (text.find('.') != std::string::npos) {
        text.erase(text.find_last_not_of('0') + 1);
        if (text.ends_with('.')) text.pop_back();
    }
    if (text == "-0") text = "0";
    std::ranges::replace(text, '.', decimalPoint);
    return text;
}

std::optional<double> TypedSlider(const hosts::ParamInfo& param, std::string_view text) {
    std::string plain(Trimmed(text));
    std::ranges::replace(plain, ',', '.');
    if (plain.starts_with("\xE2\x88\x92")) plain.replace(0, 3, "-");  // a true minus sign
    const auto shown = hosts::ParseNumber(plain);
    const double range = double{param.maximum} - param.minimum;
    if (!shown || range == 0.0) return std::nullopt;
    return std::clamp((*shown - param.minimum) / range, 0.0, 1.0);
}

std::string ColourText(std::uint32_t colour) {
    return "#" + hosts::HexText(SwapRedAndBlue(colour & 0xFFFFFFu)).substr(4);
}

std::optional<std::uint32_t> TypedColour(std::string_view text) {
    text = Trimmed(text);
    if (text.starts_with('#')) text.remove_prefix(1);
    if (text.size() != 6) return std::nullopt;
    const auto word = hosts::ParseHexWord(text);
    if (!word) return std::nullopt;
    return SwapRedAndBlue(*word);
}

}  // namespace velmora::reelview
