// A source and a destination frame as a host might hand them over: any geometry, in memory that ends with their last
// pixel, apart, the same or overlapping, and nothing to be touched but the pixels that an operation is about.
#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "api/host_api.h"
#include "tests/fuzz/fuzz_input.h"

namespace velmora::fuzz {

// How the pixels of a row lie in memory.
struct PixelLayout {
    std::int64_t (*rowBytes)(std::int64_t width);
    std::int64_t (*columnOffset)(std::int64_t column);
};
extern const PixelLayout kBgraLayout;
extern const PixelLayout kYcbcrLayout;  // four bytes for each started pair

// The rule of the public header, told once more in 64 bits: is this a frame?
[[nodiscard]] bool IsFrame(const FrameRecord& frame, const PixelLayout& layout);

class FuzzedFrames {
  public:
    FuzzedFrames(FuzzInput& input, const PixelLayout& source, const PixelLayout& destination);
    ~FuzzedFrames();
    FuzzedFrames(const FuzzedFrames&) = delete;
    FuzzedFrames& operator=(const FuzzedFrames&) = delete;

    [[nodiscard]] bool AreValid() const { return m_areValid; }
    [[nodiscard]] const FrameRecord& Source() const { return m_source; }
    [[nodiscard]] const FrameRecord& Destination() const { return m_destination; }
    // Pixels that an operation works on; when valid.
    [[nodiscard]] std::int32_t Width() const;
    [[nodiscard]] std::int32_t Height() const;

    // The same two frames in memory of their own, as they were filled: the source apart from the destination in any
    // case. The records point into the copies.
    struct Copy {
        std::vector<std::uint8_t> sourceBytes, destinationBytes;
        FrameRecord source, destination;
    };
    [[nodiscard]] Copy TakeCopy();

    // From here until Open nothing but the two processed rectangles may be touched (where an address sanitizer watches).
    // The source's rectangle is `sourceWidth` pixels wide.
    void Close(std::int32_t sourceWidth);
    void Open();

    // The memory of the destination is that of `wanted`; the source's, where it lies apart, as it was filled.
    [[nodiscard]] bool AreAs(const Copy& wanted) const;

  private:
    struct Shape {
        std::int64_t bytes = 0;    // from the lowest address to behind the last pixel
        std::int64_t pointer = 0;  // of the first stored row, from the lowest address
    };

    [[nodiscard]] Shape ShapeOf(const FrameRecord& frame, const PixelLayout& layout) const;
    void PlaceApart(FuzzInput& input, const Shape& source, const Shape& destination);
    // The destination's lowest address lies `offset` bytes behind the source's.
    void PlaceTogether(FuzzInput& input, std::int64_t offset, const Shape& source, const Shape& destination);
    void Release(const FrameRecord& frame, const PixelLayout& layout, std::int32_t width) const;

    const PixelLayout& m_sourceLayout;
    const PixelLayout& m_destinationLayout;
    FrameRecord m_source = {}, m_destination = {};
    bool m_areValid = false;
    bool m_areTogether = false;
    // Exactly as large as needed. Together: the first holds both.
    std::vector<std::uint8_t> m_sourceBytes, m_destinationBytes, m_sourceBefore, m_destinationBefore;
};

}  // namespace velmora::fuzz
