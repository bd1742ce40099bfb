// Standard input for FFmpeg's libraries, read so that a signal ends the wait.
#pragma once

#include <memory>

extern "C" {
#include <libavformat/avio.h>
}

namespace velmora::hosts {

struct CloseInputStream {
    void operator()(AVIOContext* stream) const;
};
using InputStreamPtr = std::unique_ptr<AVIOContext, CloseInputStream>;

// Throws std::bad_alloc.
InputStreamPtr OpenStandardInput();

}  // namespace velmora::hosts
