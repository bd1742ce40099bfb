// Writes one picture as PNG or JPEG, as its name ends.
#pragma once

#include <string>

#include "programs/reelfx/media/bgra_picture.h"

namespace velmora::hosts {

// Throws UsageError for another ending. Looked at before the work begins.
void CheckStillName(const std::string& path);

// Throws Failure (kExitOutput) when the file exists and may not be overwritten or cannot be written. Alpha is
// left out.
void WriteStill(const BgraPicture& picture, const std::string& path, bool mayOverwrite);

}  // namespace velmora::hosts
