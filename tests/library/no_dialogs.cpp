// A native test has no file dialogs: every dialog is cancelled, messages are not shown.

#include "presets/dialogs.h"

namespace velmora {

bool ShowOpenDialog(const FileDialog&, DialogFileName&) noexcept {
    return false;
}
bool ShowSaveDialog(const FileDialog&, DialogFileName&) noexcept {
    return false;
}
void ShowWarning(const char16_t*, const char16_t*) noexcept {}

}  // namespace velmora
