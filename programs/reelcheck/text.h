// Texts with numbers in them.
#pragma once

#include <string>

namespace velmora::reelcheck {

#if defined(__MINGW32__)
#define REELCHECK_PRINTF(text, first) __attribute__((format(__MINGW_PRINTF_FORMAT, text, first)))
#else
#define REELCHECK_PRINTF(text, first) __attribute__((format(printf, text, first)))
#endif

[[nodiscard]] std::string Text(const char* format, ...) REELCHECK_PRINTF(1, 2);

}  // namespace velmora::reelcheck
