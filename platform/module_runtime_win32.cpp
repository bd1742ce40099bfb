// For a module that may be unloaded while the process runs on: releases with the module what its linked runtimes take
// from the process and never give back. That is memory, all of which comes from the module's own heap, and thread-local
// storage slots, of which a process has at most 1088: the thread library takes one at each load.
//
// The C and C++ allocation functions are defined here for the module's own use. Blocks that msvcrt.dll returns must not
// be freed here, so no function that returns memory of its own is used.

#include <windows.h>

#include <algorithm>
#include <atomic>
#include <cstdlib>
#include <cstring>
#include <iterator>
#include <new>

namespace {

HANDLE g_heap = nullptr;

// Created by the first allocation, which happens before any code of ours: thread callbacks run first. The loader lock
// is held during loading, so no other thread can be here.
HANDLE Heap() noexcept {
    if (g_heap == nullptr) g_heap = HeapCreate(0, 0, 0);
    return g_heap;
}

void DestroyHeap() noexcept {
    if (g_heap != nullptr) HeapDestroy(g_heap);
    g_heap = nullptr;
}

void* Allocate(std::size_t size, DWORD flags) noexcept {
    const HANDLE heap = Heap();
    return heap != nullptr ? HeapAlloc(heap, flags, size) : nullptr;
}

DWORD g_slots[8];
std::atomic<std::size_t> g_slotCount{0};

DWORD WINAPI TakeSlot() noexcept {
    // Looked up by name, because the import itself is replaced below.
    const HMODULE system = GetModuleHandleW(L"kernel32.dll");
    const auto allocate =
        reinterpret_cast<DWORD(WINAPI*)()>(reinterpret_cast<void*>(GetProcAddress(system, "TlsAlloc")));
    const DWORD slot = allocate();
    const std::size_t place = slot != TLS_OUT_OF_INDEXES ? g_slotCount++ : std::size(g_slots);
    if (place < std::size(g_slots)) g_slots[place] = slot;
    return slot;
}

void GiveSlotsBack() noexcept {
    for (std::size_t i = 0; i < std::min(g_slotCount.load(), std::size(g_slots)); ++i) TlsFree(g_slots[i]);
    g_slotCount = 0;
}

// The runtimes use malloc to create their locks and per-thread data on first use, and do not survive a null: throwing
// bad_alloc would end the process. A few small blocks are reserved for them. Our own code allocates with the operators
// and gets the exception.
class Reserve {
  public:
    void* Take(std::size_t size) noexcept {
        if (size > kBlockSize) return nullptr;
        for (std::size_t i = 0; i < std::size(m_isTaken); ++i) {
            if (!m_isTaken[i].exchange(true)) return std::memset(m_blocks[i], 0, kBlockSize);
        }
        return nullptr;
    }
    // False when the block is not from this reserve.
    bool GiveBack(const void* block) noexcept {
        if (!Holds(block)) return false;
        const auto offset = static_cast<const unsigned char*>(block) - m_blocks[0];
        m_isTaken[static_cast<std::size_t>(offset) / kBlockSize] = false;
        return true;
    }
    [[nodiscard]] bool Holds(const void* block) const noexcept {
        return block >= m_blocks[0] && block < m_blocks[0] + sizeof m_blocks;
    }

  private:
    static constexpr std::size_t kBlockSize = 256;
    static constexpr std::size_t kBlockCount = 64;

    std::atomic<bool> m_isTaken[kBlockCount] = {};
    alignas(16) unsigned char m_blocks[kBlockCount][kBlockSize] = {};
};
constinit Reserve g_reserve;

void* AllocateForRuntime(std::size_t size, DWORD flags) noexcept {
    void* const block = Allocate(size, flags);
    return block != nullptr ? block : g_reserve.Take(size);
}

void Free(void* block) noexcept {
    if (block != nullptr && !g_reserve.GiveBack(block)) HeapFree(g_heap, 0, block);
}

void* AllocateOrThrow(std::size_t size) {
    void* const block = Allocate(size, 0);
    if (block == nullptr) throw std::bad_alloc();
    return block;
}

}  // namespace

// clang-format off
void* operator new(std::size_t size) { return AllocateOrThrow(size); }
void* operator new[](std::size_t size) { return AllocateOrThrow(size); }
void* operator new(std::size_t size, const std::nothrow_t&) noexcept { return Allocate(size, 0); }
void* operator new[](std::size_t size, const std::nothrow_t&) noexcept { return Allocate(size, 0); }
void operator delete(void* block) noexcept { Free(block); }
void operator delete[](void* block) noexcept { Free(block); }
void operator delete(void* block, std::size_t) noexcept { Free(block); }
void operator delete[](void* block, std::size_t) noexcept { Free(block); }
void operator delete(void* block, const std::nothrow_t&) noexcept { Free(block); }
void operator delete[](void* block, const std::nothrow_t&) noexcept { Free(block); }
// clang-format on

extern "C" {

// The thread library's import of TlsAlloc.
#ifdef _WIN64
extern DWORD(WINAPI* const importedTlsAlloc)() __asm__("__imp_TlsAlloc");
#else
extern DWORD(WINAPI* const importedTlsAlloc)() __asm__("__imp__TlsAlloc@0");
#endif
DWORD(WINAPI* const importedTlsAlloc)() = TakeSlot;

BOOL WINAPI DllMainCRTStartup(HINSTANCE module, DWORD reason, LPVOID reserved);

void* malloc(std::size_t size) {
    return AllocateForRuntime(size, 0);
}

void* calloc(std::size_t count, std::size_t size) {
    if (size != 0 && count > ~std::size_t{0} / size) return nullptr;
    return AllocateForRuntime(count * size, HEAP_ZERO_MEMORY);
}

void free(void* block) {
    Free(block);
}

void* realloc(void* block, std::size_t size) {
    if (block == nullptr) return malloc(size);
    if (size == 0) {
        Free(block);
        return nullptr;
    }
    return g_reserve.Holds(block) ? nullptr : HeapReAlloc(g_heap, 0, block, size);
}

// The module's entry point: calls the runtime's, which ends in DllMain, and creates and destroys the module's own
// resources around it. When the whole process ends (`reserved` is not null) there is nothing to release.
BOOL WINAPI ModuleEntry(HINSTANCE module, DWORD reason, LPVOID reserved) {
    static bool isOver = false;  // the loader may send a detach to a module that failed to start
    if (isOver) return TRUE;
    if (reason == DLL_PROCESS_ATTACH && Heap() == nullptr) return FALSE;
    const BOOL isDone = DllMainCRTStartup(module, reason, reserved);
    if ((reason == DLL_PROCESS_ATTACH && !isDone) || (reason == DLL_PROCESS_DETACH && reserved == nullptr)) {
        isOver = true;
        GiveSlotsBack();
        DestroyHeap();
    }
    return isDone;
}

}  // extern "C"
