#include "programs/reelfx/media/other_streams.h"

#include <algorithm>
#include <cstring>
#include <utility>

#include "programs/reelfx/common/failure.h"
#include "programs/reelfx/media/container.h"

namespace velmora::hosts {
namespace {

std::string KindOf(const AVStream& stream) {
    if ((stream.disposition & AV_DISPOSITION_ATTACHED_PIC) != 0) return "cover";
    const char* kind = av_get_media_type_string(stream.codecpar->codec_type);
    return kind ? kind : "stream";
}

bool Supports(const AVCodec& codec, int channels) {
    if (!codec.ch_layouts) return true;
    for (const AVChannelLayout* layout = codec.ch_layouts; layout->nb_channels > 0; ++layout) {
        if (layout->nb_channels == channels) return true;
    }
    return false;
}

// Chapters and time codes as streams of their own: they are written from the container's list and tag.
bool IsWrittenAnew(const AVStream& stream, const AVFormatContext& container) {
    const std::uint32_t tag = stream.codecpar->codec_tag;
    const bool isChapters = tag == MKTAG('t', 'e', 'x', 't') && container.nb_chapters > 0;
    return stream.codecpar->codec_type == AVMEDIA_TYPE_DATA &&
           (isChapters || tag == MKTAG('t', 'm', 'c', 'd'));
}

const AVCodec& AskedSoundCodec(const std::string& name, const AVOutputFormat& format) {
    // A codec's own name comes first: an encoder of the same name may be an experimental one.
    const AVCodecDescriptor* descriptor = avcodec_descriptor_get_by_name(name.c_str());
    const AVCodec* codec = descriptor ? avcodec_find_encoder(descriptor->id) : nullptr;
    if (!codec) codec = avcodec_find_encoder_by_name(name.c_str());
    if (!codec || codec->type != AVMEDIA_TYPE_AUDIO)
        throw Failure(kExitUsage, "--audio takes auto, copy, none or an audio codec, not \"" + name + '"');
    if (!CanHold(format, codec->id))
        throw Failure(kExitUsage,
                      std::string("the format ") + format.name + " cannot hold " + codec->name + " sound");
    return *codec;
}

}  // namespace

OtherStreams::OtherStreams(AVFormatContext& container, const MediaReader& source, std::string audio)
    : m_container(container), m_source(source), m_audio(std::move(audio)) {
    const AVFormatContext& from = source.Container();
    for (unsigned i = 0; i < from.nb_streams; ++i) {
        const AVStream& stream = *from.streams[i];
        if (&stream == &source.Picture() || IsWrittenAnew(stream, from)) continue;
        if (HoldsOtherStreams(*container.oformat)) {
            Add(stream);
        } else if (stream.codecpar->codec_type != AVMEDIA_TYPE_AUDIO || m_audio != "none") {
            LeaveOut(stream);
        }
    }
}

void OtherStreams::Add(const AVStream& source) {
    switch (source.codecpar->codec_type) {
        case AVMEDIA_TYPE_AUDIO:
            if (m_audio != "none") AddSound(source);
            return;
        case AVMEDIA_TYPE_SUBTITLE:
            AddSubtitle(source);
            return;
        default:
            break;
    }
    const bool isFile = source.codecpar->codec_type == AVMEDIA_TYPE_ATTACHMENT;
    const bool canCopy = isFile ? std::string(m_container.oformat->name) == "matroska" : CanCopy(source);
    if (!canCopy) return LeaveOut(source);
    AddStream(source, {});
}

bool OtherStreams::CanCopy(const AVStream& source) const {
    const AVCodecParameters& parameters = *source.codecpar;
    // Streams of which nothing is known cannot be described to another container.
    const bool isUnknown = parameters.codec_id == AV_CODEC_ID_NONE ||
                           parameters.codec_id == AV_CODEC_ID_BIN_DATA ||
                           (parameters.codec_type == AVMEDIA_TYPE_AUDIO && parameters.sample_rate == 0);
    // In AVI, H.264 needs start codes, and has no times for its reordered frames.
    const bool isReordered =
        parameters.codec_id == AV_CODEC_ID_H264 || parameters.codec_id == AV_CODEC_ID_HEVC;
    if (isUnknown || (isReordered && std::string(m_container.oformat->name) == "avi")) return false;
    return CanHold(*m_container.oformat, parameters.codec_id) &&
           hosts::CanBegin(m_container, {parameters, source.time_base, source.disposition});
}

bool OtherStreams::CanBegin(const AVStream& source, const AVCodecContext& encoder) const {
    std::unique_ptr<AVCodecParameters, void (*)(AVCodecParameters*)> parameters(
        avcodec_parameters_alloc(), [](AVCodecParameters* p) { avcodec_parameters_free(&p); });
    if (!parameters || avcodec_parameters_from_context(parameters.get(), &encoder) < 0)
        throw std::bad_alloc();
    return hosts::CanBegin(m_container, {*parameters, encoder.time_base, source.disposition});
}

void OtherStreams::AddSound(const AVStream& source) {
    const bool canCopy = CanCopy(source);
    const std::string from = avcodec_get_name(source.codecpar->codec_id);
    if (m_audio == "copy" && !canCopy) {
        throw Failure(kExitUsage, std::string("the format ") + m_container.oformat->name + " cannot hold " +
                                      from + " sound; leave out --audio copy to encode it");
    }
    Stream stream;
    if (m_audio == "auto" ? !canCopy : m_audio != "copy") {
        stream.transcoder = TranscoderFor(source);
        if (!CanBegin(source, stream.transcoder->Encoder())) return LeaveOut(source);
        const std::string to = avcodec_get_name(stream.transcoder->Encoder().codec_id);
        if (m_audio == "auto") m_conversions.push_back("sound is encoded as " + to + " instead of " + from);
    }
    AddStream(source, std::move(stream));
}

// The container's usual codec, or another of the common ones that takes as many channels.
std::unique_ptr<SoundTranscoder> OtherStreams::TranscoderFor(const AVStream& source) const {
    const AVOutputFormat& format = *m_container.oformat;
    if (m_audio != "auto")
        return std::make_unique<SoundTranscoder>(source, AskedSoundCodec(m_audio, format), format);
    const AVCodecID candidates[] = {format.audio_codec, AV_CODEC_ID_AAC,  AV_CODEC_ID_AC3,
                                    AV_CODEC_ID_MP3,    AV_CODEC_ID_OPUS, AV_CODEC_ID_PCM_S16LE};
    for (const bool isAnyNumber : {false, true}) {
        for (const AVCodecID id : candidates) {
            const AVCodec* codec = avcodec_find_encoder(id);
            if (!codec || !CanHold(format, id)) continue;
            if (!isAnyNumber && !Supports(*codec, source.codecpar->ch_layout.nb_channels)) continue;
            return std::make_unique<SoundTranscoder>(source, *codec, format);
        }
    }
    throw Failure(kExitOutput, "the sound cannot be encoded; use --no-sound to leave it out");
}

void OtherStreams::AddSubtitle(const AVStream& source) {
    if (CanCopy(source)) return AddStream(source, {});
    const AVCodecID target = SubtitleConverter::TargetOf(source, *m_container.oformat);
    if (target == AV_CODEC_ID_NONE) return LeaveOut(source);
    Stream stream;
    stream.converter = std::make_unique<SubtitleConverter>(source, target);
    if (!CanBegin(source, stream.converter->Encoder())) return LeaveOut(source);
    m_conversions.push_back(std::string("subtitles are converted to ") + avcodec_get_name(target));
    AddStream(source, std::move(stream));
}

void OtherStreams::AddStream(const AVStream& source, Stream stream) {
    stream.stream = avformat_new_stream(&m_container, nullptr);
    if (!stream.stream) throw std::bad_alloc();
    AVStream& to = *stream.stream;
    const bool isEncodedAnew = stream.transcoder || stream.converter;
    if (isEncodedAnew) {
        const AVCodecContext& encoder =
            stream.transcoder ? stream.transcoder->Encoder() : stream.converter->Encoder();
        avcodec_parameters_from_context(to.codecpar, &encoder);
        to.time_base = encoder.time_base;
    } else {
        if (avcodec_parameters_copy(to.codecpar, source.codecpar) < 0) throw std::bad_alloc();
        // Each container has tags of its own.
        const AVCodecTag* const* tags = m_container.oformat->codec_tag;
        if (!tags || av_codec_get_id(tags, to.codecpar->codec_tag) != to.codecpar->codec_id)
            to.codecpar->codec_tag = 0;
        to.time_base = source.time_base;
        to.avg_frame_rate = source.avg_frame_rate;
        to.sample_aspect_ratio = source.sample_aspect_ratio;
        for (int i = 0; i < source.nb_side_data; ++i) {
            const AVPacketSideData& data = source.side_data[i];
            std::uint8_t* copy = av_stream_new_side_data(&to, data.type, data.size);
            if (!copy) throw std::bad_alloc();
            std::memcpy(copy, data.data, data.size);
        }
    }
    to.disposition = source.disposition;
    CopyStreamTags(source, to, isEncodedAnew);
    m_streams.emplace(source.index, std::move(stream));
}

void OtherStreams::LeaveOut(const AVStream& source) {
    ++m_leftOut[KindOf(source)];
}

void OtherStreams::WriteCovers(const Sink& sink) const {
    for (const auto& [index, stream] : m_streams) {
        const AVStream& source = *m_source.Container().streams[index];
        if ((source.disposition & AV_DISPOSITION_ATTACHED_PIC) == 0 || source.attached_pic.size == 0)
            continue;
        const PacketPtr copy = Allocated<PacketPtr>(av_packet_clone(&source.attached_pic));
        copy->pts = copy->dts = 0;
        copy->pos = -1;
        sink(*copy, *stream.stream, source.time_base);
    }
}

void OtherStreams::Write(const AVPacket& packet, double pictureSeconds, const Sink& sink) {
    const auto found = m_streams.find(packet.stream_index);
    if (found == m_streams.end()) return;
    Stream& stream = found->second;
    const AVStream& source = *m_source.Container().streams[packet.stream_index];
    const bool isPicture = source.codecpar->codec_type == AVMEDIA_TYPE_VIDEO;
    if (isPicture && !stream.hasBegun && (packet.flags & AV_PKT_FLAG_KEY) == 0) return;
    stream.hasBegun = true;
    if ((source.disposition & AV_DISPOSITION_ATTACHED_PIC) != 0) return;  // see WriteCovers
    if (stream.transcoder) {
        const AVRational base = stream.transcoder->Encoder().time_base;
        stream.transcoder->SetPictureEnd(std::max(pictureSeconds, m_source.PictureSeconds()));
        stream.transcoder->Send(&packet, [&](AVPacket& encoded) { sink(encoded, *stream.stream, base); });
    } else if (stream.converter) {
        const auto pass = [&](AVPacket& text) { sink(text, *stream.stream, SubtitleConverter::kTimeBase); };
        stream.converter->Send(packet, pass);
    } else {
        const PacketPtr copy = Allocated<PacketPtr>(av_packet_clone(&packet));
        sink(*copy, *stream.stream, source.time_base);
    }
}

void OtherStreams::Finish(const Sink& sink) {
    for (const auto& entry : m_streams) {
        const Stream& stream = entry.second;
        if (!stream.transcoder) continue;
        const AVRational base = stream.transcoder->Encoder().time_base;
        stream.transcoder->Send(nullptr, [&](AVPacket& encoded) { sink(encoded, *stream.stream, base); });
    }
}

std::string OtherStreams::Description() const {
    std::string text;
    for (const auto& entry : m_streams) {
        const Stream& stream = entry.second;
        const bool isEncodedAnew = stream.transcoder || stream.converter;
        text += ", " + KindOf(*stream.stream) + " " + avcodec_get_name(stream.stream->codecpar->codec_id) +
                (isEncodedAnew ? " (encoded)" : " (copied)");
    }
    return text;
}

std::vector<std::string> OtherStreams::Notes() const {
    std::vector<std::string> notes = m_conversions;
    for (const auto& [kind, count] : m_leftOut) {
        const std::string what = kind == "audio" ? "sound" : kind;
        notes.push_back(what + (count > 1 ? " (" + std::to_string(count) + " streams)" : "") +
                        " is left out: " + m_container.oformat->name + " cannot hold it");
    }
    return notes;
}

std::vector<std::string> OtherStreams::LateNotes() const {
    const bool isWrong = std::ranges::any_of(m_streams, [](const auto& entry) {
        return entry.second.transcoder && entry.second.transcoder->HasWrongTimes();
    });
    if (!isWrong) return {};
    return {"the sound has times far behind the picture's end, which are taken as damaged"};
}

}  // namespace velmora::hosts
