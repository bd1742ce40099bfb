#include "programs/reelfx/media/file_end.h"

#include <algorithm>
#include <array>
#include <filesystem>
#include <fstream>
#include <limits>

namespace velmora::hosts {
namespace {

using Bytes = std::span<const std::uint8_t>;

std::uint64_t BigEndian(const std::uint8_t* bytes, int count) {
    std::uint64_t value = 0;
    for (int i = 0; i < count; ++i) value = value << 8 | bytes[i];
    return value;
}

std::uint64_t LittleEndian(const std::uint8_t* bytes, int count) {
    std::uint64_t value = 0;
    for (int i = count - 1; i >= 0; --i) value = value << 8 | bytes[i];
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
    return BigEndian(head, 4) == 0x52494646 ? 8 + LittleEndian(head + 4, 4) : 0;  // "RIFF"
}

// A GIF file is a header, blocks and a trailer, often followed by bytes that mean nothing. Damage counts as complete: the
// decoder notices it.
class GifBlocks {
  public:
    explicit GifBlocks(std::istream& file) : m_file(file) {}

    bool LackTrailer() {
        Skip(10);  // signature, version, size
        SkipColours(Next());
        Skip(2);
        for (;;) {
            switch (Next()) {
                case 0x21:  // an extension
                    Skip(1);
                    break;
                case 0x2C:  // an image
                    Skip(8);
                    SkipColours(Next());
                    Skip(1);
                    break;
                case kNothing:
                    return true;
                default:  // the trailer, or damage
                    return false;
            }
            for (int length = Next(); length > 0; length = Next()) Skip(length);
        }
    }

  private:
    static constexpr int kNothing = std::istream::traits_type::eof();

    int Next() { return m_file.get(); }
    void Skip(int bytes) { m_file.ignore(bytes); }
    void SkipColours(int flags) {
        if (flags != kNothing && (flags & 0x80) != 0) Skip(3 << ((flags & 7) + 1));
    }

    std::istream& m_file;
};

// After the start of the picture the bytes of the end marker cannot occur before the end.
bool JpegLacksEnd(Bytes data) {
    constexpr std::array<std::uint8_t, 2> kScan = {0xFF, 0xDA}, kEnd = {0xFF, 0xD9};
    const auto scan = std::find_end(data.begin(), data.end(), kScan.begin(), kScan.end());
    return scan == data.end() || std::search(scan, data.end(), kEnd.begin(), kEnd.end()) == data.end();
}

// What follows the picture is a packet of its own.
bool QoiLacksEnd(Bytes data) {
    constexpr std::array<std::uint8_t, 8> kEnd = {0, 0, 0, 0, 0, 0, 0, 1};
    const bool isPicture = data.size() >= 4 && BigEndian(data.data(), 4) == 0x716F6966;  // "qoif"
    return isPicture && std::search(data.begin(), data.end(), kEnd.begin(), kEnd.end()) == data.end();
}

// The header states the lengths of the pixels, 0 if unknown, and of the palette.
bool SunLacksEnd(Bytes data) {
    if (data.size() < 32) return true;
    const std::uint64_t pixels = BigEndian(data.data() + 16, 4), palette = BigEndian(data.data() + 28, 4);
    return pixels > 0 && 32 + palette + pixels > data.size();
}

// The end of the header of OpenEXR, attributes of a name, a type and a length each; 0 if the data end before.
std::size_t ExrHeaderEnd(Bytes data) {
    std::size_t at = 8;
    while (at < data.size() && data[at] != 0) {
        for (int text = 0; text < 2; ++text) {
            while (at < data.size() && data[at] != 0) ++at;
            ++at;
        }
        if (at + 4 > data.size()) return 0;
        at += 4 + static_cast<std::size_t>(LittleEndian(data.data() + at, 4));
    }
    return at < data.size() ? at + 1 : 0;
}

// Behind the header is a table of where each chunk of the picture begins; the first chunk follows it.
bool ExrLacksEnd(Bytes data) {
    constexpr unsigned kTiled = 0x200, kDeep = 0x800, kSeveralParts = 0x1000;
    if (data.size() < 8) return true;
    const auto version = static_cast<unsigned>(LittleEndian(data.data() + 4, 4));
    if ((version & (kDeep | kSeveralParts)) != 0) return false;
    std::size_t at = ExrHeaderEnd(data);
    if (at == 0) return true;
    std::uint64_t first = std::numeric_limits<std::uint64_t>::max(), last = 0;
    for (; at + 8 <= std::min<std::uint64_t>(first, data.size()); at += 8) {
        const std::uint64_t chunk = LittleEndian(data.data() + at, 8);
        if (chunk == 0) return true;  // never written
        first = std::min(first, chunk);
        last = std::max(last, chunk);
    }
    const std::uint64_t place = (version & kTiled) != 0 ? 16 : 4, header = place + 4;
    if (last > data.size() || header > data.size() - last) return true;
    return LittleEndian(data.data() + last + place, 4) > data.size() - last - header;
}

}  // namespace

bool EndsEarly(const std::string& path, const std::string& format) {
    namespace fs = std::filesystem;
    std::error_code error;
    if (!fs::is_regular_file(path, error)) return false;
    const std::uintmax_t size = fs::file_size(path, error);
    if (error) return false;
    if (format == "mpegts") {
        // Plain, with a time stamp, with error correction.
        constexpr std::array kPacketSizes = {188, 192, 204};
        return std::ranges::all_of(kPacketSizes,
                                   [&](auto each) { return size % static_cast<unsigned>(each) != 0; });
    }
    std::ifstream file(path, std::ios::binary);
    if (format == "gif") return file && GifBlocks(file).LackTrailer();
    std::array<std::uint8_t, 512> head = {};
    file.read(reinterpret_cast<char*>(head.data()), head.size());
    const bool isMatroska = format.find("matroska") != std::string::npos;
    const std::uint64_t stated = isMatroska        ? MatroskaLength(head.data(), head.size())
                                 : format == "avi" ? AviLength(head.data())
                                                   : 0;
    return stated > size;
}

bool LacksEnd(AVCodecID codec, Bytes data) {
    switch (codec) {
        case AV_CODEC_ID_MJPEG:
            return JpegLacksEnd(data);
        case AV_CODEC_ID_QOI:
            return QoiLacksEnd(data);
        case AV_CODEC_ID_SUNRAST:
            return SunLacksEnd(data);
        case AV_CODEC_ID_EXR:
            return ExrLacksEnd(data);
        default:
            return false;
    }
}

}  // namespace velmora::hosts
