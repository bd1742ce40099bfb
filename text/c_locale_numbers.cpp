#include "text/number_text.h"

#include <cctype>
#include <charconv>
#include <cstring>
#include <limits>

namespace velmora {

namespace {

struct SignedText {
    const char* digits;
    const char* end;
    bool isNegative;
};

SignedText SkipBlanksAndSign(const char* text) {
    while (*text == ' ' || (*text >= '\t' && *text <= '\r')) ++text;
    const bool isNegative = *text == '-';
    if (*text == '-' || *text == '+') ++text;
    return {text, text + std::strlen(text), isNegative};
}

bool IsDigit(char c) {
    return c >= '0' && c <= '9';
}

// Distinguishes numbers that are too large from ones that are too small: both are hundreds of decimal places away from
// 1.
bool IsLarge(const char* digits, const char* end, int digitBase) {
    long long places = 0;  // of the first significant digit, counted from the point
    bool hasPoint = false;
    bool isSignificant = false;
    const char* p = digits;
    for (; p < end; ++p) {
        if (*p == '.') {
            hasPoint = true;
        } else if (digitBase == 10 ? !IsDigit(*p) : *p == 'p' || *p == 'P') {
            break;
        } else {
            isSignificant = isSignificant || *p != '0';
            if (isSignificant && !hasPoint) ++places;
            if (!isSignificant && hasPoint) --places;
        }
    }
    if (digitBase == 16) places *= 4;
    long long exponent = 0;
    if (p < end) {
        ++p;
        const bool isNegative = *p == '-';
        if (*p == '-' || *p == '+') ++p;
        for (; p < end && IsDigit(*p); ++p) {
            if (exponent < 1'000'000'000'000) exponent = exponent * 10 + (*p - '0');
        }
        if (isNegative) exponent = -exponent;
    }
    return places + exponent > 0;
}

}  // namespace

std::string FormatInteger(int value) {
    return std::to_string(value);
}

std::string FormatNumber(double value) {
    char buffer[400];  // the largest double has 309 digits before the point
    const auto result = std::to_chars(buffer, buffer + sizeof buffer, value, std::chars_format::fixed, 6);
    return {buffer, result.ptr};
}

bool ParseInteger(const char* text, int* value) noexcept {
    const SignedText number = SkipBlanksAndSign(text);
    if (!IsDigit(*number.digits)) return false;  // from_chars would accept a second sign
    const char* start = number.isNegative ? number.digits - 1 : number.digits;
    using Limits = std::numeric_limits<int>;
    if (std::from_chars(start, number.end, *value).ec == std::errc::result_out_of_range) {
        *value = number.isNegative ? Limits::min() : Limits::max();
    }
    return true;
}

bool ParseNumber(const char* text, double* value) noexcept {
    const SignedText number = SkipBlanksAndSign(text);
    const char* digits = number.digits;
    if (*digits == '-') return false;
    const bool isHexadecimal =
        digits[0] == '0' && (digits[1] == 'x' || digits[1] == 'X') &&
        std::isxdigit(static_cast<unsigned char>(digits[digits[2] == '.' ? 3 : 2])) != 0;
    if (isHexadecimal) digits += 2;
    const auto format = isHexadecimal ? std::chars_format::hex : std::chars_format::general;
    double magnitude = 0;
    const auto result = std::from_chars(digits, number.end, magnitude, format);
    if (result.ec == std::errc::invalid_argument) return false;
    if (result.ec == std::errc::result_out_of_range) {
        const bool isLarge = IsLarge(digits, result.ptr, isHexadecimal ? 16 : 10);
        magnitude = isLarge ? std::numeric_limits<double>::infinity() : 0;
    }
    *value = number.isNegative ? -magnitude : magnitude;
    return true;
}

}  // namespace velmora
