#include "programs/reelfx/media/picture_metadata.h"

#include <cstring>

namespace velmora::hosts {
namespace {

constexpr std::size_t kEntrySize = 12;
constexpr unsigned kOrientation = 0x0112;

// Numbers of a block, in its own order of bytes; 0 outside of it.
class Block {
  public:
    explicit Block(std::string& bytes) : m_bytes(bytes), m_isLittle(bytes.starts_with("II")) {}

    [[nodiscard]] unsigned At(std::size_t at, int size) const {
        unsigned value = 0;
        for (int i = 0; i < size; ++i) {
            const std::size_t place = at + static_cast<std::size_t>(m_isLittle ? size - 1 - i : i);
            value = value << 8 | (place < m_bytes.size() ? static_cast<std::uint8_t>(m_bytes[place]) : 0);
        }
        return value;
    }
    void SetShort(std::size_t at, std::uint8_t value) {
        if (at + 2 > m_bytes.size()) return;
        m_bytes[at] = static_cast<char>(m_isLittle ? value : 0);
        m_bytes[at + 1] = static_cast<char>(m_isLittle ? 0 : value);
    }

  private:
    std::string& m_bytes;
    bool m_isLittle;
};

}  // namespace

std::string UprightExif(std::string exif) {
    Block block(exif);
    const std::size_t list = block.At(4, 4);
    const unsigned entries = block.At(list, 2);
    for (unsigned i = 0; i < entries; ++i) {
        const std::size_t entry = list + 2 + i * kEntrySize;
        if (block.At(entry, 2) == kOrientation) block.SetShort(entry + 8, 1);
    }
    return exif;
}

PacketPtr WithExif(const AVPacket& packet, const std::string& exif) {
    constexpr char kName[] = "Exif\0";  // and another zero, which ends the text
    constexpr std::size_t kStart = 2;   // after the mark that begins every JPEG
    const std::size_t length = 2 + sizeof kName + exif.size();
    PacketPtr result = Allocated<PacketPtr>(av_packet_clone(&packet));
    if (length > 0xFFFF || packet.size < static_cast<int>(kStart)) return result;
    std::string segment = "\xFF\xE1";
    segment += static_cast<char>(length >> 8);
    segment += static_cast<char>(length & 0xFF);
    segment.append(kName, sizeof kName).append(exif);
    if (av_grow_packet(result.get(), static_cast<int>(segment.size())) < 0) throw std::bad_alloc();
    std::memcpy(result->data + kStart, segment.data(), segment.size());
    std::memcpy(result->data + kStart + segment.size(), packet.data + kStart,
                static_cast<std::size_t>(packet.size) - kStart);
    return result;
}

}  // namespace velmora::hosts
