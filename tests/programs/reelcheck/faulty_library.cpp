#include "tests/programs/reelcheck/faulty_library.h"

#include <xmmintrin.h>

#include <atomic>
#include <cstdlib>
#include <cstring>
#include <new>

namespace velmora::testing {
namespace {

// The real object returned one of its interfaces; replaces it by this object's.
template <typename Interface>
Status Replace(Interface* real, Interface* faulty, void** out) {
    real->Release();
    faulty->AddRef();
    *out = faulty;
    return kStatusOk;
}

class FaultyEffect final : public IVideoEffect {
  public:
    explicit FaultyEffect(IVideoEffect* effect) : m_effect(effect) {}
    virtual ~FaultyEffect() {
        if (!FaultIs("leaks")) m_effect->Release();
    }

    Status VM_CALL QueryInterface(const Guid* iid, void** out) override {
        const Status status = m_effect->QueryInterface(iid, out);
        return status == kStatusOk && *out == m_effect ? Replace<IVideoEffect>(m_effect, this, out) : status;
    }
    std::uint32_t VM_CALL AddRef() override { return ++m_count; }
    std::uint32_t VM_CALL Release() override {
        const std::uint32_t left = --m_count;
        if (left == 0) delete this;
        return FaultIs("counts-wrongly") ? left + 1 : left;
    }
    const char* VM_CALL GetName() override { return m_effect->GetName(); }
    std::int32_t VM_CALL GetKind() override { return m_effect->GetKind(); }
    bool VM_CALL GetParamInfo(std::uint32_t index, ParamDescriptor* descriptor) override {
        if (FaultIs("describes-for-ever") && index > 2) index = 2;
        if (FaultIs("describes-too-much") && descriptor != nullptr)
            reinterpret_cast<char*>(descriptor + 1)[0] = 0;
        return m_effect->GetParamInfo(index, descriptor);
    }
    bool VM_CALL Process(IVideoHost* host, const FrameRecord* source, void* hostArgument,
                         const FrameRecord* destination, const TimingRecord* timing) override;
    const char* VM_CALL GetPresetName(std::uint32_t index) override { return m_effect->GetPresetName(index); }
    bool VM_CALL GetPresetValue(std::uint32_t preset, std::uint32_t parameter, PresetCell* cell) override {
        return m_effect->GetPresetValue(preset, parameter, cell);
    }

  private:
    std::atomic<std::uint32_t> m_count{1};
    IVideoEffect* m_effect;
};

void SpoilState() {
    if (FaultIs("changes-rounding")) _mm_setcsr(_mm_getcsr() ^ 0x6000);
    if (FaultIs("turns-direction")) __asm__ __volatile__("std" : : : "memory");
}

// Byte `offset` of the memory before or after the first stored row.
std::uint8_t& ByteAt(const FrameRecord& frame, std::ptrdiff_t offset) {
    return static_cast<std::uint8_t*>(frame.pixels)[offset];
}

bool VM_CALL FaultyEffect::Process(IVideoHost* host, const FrameRecord* source, void* hostArgument,
                                   const FrameRecord* destination, const TimingRecord* timing) {
    if (FaultIs("trusts-pointers")) static_cast<volatile const FrameRecord*>(source)->width;
    if (FaultIs("hangs") && timing != nullptr && timing->frameTime > 1e200) {
        for (volatile bool isWaiting = true; isWaiting;) {
        }
    }
    if (FaultIs("allocates")) ::operator delete(::operator new(100, std::nothrow));
    const bool done = m_effect->Process(host, source, hostArgument, destination, timing);
    if (!done) return false;
    static std::uint8_t frames = 0;
    const std::ptrdiff_t step = destination->rowStep;
    const std::ptrdiff_t rows = destination->yOrigin + destination->height,
                         columns = destination->xOrigin + destination->width;
    if (FaultIs("writes-behind") && step > 0) ByteAt(*destination, step * (rows - 1) + 4 * columns) = 0;
    if (FaultIs("writes-before") && step > 0) ByteAt(*destination, -1) = 0;
    if (FaultIs("writes-beside") && destination->xOrigin > 0) ByteAt(*destination, step * (rows - 1)) = 0;
    if (FaultIs("writes-source")) ByteAt(*source, 0) ^= 1;
    if (FaultIs("remembers")) ByteAt(*destination, step * (rows - 1) + 4 * (columns - 1)) = ++frames;
    SpoilState();
    return true;
}

class FaultyLibrary final : public IEffectLibrary {
  public:
    explicit FaultyLibrary(IEffectLibrary* library) : m_library(library) {}
    virtual ~FaultyLibrary() { m_library->Release(); }

    Status VM_CALL QueryInterface(const Guid* iid, void** out) override {
        const Status status = m_library->QueryInterface(iid, out);
        return status == kStatusOk && *out == m_library ? Replace<IEffectLibrary>(m_library, this, out)
                                                        : status;
    }
    std::uint32_t VM_CALL AddRef() override { return ++m_count; }
    std::uint32_t VM_CALL Release() override {
        const std::uint32_t left = --m_count;
        if (left == 0) delete this;
        return left;
    }
    const char* VM_CALL GetLibraryName() override { return m_library->GetLibraryName(); }
    IVideoEffect* VM_CALL CreateEffect(std::uint32_t index) override;
    std::int32_t VM_CALL ShowHelp(void* owner, std::int32_t topic) override {
        return m_library->ShowHelp(owner, topic);
    }
    IShellServices* VM_CALL GetShellServices() override { return m_library->GetShellServices(); }
    IFrameProcessor* VM_CALL CreateFrameProcessor() override { return m_library->CreateFrameProcessor(); }
    IPresetSaver* VM_CALL CreatePresetSaver() override { return m_library->CreatePresetSaver(); }

  private:
    std::atomic<std::uint32_t> m_count{1};
    IEffectLibrary* m_library;
};

IVideoEffect* VM_CALL FaultyLibrary::CreateEffect(std::uint32_t index) {
    IVideoEffect* const effect = m_library->CreateEffect(index);
    if (effect == nullptr) return nullptr;
    if (FaultIs("throws")) return new FaultyEffect(effect);
    auto* const faulty = new (std::nothrow) FaultyEffect(effect);
    if (faulty == nullptr) effect->Release();
    return faulty;
}

}  // namespace

bool FaultIs(const char* name) {
    static const char* const fault = std::getenv("REELCHECK_FAULT");
    return fault != nullptr && std::strcmp(fault, name) == 0;
}

IEffectLibrary* MakeFaulty(IEffectLibrary* library) {
    if (library == nullptr) return nullptr;
    auto* const faulty = new (std::nothrow) FaultyLibrary(library);
    if (faulty == nullptr) library->Release();
    return faulty;
}

}  // namespace velmora::testing
