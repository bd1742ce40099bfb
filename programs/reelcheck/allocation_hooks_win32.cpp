// On Windows, modules that are loaded later get replacements for the system's allocation functions. System modules
// get them too, but only requests from modules next to the library count.

#include <windows.h>

#include <cstdlib>
#include <cstring>
#include <cwchar>

#include "programs/reelcheck/allocation_ledger.h"
#include "programs/reelcheck/entry_patch_win32.h"

namespace velmora::reelcheck {
namespace {

bool IsProductModule(HMODULE module) noexcept {
    static constexpr const wchar_t* kSystemParts[] = {L"\\windows\\system32\\", L"\\windows\\winsxs\\"};
    wchar_t path[MAX_PATH] = L"";
    GetModuleFileNameW(module, path, MAX_PATH);
    _wcslwr(path);
    for (const wchar_t* part : kSystemParts) {
        if (std::wcsstr(path, part) != nullptr) return false;
    }
    return module != GetModuleHandleW(nullptr);
}

bool IsWatched(const void* caller) noexcept {
    if (!ledger::IsWatching()) return false;
    MEMORY_BASIC_INFORMATION region = {};
    if (VirtualQuery(caller, &region, sizeof region) == 0 || region.AllocationBase == nullptr) return false;
    return IsProductModule(static_cast<HMODULE>(region.AllocationBase));
}

// An allocation as the ledger sees it: refused, or made and recorded.
template <typename Allocate>
void* Allocated(bool isWatched, const void* heap, void* old, Allocate&& allocate) noexcept {
    if (isWatched && ledger::Refuses()) return nullptr;
    void* const block = allocate();
    if (isWatched && block != nullptr) {
        ledger::Remove(old);
        ledger::Add(block, heap);
    }
    return block;
}

// For a module with its own heap.
decltype(&HeapCreate) g_heapCreate;
decltype(&HeapDestroy) g_heapDestroy;
decltype(&HeapAlloc) g_heapAlloc;
decltype(&HeapReAlloc) g_heapReAlloc;
decltype(&HeapFree) g_heapFree;

HANDLE WINAPI CreateHeap(DWORD flags, SIZE_T initial, SIZE_T most) {
    if (IsWatched(__builtin_return_address(0)) && ledger::Refuses()) return nullptr;
    return g_heapCreate(flags, initial, most);
}

BOOL WINAPI DestroyHeap(HANDLE heap) {
    ledger::RemoveHeap(heap);
    return g_heapDestroy(heap);
}

void* WINAPI AllocateInHeap(HANDLE heap, DWORD flags, SIZE_T size) {
    return Allocated(IsWatched(__builtin_return_address(0)), heap, nullptr,
                     [=] { return g_heapAlloc(heap, flags, size); });
}

void* WINAPI ReallocateInHeap(HANDLE heap, DWORD flags, void* old, SIZE_T size) {
    return Allocated(IsWatched(__builtin_return_address(0)), heap, old,
                     [=] { return g_heapReAlloc(heap, flags, old, size); });
}

BOOL WINAPI FreeInHeap(HANDLE heap, DWORD flags, void* block) {
    ledger::Remove(block);
    return g_heapFree(heap, flags, block);
}

// For a module that uses the C library's heap.
decltype(&std::malloc) g_malloc;
decltype(&std::calloc) g_calloc;
decltype(&std::realloc) g_realloc;
decltype(&std::free) g_free;

void* __cdecl Malloc(std::size_t size) {
    return Allocated(IsWatched(__builtin_return_address(0)), nullptr, nullptr,
                     [=] { return g_malloc(size); });
}

void* __cdecl Calloc(std::size_t count, std::size_t size) {
    return Allocated(IsWatched(__builtin_return_address(0)), nullptr, nullptr,
                     [=] { return g_calloc(count, size); });
}

void* __cdecl Realloc(void* old, std::size_t size) {
    return Allocated(IsWatched(__builtin_return_address(0)), nullptr, old,
                     [=] { return g_realloc(old, size); });
}

void __cdecl Free(void* block) {
    ledger::Remove(block);
    g_free(block);
}

}  // namespace

void InstallAllocationHooks() {
    g_heapCreate = ReplaceExport(L"kernel32.dll", "HeapCreate", CreateHeap);
    g_heapDestroy = ReplaceExport(L"kernel32.dll", "HeapDestroy", DestroyHeap);
    g_heapAlloc = ReplaceExport(L"kernel32.dll", "HeapAlloc", AllocateInHeap);
    g_heapReAlloc = ReplaceExport(L"kernel32.dll", "HeapReAlloc", ReallocateInHeap);
    g_heapFree = ReplaceExport(L"kernel32.dll", "HeapFree", FreeInHeap);
    g_malloc = ReplaceExport(L"msvcrt.dll", "malloc", Malloc);
    g_calloc = ReplaceExport(L"msvcrt.dll", "calloc", Calloc);
    g_realloc = ReplaceExport(L"msvcrt.dll", "realloc", Realloc);
    g_free = ReplaceExport(L"msvcrt.dll", "free", Free);
}

}  // namespace velmora::reelcheck
