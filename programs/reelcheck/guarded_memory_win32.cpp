#include <windows.h>

#include <new>

#include "programs/reelcheck/guarded_memory.h"

namespace velmora::reelcheck {
namespace {

constexpr std::size_t kPage = 4096;

}  // namespace

GuardedMemory::GuardedMemory(std::size_t size, Edge edge) : m_size(size) {
    m_inner = (size + kPage - 1) / kPage * kPage;
    m_pages =
        static_cast<std::uint8_t*>(VirtualAlloc(nullptr, m_inner + 2 * kPage, MEM_RESERVE, PAGE_NOACCESS));
    if (m_pages == nullptr) throw std::bad_alloc();
    if (VirtualAlloc(m_pages + kPage, m_inner, MEM_COMMIT, PAGE_READWRITE) == nullptr) {
        VirtualFree(m_pages, 0, MEM_RELEASE);
        throw std::bad_alloc();
    }
    m_data = m_pages + kPage + (edge == Edge::kBack ? m_inner - size : 0);
}

GuardedMemory::~GuardedMemory() {
    VirtualFree(m_pages, 0, MEM_RELEASE);
}

void GuardedMemory::ForbidWriting() noexcept {
    DWORD before = 0;
    VirtualProtect(m_pages + kPage, m_inner, PAGE_READONLY, &before);
}

}  // namespace velmora::reelcheck
