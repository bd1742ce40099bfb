#include "programs/reelview/keeper/export_job_win32.h"

#include <algorithm>
#include <filesystem>
#include <system_error>
#include <vector>

#include "programs/reelview/keeper/frame_sink.h"
#include "programs/reelview/source/open_clip_win32.h"
#include "programs/reelview/base/texts.h"

namespace velmora::reelview {
namespace {

namespace fs = std::filesystem;

// The pictures stay in a separate folder until the last one is written.
class PngSink final : public FrameSink {
  public:
    PngSink(const fs::path& file, const ClipFacts& facts)
        : m_file(file), m_digits(std::max<std::size_t>(std::to_string(facts.frames - 1).size(), 4)) {
        std::error_code error;
        for (std::int64_t i = 0; i < facts.frames; ++i) {
            if (fs::exists(Named(i), error)) throw SourceError(text::kFilesExist);
        }
        m_folder = file;
        m_folder.replace_extension(L".unfinished");
        if (!fs::create_directory(m_folder, error)) throw SourceError(text::kCannotWrite);
    }
    ~PngSink() override {
        std::error_code error;
        fs::remove_all(m_folder, error);
    }

    void Write(const Picture& picture) override {
        WritePng((m_folder / Named(m_count).filename()).wstring(), picture);
        ++m_count;
    }

    void Finish() override {
        std::error_code error;
        for (std::int64_t i = 0; i < m_count; ++i) {
            fs::rename(m_folder / Named(i).filename(), Named(i), error);
            if (error) throw SourceError(text::kCannotWrite);
        }
    }

  private:
    [[nodiscard]] fs::path Named(std::int64_t index) const {
        std::wstring number = std::to_wstring(index);
        number.insert(0, m_digits - std::min(m_digits, number.size()), L'0');
        fs::path path = m_file;
        path.replace_filename(m_file.stem().wstring() + number + L".png");
        return path;
    }

    fs::path m_file, m_folder;
    std::size_t m_digits;
    std::int64_t m_count = 0;
};

}  // namespace

std::unique_ptr<FrameSink> MakePngSink(const std::wstring& file, const ClipFacts& facts) {
    return std::make_unique<PngSink>(file, facts);
}

void SavePng(const std::wstring& file, const Picture& picture) {
    SafeFile safe{fs::path(file)};
    WritePng(safe.Place().wstring(), picture);
    safe.Finish();
}

}  // namespace velmora::reelview
