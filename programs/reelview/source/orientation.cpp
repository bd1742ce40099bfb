#include <array>
#include <cstring>
#include <optional>

#include "programs/reelview/source/clip_source.h"

namespace velmora::reelview {
namespace {

// Reads numbers of either byte order; none past the end of the file.
class Numbers {
  public:
    explicit Numbers(std::istream& file) : m_file(file) {}

    void GoTo(std::streamoff place) { m_file.seekg(place); }
    [[nodiscard]] std::streamoff Place() { return m_file.tellg(); }
    void SetOrder(bool isBigEndian) { m_isBigEndian = isBigEndian; }
    [[nodiscard]] bool Starts(const char* bytes, std::size_t count) {
        std::array<char, 8> found = {};
        m_file.read(found.data(), static_cast<std::streamsize>(count));
        return m_file && std::memcmp(found.data(), bytes, count) == 0;
    }
    [[nodiscard]] std::optional<std::uint32_t> Next(int byteCount) {
        std::uint32_t number = 0;
        for (int i = 0; i < byteCount; ++i) {
            const int byte = m_file.get();
            if (byte == std::istream::traits_type::eof()) return std::nullopt;
            const auto bits = static_cast<std::uint32_t>(byte);
            number = m_isBigEndian ? number << 8 | bits : number | bits << (8 * i);
        }
        return number;
    }

  private:
    std::istream& m_file;
    bool m_isBigEndian = true;
};

// A TIFF file, or an Exif block, which has its form: the first table holds the tag.
std::optional<std::uint32_t> InTiff(Numbers& file, std::streamoff start) {
    constexpr std::uint32_t kTag = 274, kShort = 3;
    file.GoTo(start);
    const bool isLittleEndian = file.Starts("II*\0", 4);
    file.GoTo(start);
    if (!isLittleEndian && !file.Starts("MM\0*", 4)) return std::nullopt;
    file.GoTo(start + 4);
    file.SetOrder(!isLittleEndian);
    const auto table = file.Next(4);
    if (!table) return std::nullopt;
    file.GoTo(start + *table);
    const auto entries = file.Next(2);
    for (std::uint32_t i = 0; entries && i < *entries; ++i) {
        const auto tag = file.Next(2), type = file.Next(2), count = file.Next(4), value = file.Next(2);
        if (!value || !file.Next(2)) return std::nullopt;
        if (tag == kTag && type == kShort && count == 1u) return value;
    }
    return std::nullopt;
}

// The segments before the pixels; Exif is one of them.
std::optional<std::uint32_t> InJpeg(Numbers& file) {
    constexpr std::uint32_t kPixels = 0xFFDA, kApplication1 = 0xFFE1, kFirst = 0xFFC0;
    std::streamoff place = 2;
    for (;;) {
        file.GoTo(place);
        const auto marker = file.Next(2), length = file.Next(2);
        if (!length || *length < 2 || *marker < kFirst || *marker == kPixels) return std::nullopt;
        if (*marker == kApplication1 && file.Starts("Exif\0\0", 6)) return InTiff(file, file.Place());
        place += 2 + std::streamoff{*length};
    }
}

}  // namespace

int StoredOrientation(std::istream& file) {
    Numbers numbers(file);
    const bool isJpeg = numbers.Starts("\xFF\xD8", 2);
    const auto stored = isJpeg ? InJpeg(numbers) : InTiff(numbers, 0);
    return stored && *stored >= 1 && *stored <= 8 ? static_cast<int>(*stored) : 1;
}

}  // namespace velmora::reelview
