// Numbered pictures: which files of a folder belong to the selected one.
#pragma once

#include <string>
#include <vector>

namespace velmora::reelview {

// `name` is a file's name, `names` lists its folder. Returns the names that differ from it only in the last run of
// digits, in numerical order, up to the first missing number; at least `name` itself.
[[nodiscard]] std::vector<std::u16string> SequenceOf(const std::u16string& name,
                                                     const std::vector<std::u16string>& names);

}  // namespace velmora::reelview
