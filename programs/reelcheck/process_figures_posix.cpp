#include <malloc.h>

#include <cstdio>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <set>
#include <string>

#include "programs/reelcheck/process_figures.h"

namespace velmora::reelcheck {
namespace {

std::int64_t EntriesOf(const char* folder) {
    return std::distance(std::filesystem::directory_iterator(folder), std::filesystem::directory_iterator());
}

std::int64_t MappedFiles() {
    std::set<std::string> files;
    std::ifstream maps("/proc/self/maps");
    for (std::string line; std::getline(maps, line);) {
        const std::size_t path = line.find('/');
        if (path != std::string::npos) files.insert(line.substr(path));
    }
    return static_cast<std::int64_t>(files.size());
}

}  // namespace

ProcessFigures FiguresNow() {
    ProcessFigures figures;
    figures.handles = EntriesOf("/proc/self/fd");
    figures.modules = MappedFiles();
    figures.threads = EntriesOf("/proc/self/task");
    const struct mallinfo2 heap = mallinfo2();
    figures.memoryBytes = static_cast<std::int64_t>(heap.uordblks + heap.hblkhd);
    return figures;
}

}  // namespace velmora::reelcheck
