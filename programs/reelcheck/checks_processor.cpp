// Processor state as callers may leave it: floating-point control, direction flag, stack.

#include <vector>

#include "programs/reelcheck/checks.h"
#include "programs/reelcheck/library.h"
#include "programs/reelcheck/playing_host.h"
#include "programs/reelcheck/raw_call.h"

namespace velmora::reelcheck {
namespace {

struct NamedState {
    const char* name;
    ProcessorState state;
};
constexpr NamedState kStates[] = {
    {"as usual", {0x037F, 0x1F80, false}},
    {"single precision, truncating, denormals flushed", {0x0C7F, 0xFFC0, false}},
    {"double precision, downward", {0x067F, 0x3F80, false}},
    {"upward", {0x0B7F, 0x5F80, false}},
    {"every exception let through", {0x0340, 0x0000, false}},
    {"string operations downward", {0x037F, 0x1F80, true}},
    {"all of it", {0x0C40, 0xE040, true}},
};

// Every operation on a library object and on what it returns, called by slot.
class Caller {
  public:
    Caller(const ProcessorState& state, std::uint32_t shift) : m_state(state), m_shift(shift) {}

    std::uintptr_t Slot(const char* name, void* object, std::uint32_t slot,
                        std::initializer_list<std::uintptr_t> arguments) const {
        m_operation = name;
        return Checked(CallSlot(object, slot, arguments, m_state, m_shift));
    }
    std::uintptr_t Export(const char* name, void* function) const {
        m_operation = name;
        return Checked(CallFunction(function, {}, m_state, m_shift));
    }
    template <typename Interface>
    Interface* Object(const char* name, void* object, std::uint32_t slot,
                      std::initializer_list<std::uintptr_t> arguments) const {
        auto* const made = reinterpret_cast<Interface*>(Slot(name, object, slot, arguments));
        if (made == nullptr) Fail(std::string(name) + " gives nothing");
        return made;
    }
    bool Yes(const char* name, void* object, std::uint32_t slot,
             std::initializer_list<std::uintptr_t> arguments) const {
        return (Slot(name, object, slot, arguments) & 0xFF) != 0;
    }

  private:
    std::uintptr_t Checked(const RawResult& result) const {
        if (result.after.x87Control != m_state.x87Control)
            Fail(std::string(m_operation) + " changes the x87 control word");
        if (result.after.vectorControl != (m_state.vectorControl & ~0x3Fu)) {
            Fail(std::string(m_operation) + " changes the vector control word");
        }
        if (result.after.isDownward != m_state.isDownward) {
            Fail(std::string(m_operation) + " changes the direction flag");
        }
        if (!result.isX87Empty) Fail(std::string(m_operation) + " leaves x87 registers in use");
        return result.value;
    }

    ProcessorState m_state;
    std::uint32_t m_shift;
    mutable const char* m_operation = "";
};

enum LibrarySlot : std::uint32_t {
    kQuery = 0,
    kAdd = 1,
    kDrop = 2,
    kName = 3,
    kCreate = 4,
    kServices = 6,
    kProcessor = 7,
    kSaver = 8
};
enum EffectSlot : std::uint32_t { kKind = 4, kDescribe = 5, kProcess = 6, kPresetName = 7, kPresetValue = 8 };
enum ProcessorSlot : std::uint32_t { kToBgra = 6, kToYcbcr = 7 };

struct Pictures {
    Frame source{Layout{61, 40}}, destination{Layout{61, 40}}, packed{Layout{61, 40}, Packing::kYcbcr};
};

// One effect from creation to release. Returns the digest of its picture.
std::uint64_t TryEffect(const Caller& caller, IEffectLibrary* library, std::uint32_t index,
                        Pictures& pictures) {
    auto* const effect = caller.Object<IVideoEffect>("CreateEffect", library, kCreate, {index});
    caller.Slot("GetName", effect, kName, {});
    caller.Slot("GetKind", effect, kKind, {});
    PlayingHost host;
    ParamDescriptor descriptor = {};
    std::uint32_t count = 0;
    for (; caller.Yes("GetParamInfo", effect, kDescribe, {count, WordOf(&descriptor)}); ++count) {
        host.values[count] = {};
        if (descriptor.kind == kKindSlider) host.values[count].number = 0.75f;
        if (descriptor.kind == kKindCheckBox) host.values[count].flag = 1;
    }
    PresetCell cell = {};
    caller.Slot("GetPresetName", effect, kPresetName, {1});
    caller.Slot("GetPresetValue", effect, kPresetValue, {1, 0, WordOf(&cell)});
    void* found = nullptr;
    caller.Slot("QueryInterface", effect, kQuery, {WordOf(&kIidVideoEffect), WordOf(&found)});
    caller.Slot("AddRef", effect, kAdd, {});
    const FrameRecord from = pictures.source.Record(), to = pictures.destination.Record();
    const TimingRecord timing = {0, 0, 3.0};
    std::uint64_t digest = 0;
    for (const bool spoils : {false, true}) {
        host.spoilsRounding = spoils;
        Require(caller.Yes("Process", effect, kProcess,
                           {WordOf(&host), WordOf(&from), 0, WordOf(&to), WordOf(&timing)}),
                "the effect refuses the frame");
        if (!spoils) digest = pictures.destination.Digest();
    }
    Require(pictures.destination.Digest() == digest,
            "what a host's answers leave in the processor affects the picture");
    for (std::uint32_t left = 3; left-- > 0;) {
        if (caller.Slot("Release", effect, kDrop, {}) != left) Fail("Release counts wrongly");
    }
    return digest;
}

void TryProcessor(const Caller& caller, IEffectLibrary* library, Pictures& pictures) {
    auto* const processor = caller.Object<IFrameProcessor>("CreateFrameProcessor", library, kProcessor, {});
    const FrameRecord bgra = pictures.source.Record(), packed = pictures.packed.Record(),
                      to = pictures.destination.Record();
    Require(caller.Yes("ConvertBgraToYcbcr", processor, kToYcbcr, {WordOf(&bgra), WordOf(&packed), 0}),
            "does not convert to 4:2:2");
    Require(caller.Yes("ConvertYcbcrToBgra", processor, kToBgra, {WordOf(&packed), WordOf(&to), 9}),
            "does not convert to 32-bit");
    caller.Slot("Release", processor, kDrop, {});
    auto* const saver = caller.Object<IPresetSaver>("CreatePresetSaver", library, kSaver, {});
    caller.Slot("Release", saver, kDrop, {});
}

// Everything but dialogs. Returns the digests of the pictures.
std::vector<std::uint64_t> TryAll(const Library& library, const Caller& caller, Pictures& pictures) {
    const auto made = caller.Export("GetEffectsLibrary", reinterpret_cast<void*>(library.getEffectsLibrary));
    auto* const object = reinterpret_cast<IEffectLibrary*>(made);
    if (object == nullptr) Fail("GetEffectsLibrary gives nothing");
    caller.Export("CanUnloadDLLNow", reinterpret_cast<void*>(library.canUnload));
    caller.Slot("GetLibraryName", object, kName, {});
    auto* const services = caller.Object<IShellServices>("GetShellServices", object, kServices, {});
    caller.Slot("KnobsDragVertical", services, 1, {});
    std::vector<std::uint64_t> digests;
    for (std::uint32_t i = 0; i < kEffectCount; ++i)
        digests.push_back(TryEffect(caller, object, i, pictures));
    TryProcessor(caller, object, pictures);
    void* found = nullptr;
    if (caller.Slot("QueryInterface", object, kQuery, {WordOf(&kIidMultiLingual), WordOf(&found)}) == 0) {
        char16_t text[64];
        caller.Slot("GetText", found, 4, {WordOf("de"), 4, WordOf("Open Preset"), WordOf(text), 64});
        caller.Slot("Release", found, kDrop, {});
    }
    caller.Slot("Release", object, kDrop, {});
    return digests;
}

}  // namespace

void CheckProcessorState(CheckContext& context) {
    const Library library(context.libraryPath);
    const Reference<IEffectLibrary> keeper = library.Open();
    Pictures pictures;
    pictures.source.Paint(context.dice);
    std::vector<std::uint64_t> usual;
    for (const NamedState& row : kStates) {
        SetPlace("%s", row.name);
        const std::vector<std::uint64_t> digests = TryAll(library, Caller(row.state, 0), pictures);
        if (usual.empty()) usual = digests;
        Require(digests == usual, "another state gives other pictures");
    }
}

void CheckStack(CheckContext& context) {
    if (!MayShiftStack()) return;
    const Library library(context.libraryPath);
    const Reference<IEffectLibrary> keeper = library.Open();
    Pictures pictures;
    pictures.source.Paint(context.dice);
    std::vector<std::uint64_t> usual;
    for (const std::uint32_t shift : {0u, 4u, 8u, 12u}) {
        SetPlace("stack off by %u", shift);
        const std::vector<std::uint64_t> digests = TryAll(library, Caller({}, shift), pictures);
        if (usual.empty()) usual = digests;
        Require(digests == usual, "another stack gives other pictures");
    }
}

}  // namespace velmora::reelcheck
