// Where an input lies: a file, an address, standard input, or a sequence of images, which is given by a pattern
// ("frames-%03d.png", "frames-*.png") or a folder.
#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <string>

#include "text/number_text.h"
#include "programs/reelfx/media/av_handles.h"

namespace velmora::hosts {

struct InputOptions {
    std::string path;
    std::optional<FrameSize> rawSize;              // the input is raw BGRA of this size
    std::optional<FrameRate> rate;                 // of raw input and image sequences
    std::optional<std::int64_t> startNumber = {};  // of the first image of a numbered sequence
    bool keepsLight = false;                       // linear light is not converted to display values
};

struct InputAddress {
    std::string url;
    const AVInputFormat* format = nullptr;  // null: found by the contents
    AvOptions entries;  // of the container; those that it does not know stay after opening
};

// Throws Failure (kExitInput) for a folder without images of one kind.
void Locate(const InputOptions& options, InputAddress& address);

// Throws Failure (kExitUsage) if the opened container did not know an option that the user gave.
void CheckTaken(InputAddress& address);

// False for standard input, pipes and devices.
bool CanBeReadTwice(const std::string& path);

// Of a numbered sequence with a gap, where reading ends: the first file that is missing while later ones are there.
// Empty for any other input.
std::string FirstMissingImage(const InputOptions& options);

// Standard input, read so that a signal ends the wait (standard_input.cpp).

struct CloseInputStream {
    void operator()(AVIOContext* stream) const;
};
using InputStreamPtr = std::unique_ptr<AVIOContext, CloseInputStream>;

// Throws std::bad_alloc.
InputStreamPtr OpenStandardInput();

}  // namespace velmora::hosts
