#pragma once

#include <algorithm>
#include <array>
#include <string>
#include <string_view>
#include <vector>

/// A path in upper case and the text after its last dot, made once for all filters.
class FilteredPath
{
public:
    /// Throws std::bad_alloc; not for a path of usual length, whose copy is within the object.
    explicit FilteredPath(const wchar_t* path);
    FilteredPath(const FilteredPath&) = delete;
    FilteredPath& operator=(const FilteredPath&) = delete;
    ~FilteredPath() = default;

    /// Whether there is any dot.
    bool HasType() const { return m_type.data() != nullptr; }

    /// Whether the path begins with a folder's path in upper case. Most folders are told from the path by one
    /// character: the first one on another drive, the last one in another folder of the same drive.
    bool IsBelow(const std::wstring& folder) const
    {
        return folder.empty() || (m_text.size() >= folder.size() && m_text[0] == folder[0] &&
                                  m_text[folder.size() - 1] == folder.back() && m_text.starts_with(folder));
    }

    /// Whether the text after the last dot equals this one, which is in upper case from a to z, without regard to
    /// letter case.
    bool IsOfType(const std::wstring& type) const { return type.size() == m_type.size() && EqualsType(type); }

private:
    bool EqualsType(const std::wstring& type) const;

    std::array<wchar_t, 260> m_short; // not filled: most of it is not used
    std::wstring m_long;              // a text for which the array is too short
    std::wstring_view m_text;
    std::wstring_view m_type;
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
    Exclusion Judge(const FilteredPath& path) const
    {
        const auto isBelow = [&](const std::wstring& folder) { return path.IsBelow(folder); };
        if (!m_folders.empty() && std::any_of(m_folders.begin(), m_folders.end(), isBelow) == m_exclude)
        {
            return Exclusion::ByFolder;
        }
        if (m_fileTypes.empty() || !path.HasType())
        {
            return Exclusion::None;
        }
        const auto isOfType = [&](const std::wstring& type) { return path.IsOfType(type); };
        return std::any_of(m_fileTypes.begin(), m_fileTypes.end(), isOfType) == m_exclude ? Exclusion::ByType
                                                                                          : Exclusion::None;
    }

    /// True when the filter excludes the file. Null gives false, and so does exhausted memory.
    bool Excludes(const wchar_t* path) const;

    std::wstring m_name;                   ///< as written
    bool m_exclude = true;                 ///< false: the lists name what is included
    std::vector<std::wstring> m_fileTypes; ///< extensions without the dot, in upper case
    std::vector<std::wstring> m_folders;   ///< path prefixes in upper case, compared character by character
};
