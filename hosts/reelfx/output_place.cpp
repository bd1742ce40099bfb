#include "hosts/reelfx/output_place.h"

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <unistd.h>

#include "hosts/reelfx/failure.h"

extern "C" {
#include <libavformat/avformat.h>
}

namespace velmora::hosts {
namespace {

namespace fs = std::filesystem;

std::string ExistsText(const std::string& name) {
    return name + ": exists already; --overwrite replaces it";
}

// The first file that a pattern names, for either usual start of counting; the path itself without one.
bool SomethingStandsAt(const std::string& path, std::int64_t firstImage) {
    std::error_code ignored;
    char name[4096];
    for (const std::int64_t number : {firstImage == 1 ? 0 : firstImage, firstImage}) {
        if (av_get_frame_filename(name, sizeof name, path.c_str(), static_cast<int>(number)) < 0) break;
        if (fs::exists(name, ignored)) return true;
    }
    return fs::exists(path, ignored);
}

fs::path MakeHiddenFolder(const fs::path& beside, const std::string& name) {
    std::string pattern = (beside / ".reelfx-XXXXXX").string();
    if (!mkdtemp(pattern.data())) {
        throw Failure(kExitOutput, name + ": cannot be written: " + std::strerror(errno));
    }
    return pattern;
}

}  // namespace

void CheckOutputPlace(const std::string& path, bool mayOverwrite, std::int64_t firstImage) {
    if (path == "-") {
        if (isatty(STDOUT_FILENO) == 0) return;
        throw Failure(kExitOutput, "standard output is a terminal; pipe it into a program or name a file");
    }
    std::error_code ignored;
    const fs::file_status status = fs::status(path, ignored);
    if (fs::is_directory(status)) throw Failure(kExitOutput, path + ": is a folder");
    if (fs::exists(status) && !fs::is_regular_file(status)) return;
    if (!mayOverwrite && SomethingStandsAt(path, firstImage)) throw Failure(kExitOutput, ExistsText(path));
    if (access(fs::absolute(path).parent_path().c_str(), W_OK | X_OK) != 0) {
        throw Failure(kExitOutput, path + ": cannot be written: " + std::strerror(errno));
    }
}

OutputPlace::OutputPlace(const std::string& path, bool mayOverwrite, std::int64_t firstImage)
    : m_path(path), m_name(path == "-" ? "standard output" : path), m_mayOverwrite(mayOverwrite) {
    CheckOutputPlace(path, mayOverwrite, firstImage);
    std::error_code ignored;
    const fs::file_status status = fs::status(m_path, ignored);
    if (path == "-" || (fs::exists(status) && !fs::is_regular_file(status))) return;
    m_replaces = SomethingStandsAt(path, firstImage);
    // Absolute: a relative name with a colon would be taken for an address.
    const fs::path beside = fs::absolute(m_path).parent_path();
    m_folder = MakeHiddenFolder(beside, m_name);
}

OutputPlace::~OutputPlace() {
    std::error_code ignored;
    if (!m_folder.empty()) fs::remove_all(m_folder, ignored);
}

std::string OutputPlace::Address() const {
    if (m_path == "-") return "pipe:1";
    return (m_folder.empty() ? m_path : m_folder / m_path.filename()).string();
}

void OutputPlace::Keep() {
    if (m_folder.empty()) return;
    try {
        for (const fs::directory_entry& file : fs::directory_iterator(m_folder)) {
            const fs::path target = m_folder.parent_path() / file.path().filename();
            // Somebody else may have written there while this command ran.
            if (!m_mayOverwrite && fs::exists(target))
                throw Failure(kExitOutput, ExistsText(target.string()));
            fs::rename(file.path(), target);
        }
    } catch (const fs::filesystem_error& error) {
        throw Failure(kExitOutput, m_name + ": cannot be written: " + error.code().message());
    }
}

}  // namespace velmora::hosts
