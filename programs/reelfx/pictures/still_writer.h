// Writes one picture as PNG or JPEG, according to its file name extension.
#pragma once

#include <string>

#include "programs/reelfx/media/bgra_picture.h"

namespace velmora::hosts {

// Throws UsageError for any other extension. Called before the work begins.
void CheckStillName(const std::string& path);

// Throws Failure (kExitOutput) when the file exists and may not be overwritten or cannot be written. Alpha is
// dropped.
void WriteStill(const BgraPicture& picture, const std::string& path, bool mayOverwrite);

}  // namespace velmora::hosts
