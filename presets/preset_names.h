// Names of preset files in the file dialogs: the extension and the file-type filter.
#pragma once

#include <array>
#include <cstdint>

namespace velmora {

// Zero-terminated, at most 19 characters.
using PresetExtension = std::array<char16_t, 20>;
// Label and pattern, each zero-terminated, then an empty text.
using PresetFilter = std::array<char16_t, 100>;

// "fxp", the library's three-letter code ("unk" for an unknown library) and a letter for the effect, from "a". "prs"
// when there is no library.
[[nodiscard]] PresetExtension MakePresetExtension(const char* libraryName,
                                                  std::uint32_t effectIndex) noexcept;

// "Preset Files (*.ext)" and "*.ext". `labelWord` (may be null) replaces "Preset Files"; only this part is cut when the
// buffer is too small.
[[nodiscard]] PresetFilter MakePresetFilter(const char* libraryName, std::uint32_t effectIndex,
                                            const char16_t* labelWord) noexcept;

}  // namespace velmora
