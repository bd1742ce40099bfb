#include "programs/reelcheck/system.h"

#include <malloc.h>
#include <sys/mman.h>
#include <unistd.h>

#include <cstdio>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <new>
#include <set>
#include <string>

namespace velmora::reelcheck {
namespace {

std::size_t PageSize() noexcept {
    static const auto size = static_cast<std::size_t>(sysconf(_SC_PAGESIZE));
    return size;
}

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

GuardedMemory::GuardedMemory(std::size_t size, Edge edge) : m_size(size) {
    const std::size_t page = PageSize();
    m_inner = (size + page - 1) / page * page;
    void* const pages = mmap(nullptr, m_inner + 2 * page, PROT_NONE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
    if (pages == MAP_FAILED) throw std::bad_alloc();
    m_pages = static_cast<std::uint8_t*>(pages);
    if (mprotect(m_pages + page, m_inner, PROT_READ | PROT_WRITE) != 0) {
        munmap(m_pages, m_inner + 2 * page);
        throw std::bad_alloc();
    }
    m_data = m_pages + page + (edge == Edge::kBack ? m_inner - size : 0);
}

GuardedMemory::~GuardedMemory() {
    munmap(m_pages, m_inner + 2 * PageSize());
}

void GuardedMemory::ForbidWriting() noexcept {
    mprotect(m_pages + PageSize(), m_inner, PROT_READ);
}

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
