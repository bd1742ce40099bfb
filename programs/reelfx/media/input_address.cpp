#include "programs/reelfx/media/input_address.h"

#include <algorithm>
#include <cctype>
#include <cstdlib>
#include <filesystem>
#include <limits>
#include <map>
#include <set>

#include "programs/reelfx/common/failure.h"

namespace velmora::hosts {
namespace {

namespace fs = std::filesystem;

constexpr char kFileScheme[] = "file:";
// Sequences often begin at 1001 or at a time code. Each number is tried until a file is found.
constexpr char kFirstNumbers[] = "1000000";

bool IsAddress(const std::string& path) {
    return path.find("://") != std::string::npos;
}

bool IsImageName(const std::string& name) {
    const AVOutputFormat* images = av_guess_format("image2", nullptr, nullptr);
    return images && av_match_ext(name.c_str(), images->extensions) != 0;
}

std::string Escaped(const std::string& path) {
    std::string text;
    for (const char letter : path) {
        if (std::string("\\*?[]{}").find(letter) != std::string::npos) text += '\\';
        text += letter;
    }
    return text;
}

// A pattern of all images in the folder, which are of one kind.
std::string PatternOfFolder(const std::string& folder) {
    std::map<std::string, int> kinds;
    std::error_code ignored;
    for (fs::directory_iterator entry(folder, ignored), end; !ignored && entry != end;
         entry.increment(ignored)) {
        const std::string name = entry->path().filename().string();
        if (name.front() != '.' && IsImageName(name)) ++kinds[entry->path().extension().string()];
    }
    if (kinds.empty()) {
        throw Failure(kExitInput, folder +
                                      ": is a folder without images; use a file name or a pattern like "
                                      "frames-%03d.png");
    }
    if (kinds.size() > 1) {
        throw Failure(kExitInput, folder + ": the folder has images of several kinds; use a pattern like " +
                                      (fs::path(folder) / "*").string() + kinds.begin()->first);
    }
    return Escaped(fs::path(folder).string()) + "/*" + kinds.begin()->first;
}

void LocateImages(const std::string& pattern, InputAddress& address) {
    address.url = pattern;
    address.format = av_find_input_format("image2");
    address.entries.Set("pattern_type", "glob");
}

}  // namespace

bool CanBeReadTwice(const std::string& path) {
    std::error_code ignored;
    const fs::file_status status = fs::status(path, ignored);
    return path != "-" && !fs::is_fifo(status) && !fs::is_character_file(status) && !fs::is_socket(status);
}

void Locate(const InputOptions& options, InputAddress& address) {
    const std::string& path = options.path;
    std::error_code ignored;
    // A file name may look like an address ("take:2.mov") or a pattern; existing files count as files.
    const bool isThere = path != "-" && fs::exists(path, ignored);
    address.url = isThere ? kFileScheme + path : path;
    if (options.rawSize) {
        address.format = av_find_input_format("rawvideo");
        address.entries.Set("pixel_format", "bgra");
        address.entries.Set("video_size", std::to_string(options.rawSize->width) + "x" +
                                              std::to_string(options.rawSize->height));
    } else if (isThere && fs::is_directory(path, ignored)) {
        LocateImages(PatternOfFolder(path), address);
    } else if (!isThere && !IsAddress(path) && path.find_first_of("*?[") != std::string::npos) {
        LocateImages(path, address);
    } else if (options.startNumber) {
        address.entries.Set("start_number", std::to_string(*options.startNumber));
    } else if (!isThere && path.find('%') != std::string::npos && IsImageName(path)) {
        address.format = av_find_input_format("image2");
        address.entries.Set("start_number_range", kFirstNumbers);
    }
    if (options.rate) {
        address.entries.Set("framerate", std::to_string(options.rate->numerator) + "/" +
                                             std::to_string(options.rate->denominator));
    }
}

void CheckTaken(InputAddress& address) {
    AVDictionary* const left = *address.entries.Entries();
    if (av_dict_get(left, "framerate", nullptr, 0)) {
        throw Failure(
            kExitUsage,
            "--rate is for raw BGRA and image sequences; a clip has its own rate, and --fps changes it");
    }
    if (av_dict_get(left, "start_number", nullptr, 0))
        throw Failure(kExitUsage, "--start-number is for numbered image sequences");
}

std::string FirstMissingImage(const InputOptions& options) {
    const fs::path pattern(options.path);
    std::error_code ignored;
    char name[4096];
    const auto file = [&](std::int64_t number) {
        const bool isNumbered = number <= std::numeric_limits<int>::max() &&
                                av_get_frame_filename(name, sizeof name, pattern.filename().c_str(),
                                                      static_cast<int>(number)) >= 0;
        return isNumbered ? std::string(name) : std::string();
    };
    if (!IsImageName(options.path) || file(0).empty() || fs::exists(pattern, ignored)) return {};
    const std::size_t prefix = pattern.filename().string().find('%');
    std::set<std::int64_t> numbers;
    for (fs::directory_iterator entry(fs::absolute(pattern).parent_path(), ignored), end;
         !ignored && entry != end; entry.increment(ignored)) {
        const std::string found = entry->path().filename().string();
        const std::int64_t number =
            prefix < found.size() ? std::strtoll(found.c_str() + prefix, nullptr, 10) : -1;
        if (number >= options.startNumber.value_or(0) && found == file(number)) numbers.insert(number);
    }
    if (numbers.empty() || *numbers.rbegin() - *numbers.begin() + 1 == std::ssize(numbers)) return {};
    std::int64_t missing = *numbers.begin();
    while (numbers.contains(missing)) ++missing;
    return file(missing);
}

}  // namespace velmora::hosts
