// Gives the code behind it the floating-point state that it is compiled for, and the caller its own back.
//
// Hosts change rounding, precision, denormal handling and exception masks for their own purposes; results
// must not depend on that, and a host must find its state as it left it: x87 environment, vector control word
// and direction flag.
#pragma once

#include <cstdint>

namespace velmora {

#if defined(__i386__) || defined(__x86_64__)
class FloatGuard {
  public:
    FloatGuard() noexcept : m_processorFlags(ProcessorFlags()) {
        // With the environment saved, exceptions that our work raises cannot reach a caller who unmasked them.
        __asm__ __volatile__("fnstenv %0" : "=m"(m_x87));
        __asm__ __volatile__("stmxcsr %0" : "=m"(m_vectorControl));
        const std::uint16_t control = 0x037F;        // exceptions masked, extended precision, to nearest
        const std::uint32_t vectorControl = 0x1F80;  // exceptions masked, to nearest, denormals kept
        // "cld": string operations upward, as compiled code takes for granted.
        __asm__ __volatile__("fldcw %0\n\tldmxcsr %1\n\tcld" : : "m"(control), "m"(vectorControl) : "memory");
    }
    ~FloatGuard() {
        __asm__ __volatile__("fldenv %0\n\tldmxcsr %1" : : "m"(m_x87), "m"(m_vectorControl) : "memory");
        if ((m_processorFlags & kDirectionFlag) != 0) __asm__ __volatile__("std" : : : "memory");
    }
    FloatGuard(const FloatGuard&) = delete;
    FloatGuard& operator=(const FloatGuard&) = delete;

  private:
    // By hand: the compiler's own way may pop the flags to another place than it reads them from. A leaf
    // function's locals can lie below the stack pointer on x86-64, so the push keeps its distance.
    static std::uintptr_t ProcessorFlags() noexcept {
        std::uintptr_t flags;
#if defined(__x86_64__)
        __asm__ __volatile__("lea -128(%%rsp), %%rsp\n\tpushf\n\tpop %0\n\tlea 128(%%rsp), %%rsp"
                             : "=r"(flags));
#else
        __asm__ __volatile__("pushf\n\tpop %0" : "=r"(flags));
#endif
        return flags;
    }

    static constexpr std::uintptr_t kDirectionFlag = 0x400;

    struct X87Environment {
        std::uint32_t words[7];
    };

    std::uintptr_t m_processorFlags;
    X87Environment m_x87;
    std::uint32_t m_vectorControl;
};
#else
// WebAssembly has one floating-point state, which nobody can change.
class FloatGuard {
  public:
    FloatGuard() noexcept {}
    ~FloatGuard() {}
    FloatGuard(const FloatGuard&) = delete;
    FloatGuard& operator=(const FloatGuard&) = delete;
};
#endif

}  // namespace velmora
