// Numbered pictures: which files of a folder belong to the selected one, and the pattern that names them all.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace velmora::reelview {

// `name` is a file's name, `names` lists its folder. Returns the names that differ from it only in the last run of
// digits, in numerical order, up to the first missing number; at least `name` itself.
[[nodiscard]] std::vector<std::u16string> SequenceOf(const std::u16string& name,
                                                     const std::vector<std::u16string>& names);

struct Numbering {
    std::u16string pattern;  // as printf takes it: "frame%04d.png"; a percent sign in a name is doubled
    std::uint64_t first = 0;
};
// Of paths in order. Empty unless they differ only in consecutive numbers, all padded to the same width.
[[nodiscard]] std::optional<Numbering> NumberingOf(const std::vector<std::u16string>& paths);

}  // namespace velmora::reelview
