#include "programs/reelview/library/guarded_call_win32.h"

#include <windows.h>

namespace velmora::reelview {
namespace {

struct Guard {
    void* jump[5];   // in the layout of the compiler's own jumps
    void* handlers;  // head of the thread's exception handler chain at that point
    unsigned short fpControl;
    unsigned vectorControl;
};

DWORD GuardSlot() {
    static const DWORD slot = TlsAlloc();
    return slot;
}

Guard* ActiveGuard() {
    return static_cast<Guard*>(TlsGetValue(GuardSlot()));
}

// fs:0 of a 32-bit Windows thread.
void* HandlerChain() {
    void* chain = nullptr;
    asm volatile("movl %%fs:0, %0" : "=r"(chain));
    return chain;
}

void SetHandlerChain(void* chain) {
    asm volatile("movl %0, %%fs:0" : : "r"(chain) : "memory");
}

[[noreturn]] void Recover() {
    Guard& guard = *ActiveGuard();
    SetHandlerChain(guard.handlers);
    asm volatile("cld\n\tfninit\n\tfldcw %0\n\tldmxcsr %1"
                 :
                 : "m"(guard.fpControl), "m"(guard.vectorControl));
    __builtin_longjmp(guard.jump, 1);
}

bool IsFault(DWORD code) {
    switch (code) {
        case EXCEPTION_ACCESS_VIOLATION:
        case EXCEPTION_ILLEGAL_INSTRUCTION:
        case EXCEPTION_PRIV_INSTRUCTION:
        case EXCEPTION_INT_DIVIDE_BY_ZERO:
        case EXCEPTION_INT_OVERFLOW:
        case EXCEPTION_ARRAY_BOUNDS_EXCEEDED:
        case EXCEPTION_IN_PAGE_ERROR:
        case EXCEPTION_DATATYPE_MISALIGNMENT:
            return true;
        default:
            return false;
    }
}

LONG CALLBACK OnException(EXCEPTION_POINTERS* exception) {
    if (ActiveGuard() == nullptr || !IsFault(exception->ExceptionRecord->ExceptionCode)) {
        return EXCEPTION_CONTINUE_SEARCH;
    }
    exception->ContextRecord->Eip = reinterpret_cast<DWORD>(&Recover);
    // The stack is aligned as after a call.
    exception->ContextRecord->Esp = (exception->ContextRecord->Esp & ~DWORD{15}) - 4;
    return EXCEPTION_CONTINUE_EXECUTION;
}

// The jump returns to this frame, so nothing else may be in it.
__attribute__((noinline)) bool RunIn(Guard& guard, void (*call)(void*), void* argument) {
    if (__builtin_setjmp(guard.jump) != 0) return false;
    call(argument);
    return true;
}

}  // namespace

bool RunGuarded(void (*call)(void*), void* argument) noexcept {
    static void* const handler = AddVectoredExceptionHandler(1, OnException);
    static_cast<void>(handler);
    Guard* const outer = ActiveGuard();
    Guard guard = {};
    guard.handlers = HandlerChain();
    asm volatile("fnstcw %0\n\tstmxcsr %1" : "=m"(guard.fpControl), "=m"(guard.vectorControl));
    TlsSetValue(GuardSlot(), &guard);
    const bool isDone = RunIn(guard, call, argument);
    TlsSetValue(GuardSlot(), outer);
    return isDone;
}

}  // namespace velmora::reelview
