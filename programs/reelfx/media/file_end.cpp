#include "programs/reelfx/media/file_end.h"

#include <algorithm>
#include <array>
#include <filesystem>
#include <fstream>
#include <string_view>

extern "C" {
#include <libavformat/avformat.h>
}

namespace velmora::hosts {
namespace {

std::uint64_t BigEndian(const std::uint8_t* bytes, int count) {
    std::uint64_t value = 0;
    for (int i = 0; i < count; ++i) value = value << 8 | bytes[i];
    return value;
}

// An EBML number at `at`, which is moved behind it. All ones mean that it is unknown: 0.
std::uint64_t EbmlSize(const std::uint8_t* bytes, std::size_t& at) {
    int length = 1;
    while (length < 8 && (bytes[at] & (0x80 >> (length - 1))) == 0) ++length;
    const std::uint64_t mask = (std::uint64_t{1} << (7 * length)) - 1;
    const std::uint64_t value = BigEndian(bytes + at, length) & mask;
    at += static_cast<std::size_t>(length);
    return value == mask ? 0 : value;
}

std::uint64_t MatroskaLength(const std::uint8_t* head, std::size_t size) {
    constexpr std::size_t kLongestNumber = 12;
    if (BigEndian(head, 4) != 0x1A45DFA3) return 0;
    std::size_t at = 4;
    const std::uint64_t header = EbmlSize(head, at);
    if (header > size - at - kLongestNumber) return 0;
    at += static_cast<std::size_t>(header);
    if (BigEndian(head + at, 4) != 0x18538067) return 0;
    at += 4;
    const std::uint64_t segment = EbmlSize(head, at);
    return segment == 0 ? 0 : at + segment;
}

std::uint64_t AviLength(const std::uint8_t* head) {
    if (BigEndian(head, 4) != 0x52494646) return 0;  // "RIFF"
    std::uint64_t length = 0;
    for (int i = 7; i >= 4; --i) length = length << 8 | head[i];
    return 8 + length;
}

}  // namespace

bool EndsEarly(const std::string& path, const std::string& format) {
    std::error_code error;
    if (!std::filesystem::is_regular_file(path, error)) return false;
    const std::uintmax_t size = std::filesystem::file_size(path, error);
    if (error) return false;
    if (format == "mpegts") {
        constexpr std::array kPacketSizes = {188, 192,
                                             204};  // plain, with a time stamp, with error correction
        return std::ranges::all_of(kPacketSizes,
                                   [&](auto each) { return size % static_cast<unsigned>(each) != 0; });
    }
    std::array<std::uint8_t, 512> head = {};
    std::ifstream(path, std::ios::binary).read(reinterpret_cast<char*>(head.data()), head.size());
    const bool isMatroska = format.find("matroska") != std::string::npos;
    const std::uint64_t stated = isMatroska        ? MatroskaLength(head.data(), head.size())
                                 : format == "avi" ? AviLength(head.data())
                                                   : 0;
    return stated > size;
}

// True for a JPEG file that is cut off: the decoder fills the missing part with grey. After the start of the picture
// the bytes of the end marker cannot occur before the end.
bool LacksEnd(const AVFormatContext& container, const AVPacket& packet) {
    const std::string_view format = container.iformat->name;
    const bool isStill = format == "image2" || format == "jpeg_pipe";
    if (!isStill || container.streams[packet.stream_index]->codecpar->codec_id != AV_CODEC_ID_MJPEG)
        return false;
    constexpr std::array<std::uint8_t, 2> kScan = {0xFF, 0xDA}, kEnd = {0xFF, 0xD9};
    const std::uint8_t* const end = packet.data + packet.size;
    const std::uint8_t* const scan =
        std::find_end(packet.data, packet.data + packet.size, kScan.begin(), kScan.end());
    return scan == end || std::search(scan, end, kEnd.begin(), kEnd.end()) == end;
}

}  // namespace velmora::hosts
