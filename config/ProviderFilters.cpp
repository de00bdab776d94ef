#include "ProviderFilters.h"

#include "ExceptionBarrier.h"
#include "UpperCase.h"

#include <algorithm>
#include <cwchar>

namespace
{

/// Folders share their beginnings: the last character tells most of them apart without a comparison.
bool StartsWith(std::wstring_view path, std::wstring_view folder)
{
    return folder.empty() ||
           (path.size() >= folder.size() && path[folder.size() - 1] == folder.back() && path.starts_with(folder));
}

bool IsAscii(std::wstring_view text)
{
    return std::all_of(text.begin(), text.end(), [](wchar_t c) { return c < 0x80; });
}

/// Equal without regard to letter case. Both are in upper case from a to z; only letters beyond need the C
/// library. `type` and `pathType` end with a null character.
bool IsSameType(std::wstring_view type, std::wstring_view pathType)
{
    if (type.size() != pathType.size())
    {
        return false;
    }
    return type == pathType || (!(IsAscii(type) && IsAscii(pathType)) && _wcsicmp(type.data(), pathType.data()) == 0);
}

} // namespace

FilteredPath::FilteredPath(const wchar_t* path) : text(UpperCase(path))
{
    const std::size_t dot = text.rfind(L'.');
    hasType = dot != std::wstring::npos;
    if (hasType)
    {
        type = std::wstring_view(text).substr(dot + 1);
    }
}

Exclusion ProviderFilters::Judge(const FilteredPath& path) const
{
    if (!m_folders.empty())
    {
        const bool inFolder = std::any_of(m_folders.begin(), m_folders.end(),
                                          [&](const std::wstring& folder) { return StartsWith(path.text, folder); });
        if (inFolder == m_exclude)
        {
            return Exclusion::ByFolder;
        }
    }
    if (m_fileTypes.empty() || !path.hasType)
    {
        return Exclusion::None;
    }
    const bool hasType = std::any_of(m_fileTypes.begin(), m_fileTypes.end(),
                                     [&](const std::wstring& type) { return IsSameType(type, path.type); });
    return hasType == m_exclude ? Exclusion::ByType : Exclusion::None;
}

bool ProviderFilters::Excludes(const wchar_t* path) const
{
    return path != nullptr && WithBarrier(false, [&] { return Judge(FilteredPath(path)) != Exclusion::None; });
}
