// The system dialogs that the preset saver shows. Each returns once the user has closed it.
#pragma once

#include <array>

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

}  // namespace velmora
