#include "programs/reelview/source/open_clip_win32.h"

#include <filesystem>
#include <fstream>
#include <string_view>

#include "programs/reelview/source/clip_source.h"
#include "programs/reelview/base/texts.h"

namespace velmora::reelview {
namespace {

std::string FirstBytes(const std::wstring& file) {
    std::ifstream stream(std::filesystem::path(file), std::ios::binary);
    if (!stream) throw SourceError(text::kCannotOpen);
    std::string bytes(16, '\0');
    stream.read(bytes.data(), static_cast<std::streamsize>(bytes.size()));
    bytes.resize(static_cast<std::size_t>(stream.gcount()));
    return bytes;
}

// The reader that knows the format gives the best error message. The system's media reader has codecs that the AVI
// interface lacks.
std::unique_ptr<ClipSource> OpenAvi(const std::wstring& file) {
    try {
        return OpenAviClip(file);
    } catch (const SourceError& error) {
        try {
            return OpenMediaClip(file);
        } catch (const SourceError&) {
            throw error;
        }
    }
}

std::unique_ptr<ClipSource> OpenOther(const std::wstring& file) {
    try {
        return OpenPictures({file});
    } catch (const SourceError& error) {
        if (std::string_view(error.what()) != text::kCannotRead) throw;
    }
    return OpenMediaClip(file);
}

}  // namespace

std::unique_ptr<ClipSource> OpenClip(const ClipRequest& request) {
    const std::wstring& file = request.files.at(0);
    const std::string start = FirstBytes(file);
    if (start.starts_with("YUV4MPEG2")) return OpenY4mClip(file);
    if (start.starts_with("RIFF") && std::string_view(start).substr(8).starts_with("AVI "))
        return OpenAvi(file);
    if (request.isSequence) return OpenSequence(file);
    if (request.files.size() > 1) return OpenPictures(request.files);
    return OpenOther(file);
}

}  // namespace velmora::reelview
