#include "NarrowPaths.h"

#include "CStr.h"
#include "OrvixFileEntry.h"
#include "OrvixFileList.h"
#include "WStr.h"

#include <algorithm>
#include <cstring>
#include <new>
#include <stdexcept>
#include <string_view>

namespace
{

bool IsExact(std::wstring_view path, const char* narrow)
{
    // Every ANSI code page carries these as they are; only the others need a second conversion.
    if (std::all_of(path.begin(), path.end(), [](wchar_t c) { return c < 0x80; }))
    {
        return true;
    }
    const WStr back(narrow);
    return back.Get() != nullptr && back.Get() == path;
}

} // namespace

NarrowPaths::NarrowPaths(OrvixFileList& list, unsigned int count)
{
    m_pointers.reserve(count);
    for (unsigned int i = 0; i < count; ++i)
    {
        OrvixFileEntry* entry = list.GetActiveFileEntry(i);
        if (entry == nullptr)
        {
            throw std::out_of_range("active entry");
        }
        Add(entry->GetFile());
    }
}

NarrowPaths::NarrowPaths(const wchar_t* path)
{
    Add(path);
}

void NarrowPaths::Add(const wchar_t* path)
{
    const CStr text(path);
    if (text.Get() == nullptr)
    {
        throw std::bad_alloc();
    }
    if (!IsExact(path, text.Get()))
    {
        throw std::range_error("path");
    }
    const std::size_t size = std::strlen(text.Get()) + 1;
    m_pointers.push_back(static_cast<char*>(std::memcpy(m_texts.allocate(size, 1), text.Get(), size)));
}
