// Hosts for tests: what effects ask and how the hosts answer.
#pragma once

#include <cstdint>
#include <vector>

#include "api/host_api.h"

namespace velmora::tests {

// Counts references, and answers the identifier kIidPresetSaver as if it were its own. Its destructor comes after the
// interface's operations in the table.
class TestHost : public PlainHost {
  public:
    virtual ~TestHost() = default;
    Status VM_CALL QueryInterface(const Guid* iid, void** out) override {
        outAsPassed = *out;
        const bool known = iid->data1 == kIidPresetSaver.data1;
        *out = known ? this : nullptr;
        if (known) ++references;
        return known ? kStatusOk : kStatusNoInterface;
    }
    std::uint32_t VM_CALL AddRef() override { return ++references; }
    std::uint32_t VM_CALL Release() override { return --references; }
    bool VM_CALL HostOperation4(std::intptr_t a, std::intptr_t b, std::intptr_t c) override {
        arguments = {a, b, c};
        return true;
    }
    std::uint32_t VM_CALL HostOperation5(std::intptr_t a, std::intptr_t b) override {
        arguments = {a, b};
        return 0x12345678u;
    }
    bool VM_CALL HostOperation6(std::intptr_t, std::intptr_t) override {
        arguments = {6};
        return true;
    }
    void VM_CALL HostOperation7(std::intptr_t, std::intptr_t) override { arguments = {7}; }

    std::uint32_t references = 1;
    void* outAsPassed = nullptr;           // the out pointer's value at the last QueryInterface
    std::vector<std::intptr_t> arguments;  // of the last operation
};

// Answers each parameter with a different word and records the calls.
class RecordingHost final : public TestHost {
  public:
    struct Call {
        std::uint32_t index;
        std::uint32_t kind;
        bool operator==(const Call&) const = default;
    };

    bool VM_CALL GetParamValue(std::uint32_t index, ValueCell* cell, std::uint32_t kind) override {
        calls.push_back({index, kind});
        if (!answers) return false;
        cell->value.bits = WordOf(index);
        return true;
    }
    static constexpr std::uint32_t WordOf(std::uint32_t index) { return 0x3F000000u + index; }

    std::vector<Call> calls;
    bool answers = true;
};

// Makes an effect apply a preset.
class PresetHost final : public TestHost {
  public:
    PresetHost(IVideoEffect& effect, std::uint32_t preset) {
        PresetCell cell;
        for (std::uint32_t i = 0; effect.GetPresetValue(preset, i, &cell); ++i) words.push_back(cell.value);
    }
    bool VM_CALL GetParamValue(std::uint32_t index, ValueCell* cell, std::uint32_t kind) override {
        if (index >= words.size()) return false;
        *cell = {words[index], 0, kind};
        return true;
    }

    std::vector<ValueWord> words;
};

}  // namespace velmora::tests
