#include "programs/reelfx/media/media_reader.h"

#include <algorithm>
#include <cstring>
#include <numeric>
#include <string>
#include <string_view>

#include "programs/reelfx/common/failure.h"
#include "programs/reelfx/media/av_handles.h"
#include "programs/reelfx/media/file_end.h"

namespace velmora::hosts {
namespace {

// Packets lie in order of decoding: frames this much later may still be shown earlier.
constexpr std::size_t kReorderedFrames = 64;
constexpr double kReorderedSeconds = 5.0;

bool IsCutOffPicture(const AVFormatContext& container, const AVPacket& packet) {
    const std::string_view format = container.iformat->name;
    const bool isPicture = format == "image2" || format.ends_with("_pipe");
    const AVCodecID codec = container.streams[packet.stream_index]->codecpar->codec_id;
    return isPicture && LacksEnd(codec, {packet.data, static_cast<std::size_t>(packet.size)});
}

}  // namespace

MediaReader::MediaReader(const InputOptions& options, Closed)
    : m_options(options), m_name(options.path == "-" ? "standard input" : options.path) {}

MediaReader::MediaReader(const InputOptions& options) : MediaReader(options, Closed{}) {
    Open(options);
    OpenDecoder();
    while (!m_firstFrame && !m_ended) ReadMore();
    if (m_firstFrame) return;
    if (!m_breakOff.empty()) FailReading(m_breakOff);
    // A decoder without memory may report every packet as invalid.
    if (m_damaged > 0) ThrowIfNoMemory(AVERROR_EXTERNAL);
    FailReading(m_damaged > 0 ? "no frame can be decoded" : "contains no frame");
}

void MediaReader::Open(const InputOptions& options) {
    InputAddress address;
    Locate(options, address);
    if (options.path == "-") m_standardInput = OpenStandardInput();
    AVFormatContext* container = avformat_alloc_context();
    if (!container) throw std::bad_alloc();
    container->interrupt_callback.callback = [](void*) { return Interrupts() > 0 ? 1 : 0; };
    container->pb = m_standardInput.get();
    int error =
        avformat_open_input(&container, address.url.c_str(), address.format, address.entries.Entries());
    if (error < 0) FailReading("cannot be read" + ErrorWords(error), error);
    m_container.reset(container);
    CheckTaken(address);
    m_timeLine = {};
    error = avformat_find_stream_info(container, nullptr);
    if (error < 0) FailReading("cannot be read: no known stream", error);
}

// A signal also ends the wait for input.
void MediaReader::FailReading(const std::string& text, int error) const {
    ThrowIfNoMemory(error);
    if (Interrupts() > 0) throw Failure(kExitInterrupted, "interrupted; nothing was written");
    throw Failure(kExitInput, m_name + ": " + text);
}

FrameTimes MediaReader::TimesOf(const InputOptions& options, std::optional<std::int64_t> frames,
                                double seconds) {
    MediaReader reader(options, Closed{});
    if (options.path == "-")
        throw Failure(kExitInput, reader.m_name + ": its length is not known in advance");
    reader.Open(options);
    reader.OpenDecoder();
    AVFormatContext& container = *reader.m_container;
    const std::string format = container.iformat->name;
    FrameTimes times;
    if (format == "image2" || format == "rawvideo") {  // one tick per frame, and too large to read twice
        times.pts.resize(static_cast<std::size_t>(reader.FrameCountGuess()));
        std::iota(times.pts.begin(), times.pts.end(), std::int64_t{0});
        return times;
    }
    for (unsigned i = 0; i < container.nb_streams; ++i) {
        if (container.streams[i] != reader.m_stream) container.streams[i]->discard = AVDISCARD_ALL;
    }
    const auto ticks =
        static_cast<std::int64_t>((seconds + kReorderedSeconds) / av_q2d(reader.m_stream->time_base));
    const auto isEnough = [&] {
        if (!frames || times.pts.size() <= static_cast<std::size_t>(*frames) + kReorderedFrames) return false;
        const std::int64_t first = times.pts.front(), last = times.pts.back();
        return first != AV_NOPTS_VALUE && last != AV_NOPTS_VALUE && last - first > ticks;
    };
    const PacketPtr packet = NewPacket();
    for (; av_read_frame(&container, packet.get()) >= 0; av_packet_unref(packet.get())) {
        const bool isShown = (packet->flags & AV_PKT_FLAG_DISCARD) == 0;
        if (packet->stream_index != reader.m_stream->index) continue;
        reader.m_timeLine.Mend(container, *packet);
        if (isShown) times.pts.push_back(packet->pts);
        if (isEnough()) break;
    }
    times.isContinuous = !reader.m_timeLine.HasJumped();
    std::ranges::sort(times.pts);
    return times;
}

MediaReader::Item MediaReader::Next() {
    while (m_items.empty() && !m_ended) ReadMore();
    if (m_items.empty()) return {};
    Item item = std::move(m_items.front());
    m_items.pop_front();
    return item;
}

void MediaReader::ReadMore() {
    PacketPtr packet = NewPacket();
    const int error = av_read_frame(m_container.get(), packet.get());
    if (error < 0) {
        ThrowIfNoMemory(error);
        m_ended = true;
        m_breakOff = BreakOffAt(error);
        if (m_pictureStopped) return;
        Decode(nullptr);
        TakeUntimed(AV_NOPTS_VALUE);
        return;
    }
    m_timeLine.Mend(*m_container, *packet);
    const bool isCutOff = IsCutOffPicture(*m_container, *packet);
    if (isCutOff) m_cutOff.push_back(packet->pts == AV_NOPTS_VALUE ? 0 : packet->pts);
    m_isLastPartial = (packet->flags & AV_PKT_FLAG_CORRUPT) != 0 || isCutOff;
    m_packetsEnd = std::max(m_packetsEnd, packet->pos + packet->size);
    if (packet->pts != AV_NOPTS_VALUE) {
        const double tick = av_q2d(m_container->streams[packet->stream_index]->time_base);
        m_secondsEnd = std::max(m_secondsEnd, static_cast<double>(packet->pts + packet->duration) * tick);
    }
    if (packet->stream_index != m_stream->index) {
        m_items.push_back({nullptr, std::move(packet)});
    } else if (!m_pictureStopped) {
        if (!m_firstFrame) NoteExif(*packet);
        Decode(packet.get());
    }
}

// JPEG: segments of a marker and a length, before the picture itself.
void MediaReader::NoteExif(const AVPacket& packet) {
    if (m_stream->codecpar->codec_id != AV_CODEC_ID_MJPEG || m_stream->nb_frames > 1) return;
    constexpr char kName[] = "Exif\0";  // and another zero, which ends the text
    for (int at = 2; at + 10 < packet.size && packet.data[at] == 0xFF && packet.data[at + 1] != 0xDA;) {
        const int length = packet.data[at + 2] << 8 | packet.data[at + 3];
        const bool isExif =
            packet.data[at + 1] == 0xE1 && std::memcmp(packet.data + at + 4, kName, sizeof kName) == 0;
        if (isExif && length > 8 && at + 2 + length <= packet.size) {
            m_exif.assign(reinterpret_cast<const char*>(packet.data) + at + 10,
                          static_cast<std::size_t>(length - 8));
            return;
        }
        at += 2 + length;
    }
}

std::string MediaReader::BreakOffAt(int error) const {
    if (error == AVERROR_EXIT) return {};  // interrupted
    const bool isPiped = m_container->pb && (m_container->pb->seekable & AVIO_SEEKABLE_NORMAL) == 0;
    if (error == AVERROR_INVALIDDATA && isPiped && !m_firstFrame) {
        return "cannot be read from a pipe; its index may be at the end, as in many MOV and MP4 files. Give "
               "the "
               "file's name";
    }
    if (error != AVERROR_EOF) return "breaks off: " + AvText(error);
    AVIOContext* const file = m_container->pb;
    if (file && file->error < 0) return "breaks off: " + AvText(file->error);
    if (m_isLastPartial) return "ends inside a frame";
    if (!file) return {};
    // This format has nothing after its frames.
    const bool isY4m = std::strcmp(m_container->iformat->name, "yuv4mpegpipe") == 0;
    if (isY4m && m_packetsEnd > 0 && avio_tell(file) > m_packetsEnd) return "ends inside a frame";
    const std::int64_t size = avio_size(file);
    for (unsigned i = 0; i < m_container->nb_streams && size > 0; ++i) {
        AVStream* const stream = m_container->streams[i];
        const int count = avformat_index_get_entries_count(stream);
        const AVIndexEntry* const last = avformat_index_get_entry(stream, count - 1);
        if (last && last->pos + last->size > size) return "is cut off";
    }
    if (EndsEarly(m_options.path, m_container->iformat->name)) return "is cut off";
    return {};
}

std::int64_t MediaReader::DamagedPackets() const {
    const bool isBreakOff = m_isLastPartial && !m_cutOff.empty();
    return m_damaged + std::ssize(m_cutOff) - (isBreakOff ? 1 : 0);
}

double MediaReader::MissingSeconds() const {
    constexpr double kTolerance = 0.5;  // headers round, and streams do not end together
    const AVFormatContext& container = *m_container;
    const bool isTold = container.duration > 0 && !m_timeLine.HasJumped() &&
                        container.duration_estimation_method == AVFMT_DURATION_FROM_STREAM;
    if (!m_ended || m_pictureStopped || !isTold) return 0.0;
    const double missing = ContainerEnd() - m_secondsEnd;
    return missing > kTolerance ? missing : 0.0;
}

std::string MediaReader::MissingImage() const {
    const bool isSequence = m_ended && std::strcmp(m_container->iformat->name, "image2") == 0;
    return isSequence ? FirstMissingImage(m_options) : std::string();
}

// Some containers count their length from 0 and some from their first time: what both ways agree on.
double MediaReader::ContainerEnd() const {
    const AVFormatContext& container = *m_container;
    const std::int64_t start = container.start_time == AV_NOPTS_VALUE ? 0 : container.start_time;
    const bool isEstimate = container.duration_estimation_method == AVFMT_DURATION_FROM_PTS;
    const std::int64_t from = isEstimate ? start : std::min<std::int64_t>(start, 0);
    return static_cast<double>(from + container.duration) / AV_TIME_BASE;
}

MediaReader::Landing MediaReader::SeekToFrame(std::int64_t pts) {
    // Streams without an index are not searched by presentation time.
    for (const double early : {0.0, 1.0, 5.0}) {
        const auto ticks = static_cast<std::int64_t>(early / av_q2d(m_stream->time_base));
        if (!Jump(std::max(pts - ticks, m_firstFrame->pts))) return Landing::kStayed;
        const AVFrame* next = Peek();
        if (next && next->pts <= pts) return Landing::kBefore;
    }
    return Landing::kElsewhere;
}

void MediaReader::Rewind() {
    m_items.clear();
    m_untimed.clear();
    m_lastPts = AV_NOPTS_VALUE;
    m_ended = false;
    m_breakOff.clear();
    m_damaged = 0;
    m_cutOff.clear();
    Open(m_options);
    OpenDecoder();
}

bool MediaReader::Jump(std::int64_t pts) {
    if (av_seek_frame(m_container.get(), m_stream->index, pts, AVSEEK_FLAG_BACKWARD) < 0) return false;
    avcodec_flush_buffers(m_decoder.get());
    m_timeLine.Forget();
    m_untimed.clear();
    m_items.clear();
    m_lastPts = AV_NOPTS_VALUE;
    m_ended = false;
    m_breakOff.clear();
    return true;
}

const AVFrame* MediaReader::Peek() {
    for (;;) {
        for (const Item& item : m_items) {
            if (item.frame) return item.frame.get();
        }
        if (m_ended) return nullptr;
        ReadMore();
    }
}

double MediaReader::SecondsOf(std::int64_t pts) const {
    const AVRational base = m_stream->time_base;
    const double seconds = static_cast<double>(pts - m_firstFrame->pts) * base.num / base.den;
    // Some containers count whole milliseconds. Undo that rounding where it explains the difference:
    // otherwise neighbouring frames would share a frame number, and with it their damage.
    const AVRational rate = FrameRateGuess();
    const double whole = std::round(seconds * rate.num / rate.den) * rate.den / rate.num;
    const double rounding = 0.51 * base.num / base.den;
    return std::fabs(seconds - whole) <= rounding ? whole : seconds;
}

std::optional<double> MediaReader::SecondsOf(const AVPacket& packet) const {
    const std::int64_t time = packet.pts != AV_NOPTS_VALUE ? packet.pts : packet.dts;
    if (time == AV_NOPTS_VALUE) return std::nullopt;
    const AVStream& stream = *m_container->streams[packet.stream_index];
    return static_cast<double>(time) * av_q2d(stream.time_base) -
           static_cast<double>(m_firstFrame->pts) * av_q2d(m_stream->time_base);
}

AVRational MediaReader::PixelShape() const {
    return av_guess_sample_aspect_ratio(m_container.get(), m_stream, m_firstFrame.get());
}

AVRational MediaReader::FrameRateGuess() const {
    const AVRational rate = av_guess_frame_rate(m_container.get(), m_stream, nullptr);
    return rate.num > 0 && rate.den > 0 ? rate : AVRational{25, 1};
}

std::int64_t MediaReader::FrameCountGuess() const {
    if (m_stream->nb_frames > 0) return m_stream->nb_frames;
    double seconds = 0.0;
    if (m_stream->duration > 0) {
        seconds = static_cast<double>(m_stream->duration) * av_q2d(m_stream->time_base);
    } else if (m_container->duration > 0) {
        const double start =
            static_cast<double>(m_firstFrame ? m_firstFrame->pts : 0) * av_q2d(m_stream->time_base);
        seconds = ContainerEnd() - std::max(start, 0.0);
    }
    return static_cast<std::int64_t>(seconds * av_q2d(FrameRateGuess()) + 0.5);
}

double MediaReader::PictureSeconds() const {
    return m_stream->duration > 0 ? static_cast<double>(m_stream->duration) * av_q2d(m_stream->time_base)
                                  : 0.0;
}

}  // namespace velmora::hosts
