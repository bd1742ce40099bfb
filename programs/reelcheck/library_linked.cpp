#include "programs/reelcheck/library.h"

extern "C" {
velmora::IEffectLibrary* GetEffectsLibrary();
bool CanUnloadDLLNow();
}

namespace velmora::reelcheck {

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

}  // namespace velmora::reelcheck
