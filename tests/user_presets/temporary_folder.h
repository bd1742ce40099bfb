// A folder for one test, removed with it. File contents are bytes.
#pragma once

#include <atomic>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>

namespace velmora::tests {

class TemporaryFolder {
  public:
    TemporaryFolder() {
        static std::atomic<int> counter{0};
        namespace fs = std::filesystem;
        do {
            m_path = fs::temp_directory_path() /
                     ("velmora-presets-" + std::to_string(counter++) + "-" + std::to_string(std::rand()));
        } while (!fs::create_directory(m_path));
    }
    ~TemporaryFolder() {
        std::error_code ignored;
        std::filesystem::remove_all(m_path, ignored);
    }
    TemporaryFolder(const TemporaryFolder&) = delete;
    TemporaryFolder& operator=(const TemporaryFolder&) = delete;

    const std::filesystem::path& Path() const { return m_path; }
    std::string File(const std::string& name) const { return (m_path / name).string(); }
    std::string Write(const std::string& name, const std::string& bytes) const {
        std::ofstream(m_path / name, std::ios::binary) << bytes;
        return File(name);
    }
    std::string Read(const std::string& name) const {
        std::ifstream file(m_path / name, std::ios::binary);
        return {std::istreambuf_iterator<char>(file), {}};
    }
    std::size_t Count() const {
        using Iterator = std::filesystem::directory_iterator;
        return static_cast<std::size_t>(std::distance(Iterator(m_path), Iterator()));
    }

  private:
    std::filesystem::path m_path;
};

}  // namespace velmora::tests
