#include "programs/reelcheck/check.h"

#include <algorithm>
#include <cmath>
#include <cstdarg>
#include <cstdio>

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

}  // namespace velmora::reelcheck
