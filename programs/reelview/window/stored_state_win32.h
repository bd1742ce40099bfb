// What the program remembers between runs, in the user's part of the registry. Windows only.
#pragma once

#include <windows.h>

#include <algorithm>
#include <cstddef>
#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace velmora::reelview {

// Recently opened files, newest first.
class RecentFiles {
  public:
    static constexpr std::size_t kCount = 8;

    RecentFiles() = default;
    explicit RecentFiles(std::vector<std::u16string> files) : m_files(std::move(files)) { Cut(); }

    void Add(const std::u16string& file) {
        Remove(file);
        m_files.insert(m_files.begin(), file);
        Cut();
    }
    void Remove(const std::u16string& file) { std::erase(m_files, file); }
    [[nodiscard]] const std::vector<std::u16string>& Files() const { return m_files; }

  private:
    void Cut() { m_files.resize(std::min(m_files.size(), kCount)); }

    std::vector<std::u16string> m_files;
};

[[nodiscard]] RecentFiles StoredRecentFiles();
void StoreRecentFiles(const RecentFiles& files);

[[nodiscard]] std::optional<WINDOWPLACEMENT> StoredPlace();
void StorePlace(HWND window);

}  // namespace velmora::reelview
