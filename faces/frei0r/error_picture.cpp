#include "faces/frei0r/instance.h"

#include <algorithm>
#include <array>
#include <cstddef>

#include "text/names.h"

namespace velmora::hosts::frei0r {
namespace {

// Red, green, blue and alpha bytes, as words.
constexpr std::uint32_t kDark = 0xFF202020u, kBright = 0xFF20C0F0u, kInk = 0xFFFFFFFFu;

constexpr std::uint32_t kGlyphWidth = 5, kGlyphHeight = 7, kAdvance = kGlyphWidth + 1,
                        kLineStep = kGlyphHeight + 3;

// Seven rows from the top; the leftmost pixel is the highest of five bits.
using Glyph = std::array<std::uint8_t, kGlyphHeight>;

constexpr Glyph kLetters[26] = {
    {0x0E, 0x11, 0x11, 0x1F, 0x11, 0x11, 0x11},  // A
    {0x1E, 0x11, 0x11, 0x1E, 0x11, 0x11, 0x1E},  // B
    {0x0E, 0x11, 0x10, 0x10, 0x10, 0x11, 0x0E},  // C
    {0x1E, 0x11, 0x11, 0x11, 0x11, 0x11, 0x1E},  // D
    {0x1F, 0x10, 0x10, 0x1E, 0x10, 0x10, 0x1F},  // E
    {0x1F, 0x10, 0x10, 0x1E, 0x10, 0x10, 0x10},  // F
    {0x0E, 0x11, 0x10, 0x17, 0x11, 0x11, 0x0E},  // G
    {0x11, 0x11, 0x11, 0x1F, 0x11, 0x11, 0x11},  // H
    {0x0E, 0x04, 0x04, 0x04, 0x04, 0x04, 0x0E},  // I
    {0x07, 0x02, 0x02, 0x02, 0x02, 0x12, 0x0C},  // J
    {0x11, 0x12, 0x14, 0x18, 0x14, 0x12, 0x11},  // K
    {0x10, 0x10, 0x10, 0x10, 0x10, 0x10, 0x1F},  // L
    {0x11, 0x1B, 0x15, 0x15, 0x11, 0x11, 0x11},  // M
    {0x11, 0x19, 0x15, 0x13, 0x11, 0x11, 0x11},  // N
    {0x0E, 0x11, 0x11, 0x11, 0x11, 0x11, 0x0E},  // O
    {0x1E, 0x11, 0x11, 0x1E, 0x10, 0x10, 0x10},  // P
    {0x0E, 0x11, 0x11, 0x11, 0x15, 0x12, 0x0D},  // Q
    {0x1E, 0x11, 0x11, 0x1E, 0x14, 0x12, 0x11},  // R
    {0x0F, 0x10, 0x10, 0x0E, 0x01, 0x01, 0x1E},  // S
    {0x1F, 0x04, 0x04, 0x04, 0x04, 0x04, 0x04},  // T
    {0x11, 0x11, 0x11, 0x11, 0x11, 0x11, 0x0E},  // U
    {0x11, 0x11, 0x11, 0x11, 0x11, 0x0A, 0x04},  // V
    {0x11, 0x11, 0x11, 0x15, 0x15, 0x1B, 0x11},  // W
    {0x11, 0x11, 0x0A, 0x04, 0x0A, 0x11, 0x11},  // X
    {0x11, 0x11, 0x0A, 0x04, 0x04, 0x04, 0x04},  // Y
    {0x1F, 0x01, 0x02, 0x04, 0x08, 0x10, 0x1F},  // Z
};
constexpr Glyph kDigits[10] = {
    {0x0E, 0x11, 0x13, 0x15, 0x19, 0x11, 0x0E},  // 0
    {0x04, 0x0C, 0x04, 0x04, 0x04, 0x04, 0x0E},  // 1
    {0x0E, 0x11, 0x01, 0x06, 0x08, 0x10, 0x1F},  // 2
    {0x1E, 0x01, 0x01, 0x0E, 0x01, 0x01, 0x1E},  // 3
    {0x02, 0x06, 0x0A, 0x12, 0x1F, 0x02, 0x02},  // 4
    {0x1F, 0x10, 0x1E, 0x01, 0x01, 0x11, 0x0E},  // 5
    {0x0E, 0x10, 0x10, 0x1E, 0x11, 0x11, 0x0E},  // 6
    {0x1F, 0x01, 0x02, 0x04, 0x08, 0x08, 0x08},  // 7
    {0x0E, 0x11, 0x11, 0x0E, 0x11, 0x11, 0x0E},  // 8
    {0x0E, 0x11, 0x11, 0x0F, 0x01, 0x01, 0x0E},  // 9
};

Glyph GlyphOf(char c) noexcept {
    const char lower = ToLower(c);
    if (lower >= 'a' && lower <= 'z') return kLetters[lower - 'a'];
    if (c >= '0' && c <= '9') return kDigits[c - '0'];
    return {};
}

struct Picture {
    std::uint32_t* pixels;
    std::uint32_t width, height;

    // The part outside the picture is cut off.
    void Fill(std::uint32_t left, std::uint32_t top, std::uint32_t side,
              std::uint32_t colour) const noexcept {
        for (std::uint32_t y = top; y < std::min(top + side, height); ++y) {
            for (std::uint32_t x = left; x < std::min(left + side, width); ++x) {
                pixels[std::size_t{y} * width + x] = colour;
            }
        }
    }

    void Write(const std::string& line, std::uint32_t top, std::uint32_t scale) const noexcept {
        for (std::size_t i = 0; i < line.size(); ++i) {
            const Glyph glyph = GlyphOf(line[i]);
            const std::uint32_t left = (1 + static_cast<std::uint32_t>(i) * kAdvance) * scale;
            for (std::uint32_t bit = 0; bit < kGlyphWidth * kGlyphHeight; ++bit) {
                const std::uint32_t x = bit % kGlyphWidth, y = bit / kGlyphWidth;
                if ((glyph[y] >> (kGlyphWidth - 1 - x) & 1) != 0) {
                    Fill(left + x * scale, top + y * scale, scale, kInk);
                }
            }
        }
    }
};

}  // namespace

void PaintError(const std::vector<std::string>& lines, std::uint32_t* pixels, std::uint32_t width,
                std::uint32_t height) noexcept {
    const Picture picture = {pixels, width, height};
    const std::uint32_t stripe = std::max(height / 8, 1u);
    std::size_t longest = 1;
    for (const std::string& line : lines) longest = std::max(longest, line.size());
    const auto columns = static_cast<std::uint32_t>(std::min<std::size_t>(longest, 100)) * kAdvance + 2;
    const auto rows = static_cast<std::uint32_t>(lines.size()) * kLineStep;
    const std::uint32_t scale = std::max({std::min(width / columns, height / (2 * rows + 1)), 1u});
    const std::uint32_t textHeight = std::min(rows * scale, height), top = (height - textHeight) / 2;
    for (std::uint32_t y = 0; y < height; ++y) {
        const bool isBehindText = y + scale >= top && y < top + textHeight;
        for (std::uint32_t x = 0; x < width; ++x) {
            const bool isBright = !isBehindText && (x + y) / stripe % 2 == 0;
            pixels[std::size_t{y} * width + x] = isBright ? kBright : kDark;
        }
    }
    for (std::size_t i = 0; i < lines.size(); ++i) {
        picture.Write(lines[i], top + static_cast<std::uint32_t>(i) * kLineStep * scale + scale, scale);
    }
}

}  // namespace velmora::hosts::frei0r
