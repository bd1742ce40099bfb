// Numbers in preset files, without regard to the host's locale: always a point, never a comma.
#pragma once

#include <string>

namespace velmora {

// As "%d".
[[nodiscard]] std::string FormatInteger(int value);
// As "%f": six digits after the point, "-0.000000" for the negative zero; "nan", "-nan", "inf" and "-inf"
// for what is no finite number.
[[nodiscard]] std::string FormatNumber(double value);

// Read the number that a text begins with, as scanf's "%d" and "%lf" do in the "C" locale: after blanks and an
// optional sign; what follows the number is ignored. False, and nothing written, when there is no number. An
// integer that does not fit is the nearest that does; a number that does not fit is infinite or 0. "inf" and
// "nan" and hexadecimal numbers are read too.
[[nodiscard]] bool ParseInteger(const char* text, int* value) noexcept;
[[nodiscard]] bool ParseNumber(const char* text, double* value) noexcept;

}  // namespace velmora
