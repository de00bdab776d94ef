#include "OrvixProviderConfig.h"

#include "ExceptionBarrier.h"
#include "ProviderFilters.h"

bool OrvixProviderConfig::IsFileExcluded(const wchar_t* path, std::wstring* filterName) const
{
    if (!path)
        return false;
    return WithBarrier(false, [&] {
        const FilteredPath filteredPath(path);
        const ProviderFilters* previous = nullptr;
        for (const ProviderFilters* filter : m_filters)
        {
            // The same filter again gives the same answer.
            if (filter == previous)
                continue;
            previous = filter;
            if (filter->Excludes(filteredPath))
            {
                if (filterName)
                    *filterName = filter->m_name;
                return true;
            }
        }
        return false;
    });
}
