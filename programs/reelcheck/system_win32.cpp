#include "programs/reelcheck/system.h"

#include <windows.h>
#include <psapi.h>
#include <tlhelp32.h>

#include <new>

namespace velmora::reelcheck {
namespace {

constexpr std::size_t kPage = 4096;

std::int64_t ThreadCount() {
    const HANDLE snapshot = CreateToolhelp32Snapshot(TH32CS_SNAPTHREAD, 0);
    if (snapshot == INVALID_HANDLE_VALUE) return 0;
    std::int64_t count = 0;
    THREADENTRY32 thread = {};
    thread.dwSize = sizeof thread;
    for (BOOL found = Thread32First(snapshot, &thread); found; found = Thread32Next(snapshot, &thread)) {
        if (thread.th32OwnerProcessID == GetCurrentProcessId()) ++count;
    }
    CloseHandle(snapshot);
    return count;
}

}  // namespace

GuardedMemory::GuardedMemory(std::size_t size, Edge edge) : m_size(size) {
    m_inner = (size + kPage - 1) / kPage * kPage;
    m_pages =
        static_cast<std::uint8_t*>(VirtualAlloc(nullptr, m_inner + 2 * kPage, MEM_RESERVE, PAGE_NOACCESS));
    if (m_pages == nullptr) throw std::bad_alloc();
    if (VirtualAlloc(m_pages + kPage, m_inner, MEM_COMMIT, PAGE_READWRITE) == nullptr) {
        VirtualFree(m_pages, 0, MEM_RELEASE);
        throw std::bad_alloc();
    }
    m_data = m_pages + kPage + (edge == Edge::kBack ? m_inner - size : 0);
}

GuardedMemory::~GuardedMemory() {
    VirtualFree(m_pages, 0, MEM_RELEASE);
}

void GuardedMemory::ForbidWriting() noexcept {
    DWORD before = 0;
    VirtualProtect(m_pages + kPage, m_inner, PAGE_READONLY, &before);
}

ProcessFigures FiguresNow() {
    ProcessFigures figures;
    const HANDLE process = GetCurrentProcess();
    DWORD handles = 0, moduleBytes = 0;
    GetProcessHandleCount(process, &handles);
    figures.handles = handles;
    HMODULE modules[512];
    EnumProcessModules(process, modules, sizeof modules, &moduleBytes);
    figures.modules = static_cast<std::int64_t>(moduleBytes / sizeof modules[0]);
    figures.threads = ThreadCount();
    PROCESS_MEMORY_COUNTERS counters = {};
    GetProcessMemoryInfo(process, &counters, sizeof counters);
    figures.memoryBytes = static_cast<std::int64_t>(counters.PagefileUsage);
    const DWORD slot = TlsAlloc();  // the lowest free slot
    figures.threadSlots = slot;
    if (slot != TLS_OUT_OF_INDEXES) TlsFree(slot);
    figures.windowObjects = GetGuiResources(process, GR_USEROBJECTS);
    figures.drawingObjects = GetGuiResources(process, GR_GDIOBJECTS);
    return figures;
}

}  // namespace velmora::reelcheck
