// A host for tests: answers from a list of values and records what it is asked.
#pragma once

#include <cstdint>
#include <map>
#include <vector>

#include "api/host_api.h"

namespace velmora::testing {

class FakeHost final : public PlainHost {
  public:
    struct Request {
        std::uint32_t index;
        std::uint32_t kind;
        bool operator==(const Request&) const = default;
    };

    // Values by parameter index; a missing index fails and leaves the cell alone.
    std::map<std::uint32_t, ValueWord> values;
    std::vector<Request> requests;
    std::vector<std::intptr_t> forwarded;  // arguments of operations 4 and 5
    const Guid* lastQueried = nullptr;
    // Every answer leaves the processor truncating, at 24 bits and without denormals.
    bool leavesFloatsStrange = false;

    void SetNumber(std::uint32_t index, float number) { values[index].number = number; }
    void SetBits(std::uint32_t index, std::uint32_t bits) { values[index].bits = bits; }

    Status VM_CALL QueryInterface(const Guid* iid, void** out) override {
        lastQueried = iid;
        return PlainHost::QueryInterface(iid, out);
    }
    std::uint32_t VM_CALL AddRef() override { return ++m_count; }
    std::uint32_t VM_CALL Release() override { return --m_count; }
    bool VM_CALL GetParamValue(std::uint32_t index, ValueCell* cell, std::uint32_t kind) override {
        requests.push_back({index, kind});
        const auto value = values.find(index);
        if (value == values.end()) return false;
        cell->value = value->second;
        cell->kind = kind;
        if (leavesFloatsStrange) SetStrangeFloats();
        return true;
    }
    static void SetStrangeFloats() {
        const std::uint32_t vector = kStrangeVectorControl;
        const std::uint16_t x87 = kStrangeX87Control;
        __asm__ __volatile__("ldmxcsr %0\n\tfldcw %1" : : "m"(vector), "m"(x87));
    }
    static constexpr std::uint32_t kStrangeVectorControl = 0x9F80 | 0x6000 | 0x0040;
    static constexpr std::uint16_t kStrangeX87Control = 0x0C7F;

    bool VM_CALL HostOperation4(std::intptr_t a, std::intptr_t b, std::intptr_t c) override {
        forwarded = {a, b, c};
        return true;
    }
    std::uint32_t VM_CALL HostOperation5(std::intptr_t a, std::intptr_t b) override {
        forwarded = {a, b};
        return 55;
    }

    [[nodiscard]] std::uint32_t Count() const { return m_count; }

  private:
    std::uint32_t m_count = 1;
};

}  // namespace velmora::testing
