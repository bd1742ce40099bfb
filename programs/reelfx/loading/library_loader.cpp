#include "programs/reelfx/loading/library_loader.h"

#include <dlfcn.h>

#include <cstdio>
#include <cstdlib>
#include <mutex>
#include <string_view>

#include "programs/reelfx/common/failure.h"

// All registers that can hold arguments are kept; al holds how many vector registers a variadic call uses. Entries call
// this after their own call pushed a return address, so the stack is aligned here.
asm(".text\n"
    ".globl velmora_load_libraries\n"
    ".type velmora_load_libraries, @function\n"
    "velmora_load_libraries:\n"
    "push %rax\n push %rdi\n push %rsi\n push %rdx\n push %rcx\n push %r8\n push %r9\n push %r10\n"
    "sub $128, %rsp\n"
    "movups %xmm0, (%rsp)\n movups %xmm1, 16(%rsp)\n movups %xmm2, 32(%rsp)\n movups %xmm3, 48(%rsp)\n"
    "movups %xmm4, 64(%rsp)\n movups %xmm5, 80(%rsp)\n movups %xmm6, 96(%rsp)\n movups %xmm7, 112(%rsp)\n"
    "call velmora_find_functions\n"
    "movups (%rsp), %xmm0\n movups 16(%rsp), %xmm1\n movups 32(%rsp), %xmm2\n movups 48(%rsp), %xmm3\n"
    "movups 64(%rsp), %xmm4\n movups 80(%rsp), %xmm5\n movups 96(%rsp), %xmm6\n movups 112(%rsp), %xmm7\n"
    "add $128, %rsp\n"
    "pop %r10\n pop %r9\n pop %r8\n pop %rcx\n pop %rdx\n pop %rsi\n pop %rdi\n pop %rax\n"
    "ret\n");

namespace velmora::hosts {
namespace {

[[noreturn]] void Fail() {
    const char* const words = dlerror();
    const std::string_view reason = words == nullptr ? "no reason is given" : words;
    constexpr auto kNotFound = std::string_view::npos;
    const bool lacksMemory = reason.find("failed to map") != kNotFound || reason.find("allocate") != kNotFound;
    std::fprintf(stderr, "reelfx: %s: %s\n",
                 lacksMemory ? "there is not enough memory for FFmpeg's libraries"
                             : "FFmpeg's libraries cannot be loaded",
                 reason.data());
    std::_Exit(kExitInternal);
}

// The libraries stay loaded until the program ends, as linked ones do.
void FindFunctions() {
    std::string_view name;
    void* library = nullptr;
    for (unsigned i = 0; i < velmora_function_count; ++i) {
        const LibraryFunction& function = velmora_functions[i];
        if (name != function.library) {
            name = function.library;
            library = dlopen(function.library, RTLD_NOW | RTLD_GLOBAL);
            if (library == nullptr) Fail();
        }
        void* const address = dlsym(library, function.name);
        if (address == nullptr) Fail();
        // Another thread may be at an entry and must not see a half written address.
        __atomic_store_n(&velmora_addresses[i], address, __ATOMIC_RELEASE);
    }
}

}  // namespace
}  // namespace velmora::hosts

void velmora_find_functions() {
    static std::once_flag once;
    std::call_once(once, velmora::hosts::FindFunctions);
}
