// What a plug-in shows instead of a picture that it cannot make. Frei0r has no way to refuse a value or a frame, and a
// film that passes unprocessed may be noticed only after hours of rendering. So the fault is written on every frame.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace velmora::hosts::frei0r {

// Fills the picture with stripes and writes the lines on it, as large as fits. Letters are shown as capitals; besides
// digits, other characters are left blank.
void PaintError(const std::vector<std::string>& lines, std::uint32_t* pixels, std::uint32_t width,
                std::uint32_t height) noexcept;

}  // namespace velmora::hosts::frei0r
