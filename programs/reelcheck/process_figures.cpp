#include "programs/reelcheck/process_figures.h"

#include "programs/reelcheck/check.h"

namespace velmora::reelcheck {

void RequireNoGrowth(const ProcessFigures& before, const ProcessFigures& after, std::int64_t memorySlack) {
    struct Row {
        const char* name;
        std::int64_t before, after, slack;
    };
    const Row rows[] = {
        {"handles", before.handles, after.handles, 0},
        {"modules", before.modules, after.modules, 0},
        {"threads", before.threads, after.threads, 0},
        {"window objects", before.windowObjects, after.windowObjects, 0},
        {"drawing objects", before.drawingObjects, after.drawingObjects, 0},
        {"thread-local slots", before.threadSlots, after.threadSlots, 0},
        {"bytes", before.memoryBytes, after.memoryBytes, memorySlack},
    };
    for (const Row& row : rows) {
        if (row.after <= row.before + row.slack) continue;
        Fail(Text("%lld %s at first, %lld at last", static_cast<long long>(row.before), row.name,
                  static_cast<long long>(row.after)));
    }
}

}  // namespace velmora::reelcheck
