#include "programs/reelcheck/text.h"

#include <cstdarg>
#include <cstdio>

namespace velmora::reelcheck {

std::string Text(const char* format, ...) {
    char text[1024];
    std::va_list arguments;
    va_start(arguments, format);
    std::vsnprintf(text, sizeof text, format, arguments);
    va_end(arguments);
    return text;
}

}  // namespace velmora::reelcheck
