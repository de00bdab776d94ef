#pragma once

#include <string>
#include <string_view>
#include <vector>

/// A path in upper case and the text after its last dot, made once for all filters.
struct FilteredPath
{
    explicit FilteredPath(const wchar_t* path);
    ~FilteredPath() = default;

    std::wstring text;
    bool hasType;           ///< whether there is any dot
    std::wstring_view type; ///< is in `text` and reaches to its end

    FilteredPath(const FilteredPath&) = delete;
    FilteredPath& operator=(const FilteredPath&) = delete;
};

/// Why a filter excludes a file.
enum class Exclusion
{
    None, ///< it does not
    ByFolder,
    ByType,
};

/// One file filter of a provider, as "OrvixProviders.xml" gives it. The consumers read the fields.
class ProviderFilters
{
public:
    virtual ~ProviderFilters() = default;

    /// Whether and why the filter excludes the file. An exclude filter excludes by folder or by type; an include
    /// filter excludes what is outside its folders, and inside them what has another type. A path without
    /// any dot has no type and is never excluded by it.
    Exclusion Judge(const FilteredPath& path) const;

    /// True when the filter excludes the file. Null gives false, and so does exhausted memory.
    bool Excludes(const wchar_t* path) const;

    std::wstring m_name;                   ///< as written
    bool m_exclude = true;                 ///< false: the lists name what is included
    std::vector<std::wstring> m_fileTypes; ///< extensions without the dot, in upper case
    std::vector<std::wstring> m_folders;   ///< path prefixes in upper case, compared character by character
};
