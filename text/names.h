// How the names that people type are matched: effects, presets, parameters and menu items. All programs and plug-ins
// use the same rule.
#pragma once

#include <algorithm>
#include <string>
#include <string_view>

namespace velmora {

// ASCII letters only, whatever the locale.
[[nodiscard]] constexpr char ToLower(char c) noexcept {
    return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c;
}

[[nodiscard]] inline bool IsSameButForCase(std::string_view a, std::string_view b) noexcept {
    return std::ranges::equal(a, b, {}, ToLower, ToLower);
}

// Only letters and digits count, in either case: "60s-memories" matches "60's Memories", so command lines need no
// quoting.
[[nodiscard]] inline bool IsSameName(std::string_view a, std::string_view b) {
    const auto essence = [](std::string_view text) {
        std::string kept;
        for (const char c : text) {
            const char lower = ToLower(c);
            if ((lower >= 'a' && lower <= 'z') || (lower >= '0' && lower <= '9')) kept += lower;
        }
        return kept;
    };
    return essence(a) == essence(b);
}

}  // namespace velmora
