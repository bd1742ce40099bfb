#include "programs/reelview/base/com_win32.h"

#include <mfapi.h>
#include <mfidl.h>
#include <mfreadwrite.h>
#include <propvarutil.h>

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <cstring>

#include "programs/reelview/source/open_clip_win32.h"
#include "programs/reelview/base/texts.h"
#include "platform/win32.h"

namespace velmora::reelview {
namespace {

constexpr DWORD kVideo = static_cast<DWORD>(MF_SOURCE_READER_FIRST_VIDEO_STREAM);
constexpr DWORD kMediaSource = static_cast<DWORD>(MF_SOURCE_READER_MEDIASOURCE);
constexpr double kTicksPerSecond = 1e7;

void Check(HRESULT result, const char* error) {
    if (FAILED(result)) throw SourceError(error);
}

// Loaded at run time: some editions of Windows lack these modules.
class MediaSystem {
  public:
    MediaSystem() : m_platform(LoadLibraryW(L"mfplat.dll")), m_readers(LoadLibraryW(L"mfreadwrite.dll")) {
        Find(m_platform, "MFStartup", m_start);
        Find(m_platform, "MFShutdown", m_shutDown);
        Find(m_platform, "MFCreateAttributes", createAttributes);
        Find(m_platform, "MFCreateMediaType", createMediaType);
        Find(m_readers, "MFCreateSourceReaderFromURL", createReader);
        Check(m_start(MF_VERSION, MFSTARTUP_LITE), text::kNoDecoder);
    }
    ~MediaSystem() { m_shutDown(); }
    MediaSystem(const MediaSystem&) = delete;
    MediaSystem& operator=(const MediaSystem&) = delete;

    decltype(&MFCreateAttributes) createAttributes = nullptr;
    decltype(&MFCreateMediaType) createMediaType = nullptr;
    decltype(&MFCreateSourceReaderFromURL) createReader = nullptr;

  private:
    template <class Function>
    static void Find(const support::win32::Module& module, const char* name, Function& function) {
        if (module) {
            function =
                reinterpret_cast<Function>(reinterpret_cast<void*>(GetProcAddress(module.get(), name)));
        }
        if (function == nullptr) throw SourceError(text::kNoDecoder);
    }

    support::win32::Module m_platform, m_readers;
    decltype(&MFStartup) m_start = nullptr;
    decltype(&MFShutdown) m_shutDown = nullptr;
};

// Rows of a locked buffer; `pitch` is negative where they are stored bottom-up.
void CopyRows(Picture& picture, const BYTE* first, LONG pitch) {
    const auto rowBytes = static_cast<std::size_t>(picture.size.width) * 4;
    std::uint8_t* out = picture.pixels.data();
    for (std::int32_t y = 0; y < picture.size.height; ++y, out += rowBytes) {
        std::memcpy(out, first + std::ptrdiff_t{pitch} * y, rowBytes);
        for (std::size_t x = 3; x < rowBytes; x += 4) out[x] = 255;  // the reader leaves it undefined
    }
}

class MediaClip final : public ClipSource {
  public:
    explicit MediaClip(const std::wstring& file) {
        Com<IMFAttributes> attributes;
        Check(m_system.createAttributes(ComOut(attributes), 1), text::kCannotRead);
        attributes->SetUINT32(MF_SOURCE_READER_ENABLE_VIDEO_PROCESSING, TRUE);
        Check(m_system.createReader(file.c_str(), attributes.get(), ComOut(m_reader)), text::kCannotRead);
        ChooseFormat();
        ReadFacts();
        m_last = Next();
        if (m_last.pixels.empty()) throw SourceError(text::kNoFrames);
    }

    Picture Read(std::int64_t frame) override {
        if (frame == m_lastFrame) return m_last;
        const bool isNext = frame == m_lastFrame + 1;
        if (!isNext) Seek(frame);
        const double wanted = m_facts.rate.SecondsAt(frame) - 0.5 * m_facts.rate.SecondsAt(1);
        for (Picture picture = Next(); !picture.pixels.empty(); picture = Next()) {
            m_last = std::move(picture);
            if (isNext || m_lastSeconds >= wanted) break;
        }
        m_lastFrame = frame;
        return m_last;
    }

  private:
    void ChooseFormat() {
        m_reader->SetStreamSelection(static_cast<DWORD>(MF_SOURCE_READER_ALL_STREAMS), FALSE);
        Check(m_reader->SetStreamSelection(kVideo, TRUE), text::kNoFrames);
        Com<IMFMediaType> type;
        Check(m_system.createMediaType(ComOut(type)), text::kCannotRead);
        type->SetGUID(MF_MT_MAJOR_TYPE, MFMediaType_Video);
        type->SetGUID(MF_MT_SUBTYPE, MFVideoFormat_RGB32);
        Check(m_reader->SetCurrentMediaType(kVideo, nullptr, type.get()), text::kNoDecoder);
    }

    void ReadFacts() {
        Com<IMFMediaType> type;
        Check(m_reader->GetCurrentMediaType(kVideo, ComOut(type)), text::kCannotRead);
        UINT64 packed = 0;
        Check(type->GetUINT64(MF_MT_FRAME_SIZE, &packed), text::kCannotRead);
        m_facts.size = {static_cast<std::int32_t>(packed >> 32),
                        static_cast<std::int32_t>(packed & 0xFFFFFFFFu)};
        CheckSize(m_facts.size);
        if (SUCCEEDED(type->GetUINT64(MF_MT_FRAME_RATE, &packed)) && packed >> 32 != 0 &&
            (packed & 0xFFFFFFFFu) != 0) {
            m_facts.rate = {static_cast<std::int32_t>(packed >> 32),
                            static_cast<std::int32_t>(packed & 0xFFFFFFFFu)};
        }
        UINT32 stride = 0;
        const bool hasStride = SUCCEEDED(type->GetUINT32(MF_MT_DEFAULT_STRIDE, &stride));
        m_pitch = hasStride ? static_cast<LONG>(stride) : m_facts.size.width * 4;
        PROPVARIANT duration;
        PropVariantInit(&duration);
        if (SUCCEEDED(m_reader->GetPresentationAttribute(kMediaSource, MF_PD_DURATION, &duration)) &&
            duration.vt == VT_UI8) {
            const double seconds = static_cast<double>(duration.uhVal.QuadPart) / kTicksPerSecond;
            m_facts.frames = std::max<std::int64_t>(std::llround(seconds / m_facts.rate.SecondsAt(1)), 1);
        }
        PropVariantClear(&duration);
    }

    void Seek(std::int64_t frame) {
        PROPVARIANT place;
        PropVariantInit(&place);
        place.vt = VT_I8;
        place.hVal.QuadPart = std::llround(m_facts.rate.SecondsAt(frame) * kTicksPerSecond);
        Check(m_reader->SetCurrentPosition(GUID_NULL, place), text::kCannotReadFrame);
    }

    // Empty at the end of the clip.
    Picture Next() {
        for (;;) {
            DWORD flags = 0;
            LONGLONG time = 0;
            Com<IMFSample> sample;
            Check(m_reader->ReadSample(kVideo, 0, nullptr, &flags, &time, ComOut(sample)),
                  text::kCannotReadFrame);
            if ((flags & MF_SOURCE_READERF_ENDOFSTREAM) != 0) return {};
            if ((flags & MF_SOURCE_READERF_CURRENTMEDIATYPECHANGED) != 0) throw SourceError(text::kOtherSize);
            if (!sample) continue;
            m_lastSeconds = static_cast<double>(time) / kTicksPerSecond;
            return PictureIn(*sample);
        }
    }

    Picture PictureIn(IMFSample& sample) {
        Com<IMFMediaBuffer> buffer;
        Check(sample.ConvertToContiguousBuffer(ComOut(buffer)), text::kCannotReadFrame);
        BYTE* bytes = nullptr;
        DWORD length = 0;
        Check(buffer->Lock(&bytes, nullptr, &length), text::kCannotReadFrame);
        Picture picture{m_facts.size, {}};
        const auto height = static_cast<DWORD>(m_facts.size.height);
        const auto step = static_cast<DWORD>(std::abs(m_pitch));
        const bool isWhole = step >= static_cast<DWORD>(m_facts.size.width) * 4 && length >= step * height;
        if (isWhole) {
            picture.pixels.resize(Picture::BytesOf(m_facts.size));
            CopyRows(picture, m_pitch < 0 ? bytes + std::size_t{step} * (height - 1) : bytes, m_pitch);
        }
        buffer->Unlock();
        if (!isWhole) throw SourceError(text::kCannotReadFrame);
        return picture;
    }

    MediaSystem m_system;  // must outlive the reader
    Com<IMFSourceReader> m_reader;
    LONG m_pitch = 0;
    Picture m_last;
    std::int64_t m_lastFrame = 0;
    double m_lastSeconds = 0.0;
};

}  // namespace

std::unique_ptr<ClipSource> OpenMediaClip(const std::wstring& file) {
    return std::make_unique<MediaClip>(file);
}

}  // namespace velmora::reelview
