// A file that appears under its name only when it is whole.
#pragma once

#include <filesystem>

namespace velmora::reelview {

class SafeFile {
  public:
    explicit SafeFile(std::filesystem::path target);
    // Removes what is not finished.
    ~SafeFile();
    SafeFile(const SafeFile&) = delete;
    SafeFile& operator=(const SafeFile&) = delete;

    // Where to write: beside the target, with the target's extension, so that formats chosen by name stay the same.
    [[nodiscard]] const std::filesystem::path& Place() const { return m_place; }
    // Puts the file, closed by now, in the target's place. Throws SourceError (text::kCannotWrite); the target is then
    // as it was.
    void Finish();

  private:
    std::filesystem::path m_target, m_place;
    bool m_isFinished = false;
};

}  // namespace velmora::reelview
