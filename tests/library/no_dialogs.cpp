// Native tests have no file dialogs: every dialog is cancelled and messages are not shown.

#include "user_presets/dialogs.h"

namespace velmora {

bool ShowOpenDialog(const FileDialog&, DialogFileName&) noexcept {
    return false;
}
bool ShowSaveDialog(const FileDialog&, DialogFileName&) noexcept {
    return false;
}
void ShowWarning(const char16_t*, const char16_t*) noexcept {}

}  // namespace velmora
