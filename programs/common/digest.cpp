#include "programs/common/digest.h"

namespace velmora::hosts {

std::string HexOf(const std::uint8_t* bytes, std::size_t count) {
    static constexpr char kDigits[] = "0123456789abcdef";
    std::string text;
    for (std::size_t i = 0; i < count; ++i) {
        text += kDigits[bytes[i] >> 4];
        text += kDigits[bytes[i] & 15];
    }
    return text;
}

std::string DigestLine(std::int64_t frame, const std::string& digest) {
    return "frame " + std::to_string(frame) + " md5 " + digest;
}

}  // namespace velmora::hosts
