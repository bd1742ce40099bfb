// Natively the library is linked into this program and leaves dialogs to it, so here they are always stand-ins.

#include <algorithm>
#include <cstring>

#include "user_presets/dialogs.h"
#include "programs/reelcheck/dialog_answers.h"
#include "programs/reelcheck/library.h"

extern "C" {
velmora::IEffectLibrary* GetEffectsLibrary();
bool CanUnloadDLLNow();
}

namespace velmora {
namespace {

const char* g_path = nullptr;
int g_fileDialogs = 0, g_messages = 0;

bool Answer(DialogFileName& fileName) noexcept {
    ++g_fileDialogs;
    fileName.fill(0);
    if (g_path == nullptr) return false;
    std::copy_n(g_path, std::min(std::strlen(g_path), fileName.size() - 1), fileName.begin());  // plain ASCII
    return true;
}

}  // namespace

bool ShowOpenDialog(const FileDialog&, DialogFileName& fileName) noexcept {
    return Answer(fileName);
}
bool ShowSaveDialog(const FileDialog&, DialogFileName& fileName) noexcept {
    return Answer(fileName);
}
void ShowWarning(const char16_t*, const char16_t*) noexcept {
    ++g_messages;
}

namespace reelcheck {

Library::Library(void* module) noexcept
    : getEffectsLibrary(GetEffectsLibrary), canUnload(CanUnloadDLLNow), m_module(module) {}

Library::Library(const std::string&) : Library(nullptr) {}

Library::~Library() = default;

std::unique_ptr<Library> Library::TryLoad(const std::string& path) {
    return std::make_unique<Library>(path);
}

bool IsModule() noexcept {
    return false;
}

void InstallDialogHooks() {}

DialogAnswers::DialogAnswers(const char* path) noexcept {
    g_path = path;
    g_fileDialogs = g_messages = 0;
}
DialogAnswers::~DialogAnswers() {
    g_path = nullptr;
}
int DialogAnswers::FileDialogs() const noexcept {
    return g_fileDialogs;
}
int DialogAnswers::Messages() const noexcept {
    return g_messages;
}
int DialogAnswers::Programs() const noexcept {
    return 0;
}

DialogCanceller::DialogCanceller() noexcept = default;
DialogCanceller::~DialogCanceller() = default;
int DialogCanceller::Cancelled() const noexcept {
    return 0;
}

}  // namespace reelcheck
}  // namespace velmora
