#include "OrvixProviderConfig.h"

#include "ExceptionBarrier.h"

FileExclusion OrvixProviderConfig::FindExclusion(const wchar_t* path) const
{
    if (path == nullptr)
    {
        return {};
    }
    const FilteredPath filteredPath(path);
    const ProviderFilters* previous = nullptr;
    for (const ProviderFilters* filter : m_filters)
    {
        // The same filter again gives the same answer.
        if (filter == previous)
        {
            continue;
        }
        previous = filter;
        if (const Exclusion reason = filter->Judge(filteredPath); reason != Exclusion::None)
        {
            return {filter, reason};
        }
    }
    return {};
}

bool OrvixProviderConfig::IsFileExcluded(const wchar_t* path, std::wstring* filterName) const
{
    return WithBarrier(false, [&] {
        const FileExclusion exclusion = FindExclusion(path);
        if (exclusion.filter != nullptr && filterName != nullptr)
        {
            *filterName = exclusion.filter->m_name;
        }
        return exclusion.filter != nullptr;
    });
}
