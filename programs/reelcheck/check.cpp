#include "programs/reelcheck/check.h"

#include <algorithm>
#include <cmath>
#include <cstdarg>
#include <cstdio>

#include "programs/reelcheck/system.h"

namespace velmora::reelcheck {
namespace {

char g_place[256] = "";

}  // namespace

std::string Text(const char* format, ...) {
    char text[1024];
    std::va_list arguments;
    va_start(arguments, format);
    std::vsnprintf(text, sizeof text, format, arguments);
    va_end(arguments);
    return text;
}

void SetPlace(const char* format, ...) {
    std::va_list arguments;
    va_start(arguments, format);
    std::vsnprintf(g_place, sizeof g_place, format, arguments);
    va_end(arguments);
}

const char* Place() noexcept {
    return g_place;
}

void Fail(const std::string& text) {
    throw CheckFailed(g_place[0] == 0 ? text : std::string(g_place) + ": " + text);
}

int CheckContext::Rounds(int few, int many) const {
    const double share = std::max(0, level - kUsualLevel) / double{kHighestLevel - kUsualLevel};
    return static_cast<int>(std::lround(few * std::pow(double(many) / few, share)));
}

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
