#pragma once

#include "ProviderFilters.h"

#include <string>
#include <vector>

/// The filter that excludes a file, and why; null and `None` when there is none.
struct FileExclusion
{
    const ProviderFilters* filter = nullptr;
    Exclusion reason = Exclusion::None;
};

/// The administrator's settings for one provider. The consumers read the fields.
///
/// Made once per initialisation of a services object and never destroyed, since callers hold plain pointers to it. The
/// filters are not owned and live as long.
class OrvixProviderConfig
{
public:
    virtual ~OrvixProviderConfig() = default;

    /// The first of the filters that excludes the file. A null path is not excluded. Throws std::bad_alloc.
    FileExclusion FindExclusion(const wchar_t* path) const;

    /// True when one of the filters excludes the file; `filterName` may be null and receives the name of the
    /// first such filter. A null path gives false.
    bool IsFileExcluded(const wchar_t* path, std::wstring* filterName) const;

    std::wstring m_name;   ///< in upper case
    bool m_enabled = true; ///< false switches the provider off
    std::wstring m_fixedProjectRoot;
    std::wstring m_altProviderExecutable;
    std::wstring m_msSccProjectFile;
    std::wstring m_msSccDllSearchPath;
    std::wstring m_msSccDllFullPath;

    /// In the order of the file. A filter is here once for its name and once more for every element after the name.
    std::vector<ProviderFilters*> m_filters;
};
