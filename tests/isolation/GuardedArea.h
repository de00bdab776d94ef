#pragma once

#include <windows.h>

#include <cstddef>
#include <span>

/// Memory that ends at a page without access, so that a read or a write beyond it fails at once.
class GuardedArea
{
public:
    /// `pages` of 4,096 bytes.
    explicit GuardedArea(std::size_t pages)
        : m_size(pages * PageBytes),
          m_memory(static_cast<std::byte*>(VirtualAlloc(nullptr, m_size + PageBytes, MEM_RESERVE, PAGE_NOACCESS)))
    {
        VirtualAlloc(m_memory, m_size, MEM_COMMIT, PAGE_READWRITE);
    }
    GuardedArea(const GuardedArea&) = delete;
    GuardedArea& operator=(const GuardedArea&) = delete;
    ~GuardedArea() { VirtualFree(m_memory, 0, MEM_RELEASE); }

    /// The whole memory.
    std::span<std::byte> All() const { return {m_memory, m_size}; }

    /// Its last bytes.
    std::span<std::byte> Last(std::size_t size) const { return All().last(size); }

private:
    static constexpr std::size_t PageBytes = 4096;

    std::size_t m_size;
    std::byte* m_memory;
};
