// Natively the faulty library is linked in place of the real one.

#include "programs/reelcheck/library.h"
#include "tests/programs/reelcheck/faulty_library.h"

extern "C" {
velmora::IEffectLibrary* GetEffectsLibrary();
bool CanUnloadDLLNow();
}

namespace velmora::reelcheck {

Library::Library(void* module) noexcept
    : getEffectsLibrary([] { return testing::MakeFaulty(GetEffectsLibrary()); }),
      canUnload([] { return testing::FaultIs("lets-go-early") || CanUnloadDLLNow(); }),
      m_module(module) {}

Library::Library(const std::string&) : Library(nullptr) {}

Library::~Library() = default;

std::unique_ptr<Library> Library::TryLoad(const std::string& path) {
    return std::make_unique<Library>(path);
}

bool IsModule() noexcept {
    return false;
}

}  // namespace velmora::reelcheck
