#include "held.h"

#include <psapi.h>
#include <winternl.h>

#include <algorithm>
#include <cstdint>
#include <optional>
#include <vector>

namespace velmora::reelview::test {
namespace {

template <class Function>
Function SystemFunction(const char* name) {
    const HMODULE module = GetModuleHandleA("ntdll.dll");
    return reinterpret_cast<Function>(reinterpret_cast<void*>(GetProcAddress(module, name)));
}

unsigned HandlesOf(DWORD process) {
    struct Entry {
        ULONG owner;
        BYTE type, flags;
        USHORT handle;
        void* object;
        ULONG access;
    };
    using Query = LONG(WINAPI*)(ULONG, void*, ULONG, ULONG*);
    static const auto query = SystemFunction<Query>("NtQuerySystemInformation");
    constexpr ULONG kAllHandles = 16;
    std::vector<std::uint32_t> words(1u << 20);
    if (query(kAllHandles, words.data(), static_cast<ULONG>(words.size() * 4), nullptr) < 0) return 0;
    const auto* const first = reinterpret_cast<const Entry*>(words.data() + 1);
    return static_cast<unsigned>(
        std::count_if(first, first + words[0], [&](const Entry& entry) { return entry.owner == process; }));
}

// A process's table of GDI objects, which the process environment block points to. A record's size, and the place of
// its type in it, differ between systems.
struct GdiTable {
    static constexpr std::size_t kEntries = 65536;
    std::size_t step, place;
};

std::vector<std::uint8_t> GdiBytes(HANDLE process) {
    using Query = LONG(WINAPI*)(HANDLE, ULONG, void*, ULONG, ULONG*);
    static const auto query = SystemFunction<Query>("NtQueryInformationProcess");
    constexpr std::size_t kTablePlace = 0x94, kMostBytes = GdiTable::kEntries * 24;
    PROCESS_BASIC_INFORMATION basic = {};
    std::uint32_t table = 0;
    if (query(process, 0, &basic, sizeof basic, nullptr) < 0) return {};
    const auto* const block = reinterpret_cast<const std::uint8_t*>(basic.PebBaseAddress);
    if (!ReadProcessMemory(process, block + kTablePlace, &table, sizeof table, nullptr)) return {};
    std::vector<std::uint8_t> bytes(kMostBytes);
    // The shorter records end earlier.
    for (std::size_t size : {kMostBytes, GdiTable::kEntries * 16}) {
        if (ReadProcessMemory(process, reinterpret_cast<const void*>(table), bytes.data(), size, nullptr)) {
            bytes.resize(size);
            return bytes;
        }
    }
    return {};
}

unsigned InUse(const std::vector<std::uint8_t>& bytes, const GdiTable& table) {
    unsigned count = 0;
    for (std::size_t at = table.place; at < bytes.size(); at += table.step) count += bytes[at] != 0 ? 1 : 0;
    return count;
}

// Found by what 100 pens of this process change.
std::optional<GdiTable> FindGdiTable() {
    const auto before = GdiBytes(GetCurrentProcess());
    std::vector<HPEN> pens;
    for (int i = 0; i < 100; ++i) pens.push_back(CreatePen(PS_SOLID, i + 2, RGB(i, 0, 0)));
    const auto during = GdiBytes(GetCurrentProcess());
    for (const HPEN pen : pens) DeleteObject(pen);
    const auto after = GdiBytes(GetCurrentProcess());
    for (const std::size_t step : {24u, 16u}) {
        for (std::size_t place = 0; place < step; ++place) {
            const GdiTable table = {step, place};
            const unsigned usual = InUse(before, table);
            if (InUse(during, table) == usual + 100 && InUse(after, table) == usual) return table;
        }
    }
    return std::nullopt;
}

// New objects fill the gaps of the table before it grows, so a great number of them reaches as far as all are in number.
unsigned UserObjects() {
    constexpr unsigned kMenus = 1000;
    std::vector<HMENU> menus;
    unsigned highest = 0;
    while (menus.size() < kMenus) {
        menus.push_back(CreateMenu());
        highest = std::max<unsigned>(highest, LOWORD(reinterpret_cast<std::uintptr_t>(menus.back())) / 2);
    }
    for (const HMENU menu : menus) DestroyMenu(menu);
    return highest - std::min(highest, kMenus);
}

}  // namespace

Held HeldBy(HANDLE process) {
    static const auto table = FindGdiTable();
    Held held;
    held.handles = HandlesOf(GetProcessId(process));
    if (table) held.gdi = InUse(GdiBytes(process), *table);
    held.user = UserObjects();
    PROCESS_MEMORY_COUNTERS memory = {};
    GetProcessMemoryInfo(process, &memory, sizeof memory);
    held.bytes = memory.PagefileUsage;
    return held;
}

}  // namespace velmora::reelview::test
