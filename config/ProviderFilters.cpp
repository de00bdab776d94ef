#include "ProviderFilters.h"

#include "ExceptionBarrier.h"
#include "UpperCase.h"

#include <algorithm>
#include <cwchar>

namespace
{

/// Most folders are told from the path by one character: the first one on another drive, the last one in another
/// folder of the same drive.
bool StartsWith(std::wstring_view path, std::wstring_view folder)
{
    return folder.empty() || (path.size() >= folder.size() && path[0] == folder[0] &&
                              path[folder.size() - 1] == folder.back() && path.starts_with(folder));
}

/// Equal without regard to letter case. Both are in upper case from a to z; only letters beyond need the C
/// library. `type` and `pathType` end with a null character.
bool IsSameType(std::wstring_view type, std::wstring_view pathType)
{
    if (type.size() != pathType.size())
    {
        return false;
    }
    for (std::size_t i = 0; i < type.size(); ++i)
    {
        if (type[i] != pathType[i])
        {
            const bool ascii = (type[i] | pathType[i]) < 0x80;
            return !ascii && _wcsicmp(type.data() + i, pathType.data() + i) == 0;
        }
    }
    return true;
}

} // namespace

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

Exclusion ProviderFilters::Judge(const FilteredPath& path) const
{
    if (!m_folders.empty())
    {
        const bool inFolder = std::any_of(m_folders.begin(), m_folders.end(),
                                          [&](const std::wstring& folder) { return StartsWith(path.Text(), folder); });
        if (inFolder == m_exclude)
        {
            return Exclusion::ByFolder;
        }
    }
    if (m_fileTypes.empty() || !path.HasType())
    {
        return Exclusion::None;
    }
    const bool hasType = std::any_of(m_fileTypes.begin(), m_fileTypes.end(),
                                     [&](const std::wstring& type) { return IsSameType(type, path.Type()); });
    return hasType == m_exclude ? Exclusion::ByType : Exclusion::None;
}

bool ProviderFilters::Excludes(const wchar_t* path) const
{
    return path != nullptr && WithBarrier(false, [&] { return Judge(FilteredPath(path)) != Exclusion::None; });
}
