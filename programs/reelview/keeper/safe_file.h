// A file that gets its final name only when it is complete.
#pragma once

#include <filesystem>

namespace velmora::reelview {

class SafeFile {
  public:
    explicit SafeFile(std::filesystem::path target);
    // Removes an unfinished file.
    ~SafeFile();
    SafeFile(const SafeFile&) = delete;
    SafeFile& operator=(const SafeFile&) = delete;

    // The path to write to: next to the target and with its extension, because some formats are chosen by extension.
    [[nodiscard]] const std::filesystem::path& Place() const { return m_place; }
    // Moves the file, which must be closed, to the target. Throws SourceError (text::kCannotWrite) and then leaves
    // the target unchanged.
    void Finish();

  private:
    std::filesystem::path m_target, m_place;
    bool m_isFinished = false;
};

}  // namespace velmora::reelview
