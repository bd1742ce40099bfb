// Numbers in preset files, independent of the host's locale: always a point, never a comma.
#pragma once

#include <string>

namespace velmora {

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
