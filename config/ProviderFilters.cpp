#include "ProviderFilters.h"

#include "ExceptionBarrier.h"
#include "UpperCase.h"

#include <algorithm>
#include <cwchar>

// NOLINTNEXTLINE(cppcoreguidelines-pro-type-member-init): to fill the array would cost more than the copy
FilteredPath::FilteredPath(const wchar_t* path)
{
    const std::size_t size = std::wcslen(path);
    wchar_t* text = m_short.data();
    if (size >= m_short.size())
    {
        m_long.resize(size);
        text = m_long.data();
    }
    std::transform(path, path + size, text, UpperCaseLetter);
    text[size] = L'\0';
    m_text = {text, size};
    const std::size_t dot = m_text.rfind(L'.');
    if (dot != std::wstring_view::npos)
    {
        m_type = m_text.substr(dot + 1);
    }
}

/// Only letters beyond z need the C library. Both texts end with a null character.
bool FilteredPath::EqualsType(const std::wstring& type) const
{
    for (std::size_t i = 0; i < type.size(); ++i)
    {
        if (type[i] != m_type[i])
        {
            const bool ascii = (type[i] | m_type[i]) < 0x80;
            return !ascii && _wcsicmp(type.c_str() + i, m_type.data() + i) == 0;
        }
    }
    return true;
}

bool ProviderFilters::Excludes(const wchar_t* path) const
{
    return path != nullptr && WithBarrier(false, [&] { return Judge(FilteredPath(path)) != Exclusion::None; });
}
