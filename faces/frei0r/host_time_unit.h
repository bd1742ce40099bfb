// In which unit a host gives times. Frei0r's header says seconds, FFmpeg gives milliseconds. The values do not
// tell: 40 is the second frame of a clip of 25 frames a second in milliseconds and its thousandth in seconds. So the
// module that calls the plug-in is asked for its name.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace velmora::hosts::frei0r {

enum class TimeUnit : std::uint8_t { kUnknown, kSeconds, kMilliseconds };

// By a module's file name, with or without folder: milliseconds for libavfilter and for FFmpeg's own programs,
// which may have it linked in; seconds for MLT's and GStreamer's frei0r modules.
[[nodiscard]] TimeUnit UnitOfModule(std::string_view fileName);

// The path of the module that holds a code address; empty when the system does not know.
[[nodiscard]] std::string ModuleAt(const void* address);

}  // namespace velmora::hosts::frei0r
