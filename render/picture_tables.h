#pragma once

// The tables that the build generates from the files in render/pictures.

#include <cstdint>

#include "render/pictures.h"

namespace velmora::render {

struct WearEntry {
    std::int32_t menuValue;
    GreyPicture picture;
};

// In menu order; an entry with the value 0 ends the table.
extern const WearEntry kWearTable[];

extern const GreyPicture kSpotTable[kSpotCount];

}  // namespace velmora::render
