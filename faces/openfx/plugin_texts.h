// Texts that the plug-ins take from elsewhere in the project. Made by write_texts.py.
#pragma once

#include <string>
#include <string_view>

namespace velmora::hosts::openfx {

// What the effect's parameter of that title does: one or two sentences, the same as on the help page.
[[nodiscard]] std::string HintOf(std::string_view effect, std::string_view title);

}  // namespace velmora::hosts::openfx
