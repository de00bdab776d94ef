#include "FileCollector.h"

#include "FilePath.h"
#include "Text.h"

#include <windows.h>

#include <algorithm>
#include <cwchar>
#include <iostream>
#include <memory>

namespace
{

constexpr std::size_t FilesBetweenProgress = 256;

constexpr DWORD UnwantedFolder = FILE_ATTRIBUTE_HIDDEN | FILE_ATTRIBUTE_SYSTEM | FILE_ATTRIBUTE_REPARSE_POINT;

/// The archive of a project, the file that links to it, or what an interrupted provider left: no part of the project.
bool IsOfArchive(const std::wstring& name)
{
    return _wcsicmp(name.c_str(), L".archive") == 0 || _wcsicmp(name.c_str(), L".archive.tmp") == 0;
}

struct CloseSearch
{
    using pointer = HANDLE;
    void operator()(HANDLE search) const { FindClose(search); }
};

} // namespace

void FileCollector::Add(const std::wstring& named)
{
    std::wstring path = FullPath(named);
    if (IsFolder(path))
    {
        AddFolder(path);
    }
    else
    {
        AddFile(std::move(path), true);
    }
}

Listing::Count FileCollector::SkippedFolders() const
{
    return {"hiddenFolders", m_skippedFolders == 1 ? "hidden folder skipped" : "hidden folders skipped",
            m_skippedFolders};
}

bool FileCollector::ReportUnreadableFolders() const
{
    for (const std::wstring& folder : m_unreadableFolders)
    {
        std::cerr << "orvix: cannot read the folder " << Printable(folder) << '\n';
    }
    return !m_unreadableFolders.empty();
}

void FileCollector::AddFile(std::wstring path, bool named)
{
    if (m_seen.insert(PathKey(path)).second)
    {
        m_files.push_back({std::move(path), named});
        if (m_files.size() % FilesBetweenProgress == 0)
        {
            m_output.Progress(L"looking for files: " + std::to_wstring(m_files.size()));
        }
    }
}

void FileCollector::AddFolder(const std::wstring& folder)
{
    const std::wstring prefix = folder.back() == L'\\' ? folder : folder + L'\\';
    WIN32_FIND_DATAW found;
    const HANDLE search =
        FindFirstFileExW((prefix + L"*").c_str(), FindExInfoBasic, &found, FindExSearchNameMatch, nullptr, 0);
    if (search == INVALID_HANDLE_VALUE)
    {
        // The root of a drive lists no "." and may be empty.
        if (GetLastError() != ERROR_FILE_NOT_FOUND)
        {
            m_unreadableFolders.push_back(folder);
        }
        return;
    }

    std::vector<std::wstring> files;
    std::vector<std::wstring> folders;
    {
        const std::unique_ptr<HANDLE, CloseSearch> closing(search);
        do
        {
            const std::wstring name = found.cFileName;
            if (name == L"." || name == L".." || IsOfArchive(name))
            {
                continue;
            }
            if ((found.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY) == 0)
            {
                files.push_back(name);
            }
            else if (name.front() == L'.' || (found.dwFileAttributes & UnwantedFolder) != 0)
            {
                ++m_skippedFolders;
            }
            else
            {
                folders.push_back(name);
            }
        } while (FindNextFileW(search, &found) != 0);
        if (GetLastError() != ERROR_NO_MORE_FILES)
        {
            m_unreadableFolders.push_back(folder);
        }
    }

    std::sort(files.begin(), files.end());
    for (const std::wstring& name : files)
    {
        AddFile(prefix + name, false);
    }
    std::sort(folders.begin(), folders.end());
    for (const std::wstring& name : folders)
    {
        AddFolder(prefix + name);
    }
}
