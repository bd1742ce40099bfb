// Wraps the real library and records what the host passes to it (record.h). REELVIEW_FAULT makes it fail.

#include <windows.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <iterator>

#include "api/host_api.h"
#include "record.h"

namespace velmora {
namespace {

bool FaultIs(const char* name) {
    const char* const fault = std::getenv("REELVIEW_FAULT");
    return fault != nullptr && std::strcmp(fault, name) == 0;
}

void Crash() {
    // An address in the system's half of memory; page 0 is mapped under Wine.
    int* volatile nowhere = reinterpret_cast<int*>(std::uintptr_t{0xFFFFFF00u});
    *nowhere = 1;
}

void Write(IVideoEffect& effect, IVideoHost& host) {
    static const char* const name = std::getenv("REELVIEW_RECORD");
    static reelview::test::Record* const record =
        name != nullptr ? reelview::test::OpenRecord(name, false) : nullptr;
    if (record == nullptr) return;
    InterlockedIncrement(&record->turn);
    std::snprintf(record->effect, sizeof record->effect, "%s", effect.GetName());
    ParamDescriptor descriptor = {};
    record->count = 0;
    while (record->count < std::size(record->values) && effect.GetParamInfo(record->count, &descriptor)) {
        ValueCell cell = {};
        host.GetParamValue(record->count, &cell, descriptor.kind);
        record->values[record->count++] = cell.value.bits;
    }
    InterlockedIncrement(&record->turn);
}

class RecordingEffect final : public IVideoEffect {
  public:
    explicit RecordingEffect(IVideoEffect* effect) : m_effect(effect) {}
    virtual ~RecordingEffect() = default;
    Status VM_CALL QueryInterface(const Guid* iid, void** out) override {
        return m_effect->QueryInterface(iid, out);
    }
    std::uint32_t VM_CALL AddRef() override { return m_effect->AddRef(); }
    std::uint32_t VM_CALL Release() override {
        const std::uint32_t left = m_effect->Release();
        if (left == 0) delete this;
        return left;
    }
    const char* VM_CALL GetName() override { return m_effect->GetName(); }
    std::int32_t VM_CALL GetKind() override { return m_effect->GetKind(); }
    bool VM_CALL GetParamInfo(std::uint32_t index, ParamDescriptor* descriptor) override {
        if (FaultIs("describes-for-ever")) return m_effect->GetParamInfo(0, descriptor);
        return m_effect->GetParamInfo(index, descriptor);
    }
    bool VM_CALL Process(IVideoHost* host, const FrameRecord* source, void* argument,
                         const FrameRecord* destination, const TimingRecord* timing) override {
        if (FaultIs("crashes")) Crash();
        if (FaultIs("aborts")) std::abort();
        if (FaultIs("ends-the-process")) ExitProcess(7);
        if (FaultIs("raises")) RaiseException(0xE0000001u, EXCEPTION_NONCONTINUABLE, 0, nullptr);
        if (FaultIs("refuses")) return false;
        if (FaultIs("hangs")) Sleep(INFINITE);
        // Thumbnails of presets have values of their own, so they are not recorded.
        if (source->width > 200) Write(*m_effect, *host);
        return m_effect->Process(host, source, argument, destination, timing);
    }
    const char* VM_CALL GetPresetName(std::uint32_t index) override { return m_effect->GetPresetName(index); }
    bool VM_CALL GetPresetValue(std::uint32_t preset, std::uint32_t parameter, PresetCell* cell) override {
        return m_effect->GetPresetValue(preset, parameter, cell);
    }

  private:
    IVideoEffect* m_effect;
};

class RecordingLibrary final : public IEffectLibrary {
  public:
    explicit RecordingLibrary(IEffectLibrary* library) : m_library(library) {}
    virtual ~RecordingLibrary() = default;
    Status VM_CALL QueryInterface(const Guid* iid, void** out) override {
        return m_library->QueryInterface(iid, out);
    }
    std::uint32_t VM_CALL AddRef() override { return m_library->AddRef(); }
    std::uint32_t VM_CALL Release() override {
        const std::uint32_t left = m_library->Release();
        if (left == 0) delete this;
        return left;
    }
    const char* VM_CALL GetLibraryName() override { return m_library->GetLibraryName(); }
    IVideoEffect* VM_CALL CreateEffect(std::uint32_t index) override {
        IVideoEffect* const effect = m_library->CreateEffect(index);
        return effect != nullptr ? new RecordingEffect(effect) : nullptr;
    }
    std::int32_t VM_CALL ShowHelp(void* owner, std::int32_t topic) override {
        if (FaultIs("aborts-in-help")) std::abort();
        return m_library->ShowHelp(owner, topic);
    }
    IShellServices* VM_CALL GetShellServices() override { return m_library->GetShellServices(); }
    IFrameProcessor* VM_CALL CreateFrameProcessor() override { return m_library->CreateFrameProcessor(); }
    IPresetSaver* VM_CALL CreatePresetSaver() override { return m_library->CreatePresetSaver(); }

  private:
    IEffectLibrary* m_library;
};

}  // namespace
}  // namespace velmora

extern "C" velmora::IEffectLibrary* VM_CALL GetEffectsLibrary() {
    if (velmora::FaultIs("crashes-at-once")) velmora::Crash();
    // The real library is next to the program.
    static const HMODULE module = LoadLibraryA("VMReelEffects.dll");
    void* const entry = reinterpret_cast<void*>(GetProcAddress(module, "GetEffectsLibrary"));
    return new velmora::RecordingLibrary(reinterpret_cast<velmora::GetEffectsLibraryFunction>(entry)());
}

extern "C" bool VM_CALL CanUnloadDLLNow() {
    return false;
}
