#include "programs/reelcheck/raw_call.h"

#include <algorithm>
#include <cstddef>

namespace velmora::reelcheck {
namespace {

constexpr std::uint32_t kExceptionBits = 0x3F;
constexpr std::uint32_t kDirectionFlag = 0x400;
constexpr std::size_t kMostWords = 6;

// Read and written by the assembler code below, by offset.
struct Block {
    void* function;
    const std::uintptr_t* end;  // one past the last word
    std::uintptr_t count;
    std::uintptr_t adjust;
    std::uintptr_t value;
    std::uintptr_t flags;
    std::uintptr_t isDownward;
    std::uint32_t vectorControl;
    std::uint32_t vectorAfter;
    std::uint32_t x87Control;
    std::uint32_t x87After[7];  // the environment: control, status, tags and four more
    std::uint32_t usualVector;
    std::uint32_t usualX87;
};

#if defined(__i386__)

static_assert(offsetof(Block, value) == 16 && offsetof(Block, vectorControl) == 28 &&
              offsetof(Block, x87Control) == 36 && offsetof(Block, x87After) == 40 &&
              offsetof(Block, usualVector) == 68 && offsetof(Block, usualX87) == 72);

// __stdcall: the words are passed on the stack and the callee removes them.
void Run(Block& block) noexcept {
    __asm__ __volatile__(
        "movl %%esp, %%edi\n\t"
        "andl $-16, %%esp\n\t"
        "subl 12(%%esi), %%esp\n\t"
        "movl 4(%%esi), %%ecx\n\t"
        "movl 8(%%esi), %%edx\n\t"
        "1: testl %%edx, %%edx\n\t"
        "jz 2f\n\t"
        "subl $4, %%ecx\n\t"
        "pushl (%%ecx)\n\t"
        "decl %%edx\n\t"
        "jmp 1b\n\t"
        "2: fldcw 36(%%esi)\n\t"
        "ldmxcsr 28(%%esi)\n\t"
        "cmpl $0, 24(%%esi)\n\t"
        "je 3f\n\t"
        "std\n\t"
        "3: call *(%%esi)\n\t"
        "movl %%eax, 16(%%esi)\n\t"
        "pushfl\n\t"
        "popl 20(%%esi)\n\t"
        "cld\n\t"
        "fnstenv 40(%%esi)\n\t"
        "stmxcsr 32(%%esi)\n\t"
        "fninit\n\t"
        "fldcw 72(%%esi)\n\t"
        "ldmxcsr 68(%%esi)\n\t"
        "movl %%edi, %%esp\n\t"
        :
        : "S"(&block)
        : "eax", "ecx", "edx", "edi", "memory", "cc", "xmm0", "xmm1", "xmm2", "xmm3", "xmm4", "xmm5", "xmm6",
          "xmm7");
}

#else

static_assert(offsetof(Block, value) == 32 && offsetof(Block, flags) == 40 &&
              offsetof(Block, isDownward) == 48 && offsetof(Block, vectorControl) == 56 &&
              offsetof(Block, x87Control) == 64 && offsetof(Block, x87After) == 68 &&
              offsetof(Block, usualVector) == 96 && offsetof(Block, usualX87) == 100);

// The words are passed in registers. The compiler may keep data below the stack pointer, hence the distance.
void Run(Block& block) noexcept {
    __asm__ __volatile__(
        "movq %%rsp, %%r12\n\t"
        "subq $128, %%rsp\n\t"
        "andq $-16, %%rsp\n\t"
        "movq 8(%%rbx), %%rax\n\t"
        "movq -48(%%rax), %%rdi\n\t"
        "movq -40(%%rax), %%rsi\n\t"
        "movq -32(%%rax), %%rdx\n\t"
        "movq -24(%%rax), %%rcx\n\t"
        "movq -16(%%rax), %%r8\n\t"
        "movq -8(%%rax), %%r9\n\t"
        "fldcw 64(%%rbx)\n\t"
        "ldmxcsr 56(%%rbx)\n\t"
        "cmpq $0, 48(%%rbx)\n\t"
        "je 3f\n\t"
        "std\n\t"
        "3: call *(%%rbx)\n\t"
        "movq %%rax, 32(%%rbx)\n\t"
        "pushfq\n\t"
        "popq 40(%%rbx)\n\t"
        "cld\n\t"
        "fnstenv 68(%%rbx)\n\t"
        "stmxcsr 60(%%rbx)\n\t"
        "fninit\n\t"
        "fldcw 100(%%rbx)\n\t"
        "ldmxcsr 96(%%rbx)\n\t"
        "movq %%r12, %%rsp\n\t"
        :
        : "b"(&block)
        : "rax", "rcx", "rdx", "rsi", "rdi", "r8", "r9", "r10", "r11", "r12", "memory", "cc", "xmm0", "xmm1",
          "xmm2", "xmm3", "xmm4", "xmm5", "xmm6", "xmm7", "xmm8", "xmm9", "xmm10", "xmm11", "xmm12", "xmm13",
          "xmm14", "xmm15");
}

#endif

RawResult Call(void* function, const std::uintptr_t (&words)[kMostWords], std::size_t count,
               const ProcessorState& state, std::uint32_t shift) {
    Block block = {};
    block.function = function;
    // Registers are always loaded from all six words; the stack only takes the words in use.
    block.end = words + (sizeof(void*) == 4 ? count : kMostWords);
    block.count = count;
    block.adjust = shift + 16 - 4 * count % 16;
    block.isDownward = state.isDownward ? 1 : 0;
    block.vectorControl = state.vectorControl;
    block.x87Control = state.x87Control;
    __asm__ __volatile__("stmxcsr %0\n\tfnstcw %1" : "=m"(block.usualVector), "=m"(block.usualX87));
    Run(block);
    RawResult result;
    result.value = block.value;
    result.after.x87Control = static_cast<std::uint16_t>(block.x87After[0]);
    result.after.vectorControl = block.vectorAfter & ~kExceptionBits;
    result.after.isDownward = (block.flags & kDirectionFlag) != 0;
    result.isX87Empty = (block.x87After[2] & 0xFFFF) == 0xFFFF;
    return result;
}

}  // namespace

RawResult CallFunction(void* function, std::initializer_list<std::uintptr_t> words,
                       const ProcessorState& state, std::uint32_t shift) {
    std::uintptr_t all[kMostWords] = {};
    std::copy(words.begin(), words.end(), all);
    return Call(function, all, words.size(), state, shift);
}

RawResult CallSlot(void* object, std::uint32_t slot, std::initializer_list<std::uintptr_t> arguments,
                   const ProcessorState& state, std::uint32_t shift) {
    void** const table = *static_cast<void***>(object);
    std::uintptr_t all[kMostWords] = {WordOf(object)};
    std::copy(arguments.begin(), arguments.end(), all + 1);
    return Call(table[slot], all, arguments.size() + 1, state, shift);
}

bool MayShiftStack() noexcept {
    return sizeof(void*) == 4;
}

}  // namespace velmora::reelcheck
