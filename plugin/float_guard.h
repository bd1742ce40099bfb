// Gives the code behind it the floating-point state that it is compiled for, and the caller its own back.
//
// Hosts change rounding, precision, denormal handling and exception masks for their own purposes; results
// must not depend on that, and a host must find its state as it left it.
#pragma once

#include <cstdint>

namespace velmora {

class FloatGuard {
  public:
    FloatGuard() noexcept {
        __asm__ __volatile__("fnstcw %0" : "=m"(m_control));
        __asm__ __volatile__("stmxcsr %0" : "=m"(m_vectorControl));
        const std::uint16_t control = 0x037F;        // all exceptions masked, extended precision, to nearest
        const std::uint32_t vectorControl = 0x1F80;  // all exceptions masked, to nearest, denormals kept
        // "cld": string operations upward, as compiled code takes for granted.
        __asm__ __volatile__("fldcw %0\n\tldmxcsr %1\n\tcld" : : "m"(control), "m"(vectorControl));
    }
    ~FloatGuard() {
        // The sticky exception flags go back too: the state is a whole.
        __asm__ __volatile__("fldcw %0\n\tldmxcsr %1" : : "m"(m_control), "m"(m_vectorControl));
    }
    FloatGuard(const FloatGuard&) = delete;
    FloatGuard& operator=(const FloatGuard&) = delete;

  private:
    std::uint16_t m_control;
    std::uint32_t m_vectorControl;
};

}  // namespace velmora
