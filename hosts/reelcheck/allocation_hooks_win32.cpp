// On Windows the library has a C++ runtime of its own, which allocates by the C library's functions: modules that are
// loaded later get the ones below instead. System modules get them too; only calls from modules beside the library count.

#include <windows.h>

#include <cstdlib>
#include <cstring>
#include <cwchar>

#include "hosts/reelcheck/allocation_ledger.h"
#include "hosts/reelcheck/entry_patch_win32.h"

namespace velmora::reelcheck {
namespace {

void*(__cdecl* g_malloc)(std::size_t);
void*(__cdecl* g_calloc)(std::size_t, std::size_t);
void*(__cdecl* g_realloc)(void*, std::size_t);
void(__cdecl* g_free)(void*);

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

// The answer for the last module asked about is kept: most calls come in a row.
bool IsFromProduct(const void* caller) noexcept {
    MEMORY_BASIC_INFORMATION region = {};
    if (VirtualQuery(caller, &region, sizeof region) == 0 || region.AllocationBase == nullptr) return false;
    return IsProductModule(static_cast<HMODULE>(region.AllocationBase));
}

void* __cdecl Malloc(std::size_t size) {
    const bool isWatched = IsFromProduct(__builtin_return_address(0));
    if (isWatched && ledger::Refuses()) return nullptr;
    void* const block = g_malloc(size);
    if (isWatched) ledger::Add(block);
    return block;
}

void* __cdecl Calloc(std::size_t count, std::size_t size) {
    const bool isWatched = IsFromProduct(__builtin_return_address(0));
    if (isWatched && ledger::Refuses()) return nullptr;
    void* const block = g_calloc(count, size);
    if (isWatched) ledger::Add(block);
    return block;
}

void* __cdecl Realloc(void* old, std::size_t size) {
    const bool isWatched = IsFromProduct(__builtin_return_address(0));
    if (isWatched && ledger::Refuses()) return nullptr;
    void* const block = g_realloc(old, size);
    if (isWatched && (block != nullptr || size == 0)) {
        ledger::Remove(old);
        ledger::Add(block);
    }
    return block;
}

void __cdecl Free(void* block) {
    ledger::Remove(block);
    g_free(block);
}

}  // namespace

void InstallAllocationHooks() {
    g_malloc = ReplaceExport(L"msvcrt.dll", "malloc", Malloc);
    g_calloc = ReplaceExport(L"msvcrt.dll", "calloc", Calloc);
    g_realloc = ReplaceExport(L"msvcrt.dll", "realloc", Realloc);
    g_free = ReplaceExport(L"msvcrt.dll", "free", Free);
}

}  // namespace velmora::reelcheck
