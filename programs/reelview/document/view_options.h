// The command line:   reelview [--library PATH] [--effect NAME] [--sequence] [FILE]
#pragma once

#include <string>
#include <vector>

namespace velmora::reelview {

struct ViewOptions {
    std::u16string library;  // empty: next to the program
    std::u16string effect;
    std::u16string file;
    bool isSequence = false;  // the file is one of a numbered sequence
    bool isValid = true;
};

// `arguments` without the program's name.
[[nodiscard]] ViewOptions ReadViewOptions(const std::vector<std::u16string>& arguments);

}  // namespace velmora::reelview
