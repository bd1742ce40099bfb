// Texts that the plug-ins take from elsewhere in the project. Made by write_texts.py.
#pragma once

#include <string>
#include <string_view>

namespace velmora::hosts::openfx {

// What the effect's parameter of that title does: one or two sentences, the same as on the help page.
[[nodiscard]] std::string HintOf(std::string_view effect, std::string_view title);

// The label of a parameter, group or menu item in a language (two letters); in English where there is none.
[[nodiscard]] std::string LabelOf(std::string_view language, std::string_view english);

}  // namespace velmora::hosts::openfx
