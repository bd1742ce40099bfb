#include "platform/float_guard.h"

#include <gtest/gtest.h>

namespace velmora {
namespace {

struct FloatState {
    std::uint16_t x87 = 0;
    std::uint32_t vector = 0;

    static FloatState Read() {
        FloatState state;
        __asm__ __volatile__("fnstcw %0\n\tstmxcsr %1" : "=m"(state.x87), "=m"(state.vector));
        return state;
    }
    void Set() const { __asm__ __volatile__("fldcw %0\n\tldmxcsr %1" : : "m"(x87), "m"(vector)); }
};

TEST(FloatGuard, WorksInItsOwnStateAndGivesTheCallersBack) {
    const FloatState before = FloatState::Read();
    // Truncating, single precision, denormals flushed, and an unmasked division by zero.
    const FloatState hostile = {0x0C7B, 0x9F80 | 0x6000 | 0x0040};
    hostile.Set();
    FloatState inside;
    {
        const FloatGuard guard;
        inside = FloatState::Read();
        volatile float zero = 0.0f;
        volatile float quotient = 1.0f / zero;
        static_cast<void>(quotient);
        __asm__ __volatile__("fld1\n\tfldz\n\tfdivrp\n\tfstp %%st(0)" : : : "st");
    }
    __asm__ __volatile__("fwait");  // a pending exception would be raised here
    const FloatState after = FloatState::Read();
    before.Set();
    EXPECT_EQ(inside.x87, 0x037F);
    EXPECT_EQ(inside.vector & ~0x3Fu, 0x1F80u);
    EXPECT_EQ(after.x87, hostile.x87);
    EXPECT_EQ(after.vector, hostile.vector);
}

}  // namespace
}  // namespace velmora
