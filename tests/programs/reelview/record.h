// What the recording library saw last, in memory that it shares with the test: files can be in use when they are
// wanted. REELVIEW_RECORD is the memory's name.
#pragma once

#include <windows.h>

#include <cstdint>

namespace velmora::reelview::test {

struct Record {
    volatile LONG turn;  // odd while the library writes; 0 before the first frame
    char effect[64];
    std::uint32_t count;
    std::uint32_t values[400];  // bits, by parameter
};

// Null where there is none of this name. Stays mapped until the process ends.
inline Record* OpenRecord(const char* name, bool isOwner) {
    const DWORD size = sizeof(Record);
    const HANDLE section =
        isOwner ? CreateFileMappingA(INVALID_HANDLE_VALUE, nullptr, PAGE_READWRITE, 0, size, name)
                : OpenFileMappingA(FILE_MAP_ALL_ACCESS, FALSE, name);
    if (section == nullptr) return nullptr;
    return static_cast<Record*>(MapViewOfFile(section, FILE_MAP_ALL_ACCESS, 0, 0, size));
}

}  // namespace velmora::reelview::test
