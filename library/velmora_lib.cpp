#include "library/velmora_lib.h"

#include <new>
#include <string>

#include "effects/film_effect.h"
#include "platform/float_guard.h"
#include "library/frame_processor.h"
#include "user_presets/preset_saver.h"
#include "desktop/shell_services.h"

namespace velmora {
namespace {

static_assert(kReelEffectsMajor == VELMORA_VERSION_MAJOR && kReelEffectsMinor == VELMORA_VERSION_MINOR);

constexpr char kHelpFile[] = "VMReelEffects.chm";
constexpr char16_t kLanguageModule[] = u"VMLang.dll";
constexpr char16_t kLanguageFile[] = u"VMReelEffectsLang.xml";

// A module without the export may be freed.
bool AllowsUnload(support::ModuleHandle module) noexcept {
    const auto canUnload =
        reinterpret_cast<CanUnloadDLLNowFunction>(support::FindExport(module, "CanUnloadDLLNow"));
    return canUnload == nullptr || canUnload();
}

// A module does not want to be freed while another library object uses its texts. The references that this leaves are
// released when the module next allows it; else it would stay in the process for ever.
struct KeptModule {
    support::ModuleHandle module = nullptr;
    int references = 0;
};
constinit KeptModule keptModule;

void Keep(support::ModuleHandle module) noexcept {
    if (module != keptModule.module) keptModule = {module, 0};
    ++keptModule.references;
}

void FreeWithKeptReferences(support::ModuleHandle module) noexcept {
    if (module != nullptr && module == keptModule.module) {
        for (; keptModule.references > 0; --keptModule.references) support::UnloadModule(module);
        keptModule = {};
    }
    support::UnloadModule(module);  // also when none is held: freeing null does nothing
}

// The path of a file in the library's folder; empty when that is unknown.
std::u16string BesideLibrary(const char16_t* name) noexcept try {
    std::u16string path = support::ModuleFolder(support::OwnModule());
    return path.empty() ? path : path + name;
} catch (...) {
    return {};
}

support::ModuleHandle LoadBesideOrByName(const char16_t* name) noexcept {
    const std::u16string path = BesideLibrary(name);
    support::ModuleHandle module = path.empty() ? nullptr : support::LoadModule(path.c_str());
    return module != nullptr ? module : support::LoadModule(name);
}

}  // namespace

CRsVelmoraLib::CRsVelmoraLib() noexcept {
    support::OfferTextSource(support::OwnModule(), static_cast<IEffectLibrary*>(this), kHelpFile);
    // Frames read only settings that have been described once.
    if (MasterSettingsList* settings = CurrentMasterSettings()) settings->ExposeAll();
    m_hasLanguage = LoadLanguage(kLanguageModule, kLanguageFile);
}

CRsVelmoraLib::~CRsVelmoraLib() {
    support::WithdrawTextSource(static_cast<IEffectLibrary*>(this));
    m_parser.Reset();  // its code is in the module
    FreeLanguageModule();
}

bool CRsVelmoraLib::FreeLanguageModule() noexcept {
    if (m_languageModule != nullptr && !AllowsUnload(m_languageModule)) {
        Keep(m_languageModule);
        return false;
    }
    FreeWithKeptReferences(m_languageModule);
    m_languageModule = nullptr;
    return true;
}

bool CRsVelmoraLib::LoadLanguage(const char16_t* moduleName, const char16_t* fileName) noexcept {
    if (m_parser || moduleName == nullptr || fileName == nullptr) return false;
    if (m_languageModule != nullptr) {
        FreeLanguageModule();
        m_languageModule = nullptr;  // a module that must not be unloaded is abandoned, not freed
    }
    m_languageModule = LoadBesideOrByName(moduleName);
    if (m_languageModule == nullptr) return false;
    const auto getParser =
        reinterpret_cast<GetLangXMLParserFunction>(support::FindExport(m_languageModule, "GetLangXMLParser"));
    if (getParser == nullptr) return false;
    m_parser = Reference<LangXMLParser>::Adopt(getParser());
    if (!m_parser) return false;
    const std::u16string path = BesideLibrary(fileName);
    return m_parser->Load(path.c_str()) || m_parser->Load(fileName);
}

// IMultiLingual is available only when there are texts.
Status VM_CALL CRsVelmoraLib::QueryInterface(const Guid* iid, void** out) {
    IEffectLibrary* const library = this;
    const Interface interfaces[] = {{&kIidUnknown, library}, {&kIidEffectLibrary, library}};
    Status status = FindInterface(interfaces, iid, out);
    if (status == kStatusNoInterface && m_hasLanguage) {
        const Interface texts[] = {{&kIidMultiLingual, static_cast<IMultiLingual*>(this)}};
        status = FindInterface(texts, iid, out);
    }
    if (status == kStatusOk) AddRef();
    return status;
}

std::uint32_t VM_CALL CRsVelmoraLib::AddRef() {
    return m_references.Add();
}

std::uint32_t VM_CALL CRsVelmoraLib::Release() {
    const std::uint32_t left = m_references.Drop();
    if (left != 0) return left;
    const FloatGuard guard;
    delete this;
    return 0;
}

const char* VM_CALL CRsVelmoraLib::GetLibraryName() {
    return kLibraryName;
}

IVideoEffect* VM_CALL CRsVelmoraLib::CreateEffect(std::uint32_t index) {
    const FloatGuard guard;
    return effects::CreateEffectByIndex(index);
}

std::int32_t VM_CALL CRsVelmoraLib::ShowHelp(void* owner, std::int32_t topic) {
    constexpr std::int32_t kInViewer = 1;
    return GetShellServices()->ShowHelp(owner, topic, kInViewer);
}

IShellServices* VM_CALL CRsVelmoraLib::GetShellServices() {
    return &support::ShellServices();
}

IFrameProcessor* VM_CALL CRsVelmoraLib::CreateFrameProcessor() {
    const FloatGuard guard;
    return new (std::nothrow) FrameProcessor;
}

IPresetSaver* VM_CALL CRsVelmoraLib::CreatePresetSaver() {
    const FloatGuard guard;
    return velmora::CreatePresetSaver();
}

std::int32_t VM_CALL CRsVelmoraLib::LookUpText(const char* languageCode, std::int32_t category,
                                               const char* key, const char16_t* fallback, char16_t* buffer,
                                               std::int32_t capacity, std::int32_t* found) {
    if (!m_hasLanguage || !m_parser) return 0;
    const FloatGuard guard;
    return m_parser->LookUpText(languageCode, category, key, fallback, buffer, capacity, found);
}

std::int32_t VM_CALL CRsVelmoraLib::GetText(const char* languageCode, std::int32_t category, const char* key,
                                            char16_t* buffer, std::int32_t capacity) {
    if (!m_hasLanguage || !m_parser) return 0;
    const FloatGuard guard;
    return m_parser->GetText(languageCode, category, key, buffer, capacity);
}

}  // namespace velmora

velmora::IEffectLibrary* VM_CALL GetEffectsLibrary() {
    const velmora::FloatGuard guard;
    velmora::SetBuildMode(velmora::kBuildModeReady);
    if (!velmora::RenewMasterSettings()) return nullptr;
    return new (std::nothrow) velmora::CRsVelmoraLib;
}

bool VM_CALL CanUnloadDLLNow() {
    return velmora::DLLDependentObject::LiveObjectCount() == 0;
}
