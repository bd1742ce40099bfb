// The digest for comparing frames between programs: MD5 of the picture's rows without padding, as `ffmpeg -f
// framemd5` prints it for raw BGRA frames.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>

namespace velmora::hosts {

// 32 hexadecimal digits. `pixels` is the first byte of the top row; rows are width * 4 bytes of blue, green,
// red and alpha, `strideBytes` apart. Throws std::runtime_error when the system has no such digest.
std::string FrameDigest(const std::uint8_t* pixels, std::int32_t width, std::int32_t height,
                        std::ptrdiff_t strideBytes);

// The line that both programs print for a frame, without the line's end: "frame 12 md5 9e10...".
inline std::string DigestLine(std::int64_t frame, const std::string& digest) {
    return "frame " + std::to_string(frame) + " md5 " + digest;
}

// Shared by the two implementations of FrameDigest.
inline std::string HexOf(const std::uint8_t* bytes, std::size_t count) {
    static constexpr char kDigits[] = "0123456789abcdef";
    std::string text;
    for (std::size_t i = 0; i < count; ++i) {
        text += kDigits[bytes[i] >> 4];
        text += kDigits[bytes[i] & 15];
    }
    return text;
}

}  // namespace velmora::hosts
