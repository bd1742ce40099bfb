// The library object, and the DLL's two exports.
#pragma once

#include "api/com_object.h"
#include "api/host_api.h"
#include "api/reference.h"
#include "effects/process_state.h"
#include "language/lang_parser.h"
#include "platform/platform.h"

namespace velmora {

class CRsVelmoraLib final : public DLLDependentObject, public IEffectLibrary, public IMultiLingual {
  public:
    // Offers its texts to the shell services, exposes the master settings and loads the language.
    CRsVelmoraLib() noexcept;

    Status VM_CALL QueryInterface(const Guid* iid, void** out) override;
    std::uint32_t VM_CALL AddRef() override;
    std::uint32_t VM_CALL Release() override;

    const char* VM_CALL GetLibraryName() override;
    IVideoEffect* VM_CALL CreateEffect(std::uint32_t index) override;
    std::int32_t VM_CALL ShowHelp(void* owner, std::int32_t topic) override;
    IShellServices* VM_CALL GetShellServices() override;
    IFrameProcessor* VM_CALL CreateFrameProcessor() override;
    IPresetSaver* VM_CALL CreatePresetSaver() override;

    std::int32_t VM_CALL LookUpText(const char* languageCode, std::int32_t category, const char* key,
                                    const char16_t* fallback, char16_t* buffer, std::int32_t capacity,
                                    std::int32_t* found) override;
    std::int32_t VM_CALL GetText(const char* languageCode, std::int32_t category, const char* key,
                                 char16_t* buffer, std::int32_t capacity) override;

  private:
    ~CRsVelmoraLib() override;

    // Loads the module from the library's folder, or else by its bare name, and makes its parser load the file in the
    // same way. False when there is no module, no parser or no readable file, or when a name is missing.
    bool LoadLanguage(const char16_t* moduleName, const char16_t* fileName) noexcept;
    // False when the module's "CanUnloadDLLNow" forbids unloading; the handle is then kept too.
    bool FreeLanguageModule() noexcept;

    ReferenceCount m_references;
    Reference<LangXMLParser> m_parser;
    support::ModuleHandle m_languageModule = nullptr;
    bool m_hasLanguage = false;
};

}  // namespace velmora

extern "C" {
velmora::IEffectLibrary* VM_CALL GetEffectsLibrary();
bool VM_CALL CanUnloadDLLNow();
}
