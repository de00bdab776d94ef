#include "ProviderFilters.h"

#include "ExceptionBarrier.h"
#include "UpperCase.h"

#include <algorithm>
#include <cwchar>

bool ProviderFilters::Excludes(const wchar_t* path) const
{
    return path && WithBarrier(false, [&] { return ExcludesUpperCase(UpperCase(path)); });
}

bool ProviderFilters::ExcludesUpperCase(const std::wstring& path) const
{
    if (!m_folders.empty())
    {
        const bool inFolder = std::any_of(m_folders.begin(), m_folders.end(),
                                          [&](const std::wstring& folder) { return path.starts_with(folder); });
        if (inFolder == m_exclude)
            return true;
    }
    const std::size_t dot = path.rfind(L'.');
    if (m_fileTypes.empty() || dot == std::wstring::npos)
        return false;
    const wchar_t* type = path.c_str() + dot + 1;
    const std::size_t length = path.size() - dot - 1;
    const bool hasType = std::any_of(m_fileTypes.begin(), m_fileTypes.end(), [&](const std::wstring& entry) {
        return entry.size() == length && _wcsicmp(entry.c_str(), type) == 0;
    });
    return hasType == m_exclude;
}
