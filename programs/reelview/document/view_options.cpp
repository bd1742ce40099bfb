#include "programs/reelview/document/view_options.h"

#include <cstddef>

namespace velmora::reelview {

ViewOptions ReadViewOptions(const std::vector<std::u16string>& arguments) {
    ViewOptions options;
    for (std::size_t i = 0; i < arguments.size(); ++i) {
        const std::u16string& argument = arguments[i];
        const bool isLibrary = argument == u"--library", isEffect = argument == u"--effect";
        if (isLibrary || isEffect) {
            if (i + 1 == arguments.size()) {
                options.isValid = false;
                break;
            }
            (isLibrary ? options.library : options.effect) = arguments[++i];
        } else if (argument == u"--sequence") {
            options.isSequence = true;
        } else if (argument.starts_with(u"--") || !options.file.empty()) {
            options.isValid = false;
        } else {
            options.file = argument;
        }
    }
    return options;
}

}  // namespace velmora::reelview
