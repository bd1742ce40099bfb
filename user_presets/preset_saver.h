// The object through which a host lets the user save an effect's settings and load them back.
#pragma once

#include "api/com_object.h"
#include "api/host_api.h"
#include "language/translation.h"

namespace velmora {

// See IPresetSaver for the operations. The only state kept between calls is the last translated call's language and
// library: the library must be alive while an operation runs, but no longer.
class CPresetSaver final : public IPresetSaver {
  public:
    CPresetSaver() noexcept = default;
    CPresetSaver(const CPresetSaver&) = delete;
    CPresetSaver& operator=(const CPresetSaver&) = delete;

    Status VM_CALL QueryInterface(const Guid* iid, void** out) override;
    std::uint32_t VM_CALL AddRef() override;
    std::uint32_t VM_CALL Release() override;
    std::int32_t VM_CALL LoadPreset(void* owner, IEffectLibrary* library, std::uint32_t effectIndex,
                                    PresetRecord* record, const char* languageCode) override;
    std::int32_t VM_CALL SavePreset(void* owner, IEffectLibrary* library, std::uint32_t effectIndex,
                                    PresetRecord* record, const char* languageCode) override;
    // After SavePreset, so that it takes the table from slot 5 on.
    virtual ~CPresetSaver();

  private:
    ReferenceCount m_references;
    TranslationHelper m_translation;
};

// A new saver with one reference; null when there is not enough memory.
[[nodiscard]] IPresetSaver* CreatePresetSaver() noexcept;

}  // namespace velmora
