// How the names that people type are matched: effects, presets, parameters and menu items. All programs and plug-ins
// use the same rule.
#pragma once

#include <algorithm>
#include <optional>
#include <span>
#include <string>
#include <string_view>

namespace velmora {

// ASCII letters only, whatever the locale.
[[nodiscard]] constexpr char ToLower(char c) noexcept {
    return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c;
}

[[nodiscard]] inline bool IsSameButForCase(std::string_view a, std::string_view b) noexcept {
    return std::equal(a.begin(), a.end(), b.begin(), b.end(),
                      [](char one, char other) { return ToLower(one) == ToLower(other); });
}

// Only letters and digits count, in either case: "60s-memories" matches "60's Memories", so command lines need no
// quoting. The dictionary's spelling of a preset whose own name is misspelt matches too.
[[nodiscard]] bool IsSameName(std::string_view a, std::string_view b);

// The one of the names that was probably meant: it differs by a few letters or begins as `name` does. Nothing when
// none is near, or when two are equally near.
[[nodiscard]] std::optional<std::string> NearestName(std::string_view name,
                                                     std::span<const std::string> names);

}  // namespace velmora
