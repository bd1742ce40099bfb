// The system dialogs that the preset saver shows, and the names of preset files in them.
#pragma once

#include <array>
#include <cstdint>

namespace velmora {

// Zero-terminated.
using DialogFileName = std::array<char16_t, 1024>;

struct FileDialog {
    void* owner;  // window, may be null
    const char16_t* title;
    const char16_t* filter;  // pairs of label and pattern, then an empty text; the first pair is selected
    const char16_t* defaultExtension;
};

// For an existing file. True when the user chose one; otherwise false, and the name is undefined.
[[nodiscard]] bool ShowOpenDialog(const FileDialog& dialog, DialogFileName& fileName) noexcept;
// For a file to write; asks before an existing one is accepted.
[[nodiscard]] bool ShowSaveDialog(const FileDialog& dialog, DialogFileName& fileName) noexcept;

// With an exclamation icon and an OK button, owned by the foreground window.
void ShowWarning(const char16_t* text, const char16_t* caption) noexcept;

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
