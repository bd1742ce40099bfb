#include "render/pictures.h"

#include "render/picture_tables.h"

namespace velmora::render {

const GreyPicture& WearPicture(std::int32_t menuValue) noexcept {
    for (const WearEntry* entry = kWearTable; entry->menuValue != 0; ++entry) {
        if (entry->menuValue == menuValue) {
            return entry->picture;
        }
    }
    return kWearTable[0].picture;
}

const GreyPicture& SpotPicture(std::int32_t index) noexcept {
    return kSpotTable[index];
}

}  // namespace velmora::render
