#include "programs/reelview/library/guarded_call_win32.h"

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <cstring>

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

// Nobody caught it, so there is nothing to return to: the guard is left at once. An overflown stack is left alone.
LPTOP_LEVEL_EXCEPTION_FILTER& NextFilter() {
    static LPTOP_LEVEL_EXCEPTION_FILTER next = nullptr;
    return next;
}

LONG CALLBACK OnUncaught(EXCEPTION_POINTERS* exception) {
    const bool isOverflow = exception->ExceptionRecord->ExceptionCode == EXCEPTION_STACK_OVERFLOW;
    if (ActiveGuard() != nullptr && !isOverflow) Recover();
    return NextFilter() != nullptr ? NextFilter()(exception) : EXCEPTION_CONTINUE_SEARCH;
}

void InstallHandlers() {
    AddVectoredExceptionHandler(1, OnException);
    NextFilter() = SetUnhandledExceptionFilter(OnUncaught);
}

void LeaveGuard() {
    if (ActiveGuard() != nullptr) Recover();
}

// What the module imported in their place is not called: each runtime's functions end the same process.
void WINAPI OnExitProcess(UINT code) {
    LeaveGuard();
    ExitProcess(code);
}

BOOL WINAPI OnTerminateProcess(HANDLE process, UINT code) {
    if (GetProcessId(process) == GetCurrentProcessId()) LeaveGuard();
    return TerminateProcess(process, code);
}

void OnAbort() {
    LeaveGuard();
    std::abort();
}

void OnExit(int code) {
    LeaveGuard();
    std::exit(code);
}

struct Ending {
    const char* name;
    void* replacement;
};

void* ReplacementOf(const char* name) {
    const Ending endings[] = {
        {"ExitProcess", reinterpret_cast<void*>(&OnExitProcess)},
        {"TerminateProcess", reinterpret_cast<void*>(&OnTerminateProcess)},
        {"abort", reinterpret_cast<void*>(&OnAbort)},
        {"terminate", reinterpret_cast<void*>(&OnAbort)},
        {"?terminate@@YAXXZ", reinterpret_cast<void*>(&OnAbort)},
        {"_invalid_parameter_noinfo_noreturn", reinterpret_cast<void*>(&OnAbort)},
        {"exit", reinterpret_cast<void*>(&OnExit)},
        {"_exit", reinterpret_cast<void*>(&OnExit)},
    };
    for (const Ending& ending : endings) {
        if (std::strcmp(name, ending.name) == 0) return ending.replacement;
    }
    return nullptr;
}

// `names` is the import table as the file has it, `entries` the same one with the functions' addresses.
void ReplaceImports(std::uint8_t* base, const IMAGE_THUNK_DATA32* names, IMAGE_THUNK_DATA32* entries) {
    for (; names->u1.AddressOfData != 0; ++names, ++entries) {
        if (IMAGE_SNAP_BY_ORDINAL32(names->u1.Ordinal)) continue;
        const auto* const name = reinterpret_cast<const char*>(base + names->u1.AddressOfData) +
                                 offsetof(IMAGE_IMPORT_BY_NAME, Name);
        void* const replacement = ReplacementOf(name);
        DWORD protection = 0;
        if (replacement == nullptr || !VirtualProtect(entries, sizeof *entries, PAGE_READWRITE, &protection))
            continue;
        entries->u1.Function = reinterpret_cast<DWORD>(replacement);
        VirtualProtect(entries, sizeof *entries, protection, &protection);
    }
}

// The jump returns to this frame, so nothing else may be in it.
__attribute__((noinline)) bool RunIn(Guard& guard, void (*call)(void*), void* argument) {
    if (__builtin_setjmp(guard.jump) != 0) return false;
    call(argument);
    return true;
}

}  // namespace

bool RunGuarded(void (*call)(void*), void* argument) noexcept {
    static const bool isInstalled = (InstallHandlers(), true);
    static_cast<void>(isInstalled);
    Guard* const outer = ActiveGuard();
    Guard guard = {};
    guard.handlers = HandlerChain();
    asm volatile("fnstcw %0\n\tstmxcsr %1" : "=m"(guard.fpControl), "=m"(guard.vectorControl));
    TlsSetValue(GuardSlot(), &guard);
    const bool isDone = RunIn(guard, call, argument);
    TlsSetValue(GuardSlot(), outer);
    return isDone;
}

void WatchEndings(HMODULE module) noexcept {
    auto* const base = reinterpret_cast<std::uint8_t*>(module);
    const auto* const dos = reinterpret_cast<const IMAGE_DOS_HEADER*>(base);
    const auto* const headers = reinterpret_cast<const IMAGE_NT_HEADERS32*>(base + dos->e_lfanew);
    const IMAGE_DATA_DIRECTORY& place = headers->OptionalHeader.DataDirectory[IMAGE_DIRECTORY_ENTRY_IMPORT];
    if (place.VirtualAddress == 0) return;
    const auto* import = reinterpret_cast<const IMAGE_IMPORT_DESCRIPTOR*>(base + place.VirtualAddress);
    for (; import->Name != 0; ++import) {
        if (import->OriginalFirstThunk == 0) continue;
        ReplaceImports(base, reinterpret_cast<const IMAGE_THUNK_DATA32*>(base + import->OriginalFirstThunk),
                       reinterpret_cast<IMAGE_THUNK_DATA32*>(base + import->FirstThunk));
    }
}

}  // namespace velmora::reelview
