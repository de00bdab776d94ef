#include "NarrowPaths.h"

#include "CStr.h"
#include "WStr.h"

#include <cstring>
#include <cwchar>
#include <new>
#include <stdexcept>
#include <string_view>

namespace
{

/// Copies `size` characters to bytes; false when one of them is not ASCII. Every ANSI code page carries ASCII as it is.
bool CopyAscii(const wchar_t* __restrict path, std::size_t size, char* __restrict bytes)
{
    unsigned int all = 0;
    for (std::size_t i = 0; i < size; ++i)
    {
        bytes[i] = static_cast<char>(path[i]);
        all |= path[i];
    }
    return all < 0x80;
}

} // namespace

bool IsExact(std::wstring_view text, const char* narrow)
{
    const WStr back(narrow);
    if (back.Get() == nullptr)
    {
        throw std::bad_alloc();
    }
    return back.Get() == text;
}

bool NarrowPaths::Add(const wchar_t* path)
{
    if (path == nullptr)
    {
        throw std::invalid_argument("path");
    }
    const std::size_t size = std::wcslen(path) + 1;
    auto* bytes = static_cast<char*>(m_texts.allocate(size, 1));
    if (!CopyAscii(path, size, bytes))
    {
        const CStr text(path);
        if (text.Get() == nullptr)
        {
            throw std::bad_alloc();
        }
        if (!IsExact(path, text.Get()))
        {
            return false;
        }
        const std::size_t narrowSize = std::strlen(text.Get()) + 1;
        bytes = static_cast<char*>(m_texts.allocate(narrowSize, 1));
        std::memcpy(bytes, text.Get(), narrowSize);
    }
    m_pointers.push_back(bytes);
    return true;
}
