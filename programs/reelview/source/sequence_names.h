// Numbered pictures: which files of a folder belong to the one that was chosen.
#pragma once

#include <string>
#include <vector>

namespace velmora::reelview {

// `name` is a file's name, `names` those of its folder. The names that differ from it in the last run of digits only,
// in the order of the numbers, as far as no number is missing; at least `name` itself.
[[nodiscard]] std::vector<std::u16string> SequenceOf(const std::u16string& name,
                                                     const std::vector<std::u16string>& names);

}  // namespace velmora::reelview
