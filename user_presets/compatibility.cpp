#include "user_presets/preset_file.h"

#include <cstring>

#include "api/reference.h"

namespace velmora {

namespace {

// A full field has no terminator.
bool IsName(const char (&field)[kPresetNameWidth], const char* name) {
    return name != nullptr && std::strncmp(field, name, sizeof field) == 0;
}

bool HasNames(const PresetRecord& record, const char* libraryName, const char* effectName) {
    return IsName(record.libraryName, libraryName) && IsName(record.effectName, effectName);
}

bool HasKind(const PresetRecord& record, std::uint32_t index, std::uint32_t kind) {
    return index < kPresetCellCapacity && static_cast<std::int32_t>(index) < record.count &&
           record.values[index].kind == kind;
}

bool IsEffectOf(IEffectLibrary& library, IVideoEffect& effect, const PresetRecord& record) {
    if (!HasNames(record, library.GetLibraryName(), effect.GetName())) return false;
    for (std::uint32_t index = 0;; ++index) {
        ParamDescriptor descriptor = {};
        if (!effect.GetParamInfo(index, &descriptor)) return true;
        if (!HasKind(record, index, descriptor.kind)) return false;
    }
}

}  // namespace

bool IsCompatible(const char* libraryName, const char* effectName, std::span<const std::uint32_t> kinds,
                  const PresetRecord* record) noexcept {
    if (record == nullptr || !HasNames(*record, libraryName, effectName)) return false;
    for (std::uint32_t index = 0; index < kinds.size(); ++index) {
        if (!HasKind(*record, index, kinds[index])) return false;
    }
    return true;
}

bool IsCompatible(IEffectLibrary* library, std::uint32_t effectIndex, const PresetRecord* record) noexcept {
    if (record == nullptr) return false;
    if (library == nullptr) return record->count > 0;
    const auto effect = Reference<IVideoEffect>::Adopt(library->CreateEffect(effectIndex));
    return effect && IsEffectOf(*library, *effect, *record);
}

}  // namespace velmora
