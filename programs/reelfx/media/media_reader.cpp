#include "programs/reelfx/media/media_reader.h"

#include <algorithm>
#include <cstring>
#include <filesystem>
#include <numeric>

#include "programs/reelfx/common/failure.h"
#include "programs/reelfx/common/interrupt.h"

namespace velmora::hosts {
namespace {

// A file name may look like an address ("take:2.mov"); existing files count as files.
std::string AddressOf(const std::string& path) {
    std::error_code ignored;
    return std::filesystem::exists(path, ignored) ? "file:" + path : path;
}

const AVInputFormat* FormatOf(const InputOptions& options) {
    if (options.rawSize) return av_find_input_format("rawvideo");
    return options.path == "-" ? av_find_input_format("yuv4mpegpipe") : nullptr;
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
    std::error_code ignored;
    if (std::filesystem::is_directory(options.path, ignored)) {
        throw Failure(kExitInput,
                      m_name + ": is a folder; use a file name or a pattern like frames-%03d.png");
    }
    AvOptions entries;
    if (options.rawSize) {
        entries.Set("pixel_format", "bgra");
        entries.Set("video_size",
                    std::to_string(options.rawSize->width) + "x" + std::to_string(options.rawSize->height));
    }
    if (options.rate) {
        entries.Set("framerate", std::to_string(options.rate->numerator) + "/" +
                                     std::to_string(options.rate->denominator));
    }
    AVFormatContext* container = avformat_alloc_context();
    if (!container) throw std::bad_alloc();
    container->interrupt_callback.callback = [](void*) { return Interrupts() > 0 ? 1 : 0; };
    if (options.path == "-") {
        m_standardInput = OpenStandardInput();
        container->pb = m_standardInput.get();
    }
    int error = avformat_open_input(&container, AddressOf(options.path).c_str(), FormatOf(options),
                                    entries.Entries());
    if (error < 0) FailReading("cannot be read: " + AvText(error), error);
    m_container.reset(container);
    error = avformat_find_stream_info(container, nullptr);
    if (error < 0) FailReading("cannot be read: no known stream", error);
}

// A signal also ends the wait for input.
void MediaReader::FailReading(const std::string& text, int error) const {
    ThrowIfNoMemory(error);
    if (Interrupts() > 0) throw Failure(kExitInterrupted, "interrupted; nothing was written");
    throw Failure(kExitInput, m_name + ": " + text);
}

void MediaReader::OpenDecoder() {
    const AVCodec* codec = nullptr;
    const int index = av_find_best_stream(m_container.get(), AVMEDIA_TYPE_VIDEO, -1, -1, &codec, 0);
    if (index < 0 || !codec) throw Failure(kExitInput, m_name + ": contains no video that can be decoded");
    m_stream = m_container->streams[index];
    m_decoder = Allocated<CodecPtr>(avcodec_alloc_context3(codec));
    int error = avcodec_parameters_to_context(m_decoder.get(), m_stream->codecpar);
    m_decoder->pkt_timebase = m_stream->time_base;
    m_decoder->thread_count = 0;  // one per processor; the decoded frames do not depend on it
    if (error >= 0) error = avcodec_open2(m_decoder.get(), codec, nullptr);
    if (error < 0) FailReading("cannot be decoded: " + AvText(error), error);
}

std::vector<std::int64_t> MediaReader::FrameTimes(const InputOptions& options) {
    MediaReader reader(options, Closed{});
    if (options.path == "-")
        throw Failure(kExitInput, reader.m_name + ": its length is not known in advance");
    reader.Open(options);
    reader.OpenDecoder();
    AVFormatContext& container = *reader.m_container;
    const std::string format = container.iformat->name;
    if (format == "image2" || format == "rawvideo") {  // one tick per frame, and too large to read twice
        std::vector<std::int64_t> ticks(static_cast<std::size_t>(reader.FrameCountGuess()));
        std::iota(ticks.begin(), ticks.end(), std::int64_t{0});
        return ticks;
    }
    for (unsigned i = 0; i < container.nb_streams; ++i) {
        if (container.streams[i] != reader.m_stream) container.streams[i]->discard = AVDISCARD_ALL;
    }
    std::vector<std::int64_t> times;
    const PacketPtr packet = NewPacket();
    for (; av_read_frame(&container, packet.get()) >= 0; av_packet_unref(packet.get())) {
        const bool isShown = (packet->flags & AV_PKT_FLAG_DISCARD) == 0;
        if (packet->stream_index == reader.m_stream->index && isShown) times.push_back(packet->pts);
    }
    std::ranges::sort(times);
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
        if (!m_pictureStopped) Decode(nullptr);
        return;
    }
    m_isLastPartial = (packet->flags & AV_PKT_FLAG_CORRUPT) != 0;
    m_packetsEnd = std::max(m_packetsEnd, packet->pos + packet->size);
    if (packet->pts != AV_NOPTS_VALUE) {
        const double tick = av_q2d(m_container->streams[packet->stream_index]->time_base);
        m_secondsEnd = std::max(m_secondsEnd, static_cast<double>(packet->pts + packet->duration) * tick);
    }
    if (packet->stream_index != m_stream->index) {
        m_items.push_back({nullptr, std::move(packet)});
    } else if (!m_pictureStopped) {
        Decode(packet.get());
    }
}

std::string MediaReader::BreakOffAt(int error) const {
    if (error == AVERROR_EXIT) return {};  // interrupted
    if (error != AVERROR_EOF) return "breaks off: " + AvText(error);
    AVIOContext* const file = m_container->pb;
    if (!file) return {};
    if (file->error < 0) return "breaks off: " + AvText(file->error);
    // This format has nothing after its frames.
    const bool isY4m = std::strcmp(m_container->iformat->name, "yuv4mpegpipe") == 0;
    if (m_isLastPartial || (isY4m && m_packetsEnd > 0 && avio_tell(file) > m_packetsEnd))
        return "ends inside a frame";
    const std::int64_t size = avio_size(file);
    for (unsigned i = 0; i < m_container->nb_streams && size > 0; ++i) {
        AVStream* const stream = m_container->streams[i];
        const int count = avformat_index_get_entries_count(stream);
        const AVIndexEntry* const last = avformat_index_get_entry(stream, count - 1);
        if (last && last->pos + last->size > size) return "is cut off";
    }
    return {};
}

double MediaReader::MissingSeconds() const {
    constexpr double kTolerance = 0.5;  // headers round, and streams do not end together
    const AVFormatContext& container = *m_container;
    const bool isTold =
        container.duration > 0 && container.duration_estimation_method == AVFMT_DURATION_FROM_STREAM;
    if (!m_ended || m_pictureStopped || !isTold) return 0.0;
    const std::int64_t start = container.start_time == AV_NOPTS_VALUE ? 0 : container.start_time;
    const double missing = static_cast<double>(start + container.duration) / AV_TIME_BASE - m_secondsEnd;
    return missing > kTolerance ? missing : 0.0;
}

void MediaReader::Decode(const AVPacket* packet) {
    int error = avcodec_send_packet(m_decoder.get(), packet);
    while (error == AVERROR(EAGAIN)) {
        TakeFrames();
        error = avcodec_send_packet(m_decoder.get(), packet);
    }
    ThrowIfNoMemory(error);
    if (error < 0 && error != AVERROR_EOF) ++m_damaged;
    TakeFrames();
}

void MediaReader::TakeFrames() {
    for (;;) {
        FramePtr frame = NewFrame();
        const int error = avcodec_receive_frame(m_decoder.get(), frame.get());
        if (error == AVERROR(EAGAIN) || error == AVERROR_EOF) return;
        ThrowIfNoMemory(error);
        if (error < 0) {
            ++m_damaged;
            return;
        }
        std::int64_t pts = frame->best_effort_timestamp;
        if (pts == AV_NOPTS_VALUE || (m_lastPts != AV_NOPTS_VALUE && pts <= m_lastPts)) {
            // The time is missing or does not advance: go one frame on by the rate.
            const AVRational duration = av_inv_q(FrameRateGuess());
            const std::int64_t step = av_rescale_q(1, duration, m_stream->time_base);
            pts = m_lastPts == AV_NOPTS_VALUE ? 0 : m_lastPts + std::max<std::int64_t>(step, 1);
        }
        frame->pts = m_lastPts = pts;
        if (!m_firstFrame) m_firstFrame = Allocated<FramePtr>(av_frame_clone(frame.get()));
        m_items.push_back({std::move(frame), nullptr});
    }
}

void MediaReader::SeekBefore(double seconds) {
    const double tick = av_q2d(m_stream->time_base);
    Jump(m_firstFrame->pts + static_cast<std::int64_t>(seconds / tick));
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
    m_lastPts = AV_NOPTS_VALUE;
    m_ended = false;
    m_breakOff.clear();
    m_damaged = 0;
    Open(m_options);
    OpenDecoder();
}

bool MediaReader::Jump(std::int64_t pts) {
    if (av_seek_frame(m_container.get(), m_stream->index, pts, AVSEEK_FLAG_BACKWARD) < 0) return false;
    avcodec_flush_buffers(m_decoder.get());
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
        seconds = static_cast<double>(m_container->duration) / AV_TIME_BASE;
    }
    return static_cast<std::int64_t>(seconds * av_q2d(FrameRateGuess()) + 0.5);
}

}  // namespace velmora::hosts
