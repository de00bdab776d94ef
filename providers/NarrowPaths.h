#pragma once

#include <windows.h>

#include <memory_resource>
#include <string_view>
#include <vector>

/// Whether `narrow`, in the ANSI code page, has the same characters as the text. Throws std::bad_alloc.
bool IsExact(std::wstring_view text, const char* narrow);

/// Paths in the ANSI code page, as an MSSCCI library takes them.
class NarrowPaths
{
public:
    /// Room for so many paths. Throws std::bad_alloc.
    explicit NarrowPaths(unsigned int count) { m_pointers.reserve(count); }

    /// Appends a path, of which nothing is kept; false when the code page does not carry it exactly, so that it would
    /// name another file. Throws std::bad_alloc, and std::invalid_argument for null.
    bool Add(const wchar_t* path);

    LONG Count() const { return static_cast<LONG>(m_pointers.size()); }

    /// The array for one call; owned by this object, and so is what it points to.
    LPCSTR* Get() { return m_pointers.data(); }

private:
    std::pmr::monotonic_buffer_resource m_texts;
    std::vector<LPCSTR> m_pointers;
};
