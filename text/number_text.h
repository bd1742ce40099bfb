// Numbers as texts, independent of the locale: as typed on a command line, with sizes and rates, and as preset files hold
// them.
#pragma once

#include <cstdint>
#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>

namespace velmora::hosts {

struct FrameSize {
    std::int32_t width = 0;
    std::int32_t height = 0;
};

// Frames per second as a fraction.
struct FrameRate {
    std::int32_t numerator = 0;
    std::int32_t denominator = 1;

    // The time of frame `index` of a stream of this rate, in seconds.
    [[nodiscard]] double SecondsAt(std::int64_t index) const {
        return static_cast<double>(index) * denominator / numerator;
    }
};

// Each parses the whole text or returns nothing.
std::optional<double> ParseNumber(std::string_view text);          // finite
std::optional<std::int64_t> ParseInteger(std::string_view text);   // decimal
std::optional<std::uint32_t> ParseHexWord(std::string_view text);  // "0x1F" or "1F", at most 32 bits
std::optional<FrameSize> ParseSize(std::string_view text);         // "1920x1080", each 1..32768
std::optional<FrameRate> ParseRate(std::string_view text);         // "25", "29.97", "30000/1001"
std::optional<double> ParseTime(std::string_view text);            // seconds, "MM:SS.s" or "HH:MM:SS.s", >= 0

// As short as possible, with up to six significant digits: "4", "24.5", "0.2".
std::string NumberText(double value);

// Eight digits after "0x".
std::string HexText(std::uint32_t word);

// An error in what the user asked for: one line that says what is wrong and, where it helps, what would be right. The
// programs' main functions catch and print it.
class UsageError : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

}  // namespace velmora::hosts

namespace velmora {

// Numbers in preset files (c_locale_numbers.cpp): always a point, never a comma.

// Like "%d".
[[nodiscard]] std::string FormatInteger(int value);
// Like "%f": six digits after the point, "-0.000000" for negative zero; "nan", "-nan", "inf" and "-inf" for values that
// are not finite.
[[nodiscard]] std::string FormatNumber(double value);

// Read the number at the start of a text, as scanf's "%d" and "%lf" do in the "C" locale: blanks and a sign may precede
// it; anything after it is ignored. False, and nothing written, when there is no number. An integer that does not fit
// becomes the nearest that does; a number that does not fit becomes infinite or 0. "inf", "nan" and hexadecimal numbers
// are read too.
[[nodiscard]] bool ParseInteger(const char* text, int* value) noexcept;
[[nodiscard]] bool ParseNumber(const char* text, double* value) noexcept;

}  // namespace velmora
