// Sets the floating-point state that our code is compiled for, and restores the caller's state at the end.
//
// Hosts change rounding, precision, denormal handling and exception masks for their own purposes. Results must not
// depend on that, and a host must get its state back unchanged: x87 environment, vector control word and direction
// flag.
#pragma once

#include <cstdint>

#if !defined(__i386__) && !defined(__x86_64__)
#include <cfenv>
#endif

namespace velmora {

#if defined(__i386__) || defined(__x86_64__)

class FloatGuard {
  public:
    FloatGuard() noexcept : m_processorFlags(ProcessorFlags()) {
        // The environment is saved first: exceptions raised by our work cannot reach a caller who unmasked them.
        __asm__ __volatile__("fnstenv %0" : "=m"(m_x87));
        __asm__ __volatile__("stmxcsr %0" : "=m"(m_vectorControl));
        const std::uint16_t control = 0x037F;  // exceptions masked, extended precision, round to nearest
        const std::uint32_t vectorControl = 0x1F80;  // exceptions masked, round to nearest, denormals kept
        // "cld": string operations go upward, as compiled code assumes.
        __asm__ __volatile__("fldcw %0\n\tldmxcsr %1\n\tcld" : : "m"(control), "m"(vectorControl) : "memory");
    }
    ~FloatGuard() {
        __asm__ __volatile__("fldenv %0\n\tldmxcsr %1" : : "m"(m_x87), "m"(m_vectorControl) : "memory");
        if ((m_processorFlags & kDirectionFlag) != 0) __asm__ __volatile__("std" : : : "memory");
    }
    FloatGuard(const FloatGuard&) = delete;
    FloatGuard& operator=(const FloatGuard&) = delete;

  private:
    // By hand: the compiler's own code may pop the flags to a different address than it reads them from. On x86-64 a
    // leaf function's locals can lie below the stack pointer, so the push leaves a gap.
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

// On other processors the C library handles the state; on WebAssembly there is none to change. Saving it clears the
// exception flags and masks the exceptions, as above.
class FloatGuard {
  public:
    FloatGuard() noexcept {
        std::feholdexcept(&m_environment);
        std::fesetround(FE_TONEAREST);
    }
    ~FloatGuard() { std::fesetenv(&m_environment); }
    FloatGuard(const FloatGuard&) = delete;
    FloatGuard& operator=(const FloatGuard&) = delete;

  private:
    std::fenv_t m_environment;
};

#endif

}  // namespace velmora
