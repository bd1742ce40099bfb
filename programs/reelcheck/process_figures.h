// The system resources that this process holds, which must not grow.
#pragma once

#include <cstdint>

namespace velmora::reelcheck {

struct ProcessFigures {
    std::int64_t handles = 0;      // natively: open files
    std::int64_t modules = 0;      // natively: mapped files
    std::int64_t memoryBytes = 0;  // committed for this process alone
    std::int64_t threads = 0;
    std::int64_t windowObjects = 0;   // Windows: windows, menus, hooks
    std::int64_t threadSlots = 0;     // Windows: slots of thread-local storage
    std::int64_t drawingObjects = 0;  // Windows: bitmaps, fonts, device contexts
};

[[nodiscard]] ProcessFigures FiguresNow();

// Fails when any figure of `after` exceeds that of `before`; memory may differ by `memorySlack` bytes.
void RequireNoGrowth(const ProcessFigures& before, const ProcessFigures& after, std::int64_t memorySlack);

}  // namespace velmora::reelcheck
