// Without a Windows desktop there are no dialogs and no help control: the services implement their interface and do nothing.
#include "desktop/shell_services.h"

namespace velmora::support {
namespace {

class PortableShellServices final : public IShellServices {
  public:
    bool VM_CALL Start(void*, com::IUnknown*, const char*, std::int32_t) override {
        const bool starts = !m_started;
        m_started = true;
        return starts;
    }
    bool VM_CALL KnobsDragVertical() override { return false; }
    std::int32_t VM_CALL ShowOptions(void*) override { return 0; }
    void VM_CALL ShutDown() override { m_started = false; }
    std::int32_t VM_CALL ShowHelp(void*, std::int32_t, std::int32_t) override { return 0; }

    TextSources sources;

  private:
    bool m_started = false;
};

constinit PortableShellServices services;

}  // namespace

IShellServices& ShellServices() noexcept {
    return services;
}

void OfferTextSource(ModuleHandle module, com::IUnknown* library, const char* helpFileName) noexcept {
    services.sources.Add(library);
    services.Start(module, library, helpFileName, 1);
}

void WithdrawTextSource(com::IUnknown* library) noexcept {
    services.sources.Remove(library);
    if (services.sources.Count() == 0) services.ShutDown();
}

}  // namespace velmora::support
