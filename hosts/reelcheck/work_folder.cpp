#include <cstdio>
#include <filesystem>
#include <random>

#include "hosts/reelcheck/dialog_answers.h"

namespace velmora::reelcheck {

WorkFolder::WorkFolder() {
    const std::filesystem::path base = std::filesystem::temp_directory_path();
    std::random_device random;
    std::filesystem::path folder;
    do {
        folder = base / ("reelcheck-" + std::to_string(random()));
    } while (!std::filesystem::create_directory(folder));
    std::snprintf(m_folder, sizeof m_folder, "%s", folder.string().c_str());
}

WorkFolder::~WorkFolder() {
    std::error_code ignored;
    std::filesystem::remove_all(m_folder, ignored);
}

const char* WorkFolder::PathOf(const char* name) noexcept {
    std::snprintf(m_path, sizeof m_path, "%s/%s", m_folder, name);
    return m_path;
}

}  // namespace velmora::reelcheck
