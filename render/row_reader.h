// Rows of a picture, read one at a time by a stage that needs its neighbours.
#pragma once

#include <cstdint>

#include "render/image.h"

namespace velmora::render {

class RowReader {
  public:
    // Row `y` of the processed rectangle, from 0. Returns either a pointer into the picture, or `scratch` (a whole
    // row) with the row written to it.
    virtual const Bgra* Read(std::int32_t y, Bgra* scratch) const noexcept = 0;

  protected:
    ~RowReader() = default;
};

}  // namespace velmora::render
