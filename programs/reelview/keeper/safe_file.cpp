#include "programs/reelview/keeper/safe_file.h"

#include <system_error>
#include <utility>

#include "programs/reelview/source/clip_source.h"
#include "programs/reelview/base/text_keys.h"

namespace velmora::reelview {

SafeFile::SafeFile(std::filesystem::path target) : m_target(std::move(target)), m_place(m_target) {
    std::filesystem::path name = m_target.stem();
    name += ".unfinished";
    std::error_code error;
    for (int i = 0; i < 100; ++i) {
        std::filesystem::path tried = name;
        if (i > 0) tried += std::to_string(i);
        tried += m_target.extension();
        m_place.replace_filename(tried);
        if (!std::filesystem::exists(m_place, error)) break;
    }
}

SafeFile::~SafeFile() {
    std::error_code error;
    if (!m_isFinished) std::filesystem::remove(m_place, error);
}

void SafeFile::Finish() {
    std::error_code error;
    std::filesystem::rename(m_place, m_target, error);
    if (error) throw SourceError(text::kCannotWrite);
    m_isFinished = true;
}

}  // namespace velmora::reelview
