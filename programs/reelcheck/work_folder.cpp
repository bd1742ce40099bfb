#include <filesystem>
#include <random>

#include "programs/reelcheck/dialog_answers.h"

namespace velmora::reelcheck {

WorkFolder::WorkFolder() {
    const std::filesystem::path base = std::filesystem::temp_directory_path();
    std::random_device random;
    std::filesystem::path folder;
    do {
        folder = base / ("reelcheck-" + std::to_string(random()));
    } while (!std::filesystem::create_directory(folder));
    m_folder = folder.string();
}

WorkFolder::~WorkFolder() {
    std::error_code ignored;
    std::filesystem::remove_all(m_folder, ignored);
}

}  // namespace velmora::reelcheck
