#pragma once

#include <map>
#include <string>

/// The files of a folder that a provider knows, on the disk or not. What a provider names is not trusted: it is ignored
/// unless it is the full path of a file below the folder.
class KnownFiles
{
public:
    /// `folder`: full path.
    explicit KnownFiles(const std::wstring& folder)
        : m_folder(folder), m_prefix(folder.back() == L'\\' ? folder : folder + L'\\')
    {
    }

    /// The `OrvixKnownFileCallback`. `self` is this object.
    static void Take(void* self, const wchar_t* path);

    /// The paths by their `PathKey`. Throws `ToolError` when there are too many.
    const std::map<std::wstring, std::wstring>& Paths() const;

private:
    void Add(const wchar_t* path);

    std::wstring m_folder;
    std::wstring m_prefix;
    std::map<std::wstring, std::wstring> m_paths;
    bool m_isComplete = true; // false when there are too many, or memory ran out
};
