// The unit of a host's times. Frei0r's header says seconds, but FFmpeg passes milliseconds. The values alone
// are ambiguous: at 25 frames per second, 40 is the second frame in milliseconds and the thousandth in
// seconds. So the name of the calling module decides.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace velmora::hosts::frei0r {

enum class TimeUnit : std::uint8_t { kUnknown, kSeconds, kMilliseconds };

// The unit by a module's file name, with or without folder: milliseconds for libavfilter and for FFmpeg's
// programs, which may contain it; seconds for the frei0r modules of MLT and GStreamer.
[[nodiscard]] TimeUnit UnitOfModule(std::string_view fileName);

// The path of the module that holds a code address; empty when the system does not know.
[[nodiscard]] std::string ModuleAt(const void* address);

}  // namespace velmora::hosts::frei0r
