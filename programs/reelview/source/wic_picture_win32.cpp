#include "programs/reelview/base/com_win32.h"

#include <wincodec.h>

#include <filesystem>
#include <fstream>
#include <utility>

#include "programs/reelview/source/clip_source.h"
#include "programs/reelview/source/open_clip_win32.h"
#include "programs/reelview/base/texts.h"

namespace velmora::reelview {
namespace {

Com<IWICImagingFactory> ImagingFactory(const char* error) {
    Com<IWICImagingFactory> factory;
    CoCreateInstance(CLSID_WICImagingFactory, nullptr, CLSCTX_INPROC_SERVER, IID_IWICImagingFactory,
                     ComOut(factory));
    if (!factory) throw SourceError(error);
    return factory;
}

void Check(HRESULT result, const char* error) {
    if (FAILED(result)) throw SourceError(error);
}

// Straight alpha: the effects treat it as an independent channel.
Picture PixelsOf(IWICImagingFactory& factory, IWICBitmapSource& source) {
    UINT width = 0, height = 0;
    Check(source.GetSize(&width, &height), text::kCannotRead);
    if (width > kLargestSide || height > kLargestSide) throw SourceError(text::kTooLarge);
    Picture picture;
    picture.size = {static_cast<std::int32_t>(width), static_cast<std::int32_t>(height)};
    CheckSize(picture.size);
    Com<IWICFormatConverter> converter;
    Check(factory.CreateFormatConverter(ComOut(converter)), text::kCannotRead);
    Check(converter->Initialize(&source, GUID_WICPixelFormat32bppBGRA, WICBitmapDitherTypeNone, nullptr, 0.0,
                                WICBitmapPaletteTypeCustom),
          text::kCannotRead);
    picture.pixels.resize(Picture::BytesOf(picture.size));
    Check(converter->CopyPixels(nullptr, width * 4, static_cast<UINT>(picture.pixels.size()),
                                picture.pixels.data()),
          text::kCannotRead);
    return picture;
}

std::u16string Text16(const std::wstring& text) {
    return {text.begin(), text.end()};
}

class PictureClip final : public ClipSource {
  public:
    explicit PictureClip(std::vector<std::wstring> files) : m_files(std::move(files)) {
        m_first = ReadPicture(m_files.at(0));
        m_facts.size = m_first.size;
        m_facts.frames = static_cast<std::int64_t>(m_files.size());
        m_facts.isPictures = m_files.size() > 1;
        std::vector<std::u16string> names;
        for (const std::wstring& name : m_files) names.push_back(Text16(name));
        if (m_facts.isPictures) m_facts.numbering = NumberingOf(names);
    }

    Picture Read(std::int64_t frame) override {
        if (frame == 0) return m_first;
        Picture picture = ReadPicture(m_files.at(static_cast<std::size_t>(frame)));
        const bool hasOtherSize =
            picture.size.width != m_facts.size.width || picture.size.height != m_facts.size.height;
        if (hasOtherSize) throw SourceError(text::kOtherSize);
        return picture;
    }

  private:
    std::vector<std::wstring> m_files;
    Picture m_first;
};

void EncodeFrame(IWICBitmapEncoder& encoder, IWICImagingFactory& factory, const Picture& picture) {
    Com<IWICBitmapFrameEncode> frame;
    Check(encoder.CreateNewFrame(ComOut(frame), nullptr), text::kCannotWrite);
    Check(frame->Initialize(nullptr), text::kCannotWrite);
    const auto width = static_cast<UINT>(picture.size.width), height = static_cast<UINT>(picture.size.height);
    Check(frame->SetSize(width, height), text::kCannotWrite);
    WICPixelFormatGUID format = GUID_WICPixelFormat32bppBGRA;
    Check(frame->SetPixelFormat(&format), text::kCannotWrite);
    Com<IWICBitmap> bitmap;
    Check(factory.CreateBitmapFromMemory(width, height, GUID_WICPixelFormat32bppBGRA, width * 4,
                                         static_cast<UINT>(picture.pixels.size()),
                                         const_cast<BYTE*>(picture.pixels.data()), ComOut(bitmap)),
          text::kCannotWrite);
    Check(frame->WriteSource(bitmap.get(), nullptr), text::kCannotWrite);
    Check(frame->Commit(), text::kCannotWrite);
}

}  // namespace

Picture ReadPicture(const std::wstring& file) {
    const auto factory = ImagingFactory(text::kCannotRead);
    Com<IWICBitmapDecoder> decoder;
    const HRESULT opened = factory->CreateDecoderFromFilename(
        file.c_str(), nullptr, GENERIC_READ, WICDecodeMetadataCacheOnDemand, ComOut(decoder));
    if (FAILED(opened) || !decoder) throw SourceError(text::kCannotRead);
    Com<IWICBitmapFrameDecode> frame;
    Check(decoder->GetFrame(0, ComOut(frame)), text::kCannotRead);
    // Not from the system, which knows the orientation only where it has the format's metadata reader.
    std::ifstream stored(std::filesystem::path(file), std::ios::binary);
    return Turned(PixelsOf(*factory, *frame), StoredOrientation(stored));
}

void WritePng(const std::wstring& file, const Picture& picture) {
    const auto factory = ImagingFactory(text::kCannotWrite);
    Com<IWICStream> stream;
    Check(factory->CreateStream(ComOut(stream)), text::kCannotWrite);
    Check(stream->InitializeFromFilename(file.c_str(), GENERIC_WRITE), text::kCannotWrite);
    Com<IWICBitmapEncoder> encoder;
    Check(factory->CreateEncoder(GUID_ContainerFormatPng, nullptr, ComOut(encoder)), text::kCannotWrite);
    Check(encoder->Initialize(stream.get(), WICBitmapEncoderNoCache), text::kCannotWrite);
    EncodeFrame(*encoder, *factory, picture);
    Check(encoder->Commit(), text::kCannotWrite);
}

std::unique_ptr<ClipSource> OpenPictures(std::vector<std::wstring> files) {
    return std::make_unique<PictureClip>(std::move(files));
}

std::unique_ptr<ClipSource> OpenSequence(const std::wstring& file) {
    const std::filesystem::path chosen(file);
    std::vector<std::u16string> names;
    std::error_code error;
    for (const auto& entry : std::filesystem::directory_iterator(chosen.parent_path(), error)) {
        names.push_back(Text16(entry.path().filename().wstring()));
    }
    std::vector<std::wstring> files;
    for (const std::u16string& name : SequenceOf(Text16(chosen.filename().wstring()), names)) {
        files.push_back((chosen.parent_path() / std::wstring(name.begin(), name.end())).wstring());
    }
    return OpenPictures(std::move(files));
}

}  // namespace velmora::reelview
