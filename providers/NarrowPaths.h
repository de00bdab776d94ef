#pragma once

#include <windows.h>

#include <memory_resource>
#include <vector>

class OrvixFileList;

/// Paths in the ANSI code page, as an MSSCCI library takes them. Throws std::bad_alloc without memory, and
/// std::range_error for a path that the code page does not carry exactly.
class NarrowPaths
{
public:
    /// The first `count` active entries of a list. Throws std::out_of_range when one is missing.
    NarrowPaths(OrvixFileList& list, unsigned int count);

    /// A single path. Throws std::bad_alloc for null as well.
    explicit NarrowPaths(const wchar_t* path);

    LONG Count() const { return static_cast<LONG>(m_pointers.size()); }

    /// The array for one call; owned by this object, and so is what it points to.
    LPCSTR* Get() { return m_pointers.data(); }

private:
    void Add(const wchar_t* path);

    std::pmr::monotonic_buffer_resource m_texts;
    std::vector<LPCSTR> m_pointers;
};
