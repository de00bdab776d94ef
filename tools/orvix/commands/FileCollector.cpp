#include "FileCollector.h"

#include "FilePath.h"
#include "ParentLink.h"
#include "Text.h"
#include "UniqueHandle.h"

#include <windows.h>

#include <algorithm>
#include <iostream>

namespace
{

constexpr std::size_t FilesBetweenProgress = 256;

constexpr DWORD SkippedAttributes = FILE_ATTRIBUTE_HIDDEN | FILE_ATTRIBUTE_SYSTEM | FILE_ATTRIBUTE_REPARSE_POINT;

} // namespace

void FileCollector::Add(const std::wstring& named)
{
    std::wstring path = PathAsOnDisk(named);
    if (IsFolder(path))
    {
        AddFolder(path);
        m_namedFolders.push_back(std::move(path));
    }
    else
    {
        AddFile(std::move(path), true);
    }
}

void FileCollector::AddMissing(const std::wstring& folder, const std::wstring& path)
{
    const std::wstring below = PathBelow(folder, path);
    const std::wstring folders = L'\\' + below.substr(0, below.find_last_of(L'\\') + 1);
    const bool isInDotFolder = folders.find(L"\\.") != std::wstring::npos;
    const bool isSkipped =
        std::any_of(m_skippedFolders.begin(), m_skippedFolders.end(),
                    [&path](const std::wstring& skipped) { return PathBelow(skipped, path).size() < path.size(); });
    if (!isInDotFolder && !isSkipped)
    {
        AddFile(PathAsOnDisk(path), false);
    }
}

Listing::Count FileCollector::CountOfSkipped(std::size_t number)
{
    return {"hiddenFolders", number == 1 ? "hidden folder skipped" : "hidden folders skipped",
            static_cast<unsigned int>(number)};
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
    if (m_keys.insert(PathKey(path)).second)
    {
        m_files.push_back({std::move(path), named});
        ParentLink::SendAliveAt(m_files.size());
        if (m_files.size() % FilesBetweenProgress == 0)
        {
            m_output.Progress(L"looking for files: " + std::to_wstring(m_files.size()));
        }
    }
}

void FileCollector::AddFolder(const std::wstring& folder)
{
    const std::wstring prefix = folder.back() == L'\\' ? folder : folder + L'\\';
    Content content = Read(folder, prefix);
    std::sort(content.files.begin(), content.files.end());
    for (const std::wstring& name : content.files)
    {
        AddFile(prefix + name, false);
    }
    std::sort(content.folders.begin(), content.folders.end());
    for (const std::wstring& name : content.folders)
    {
        AddFolder(prefix + name);
    }
}

FileCollector::Content FileCollector::Read(const std::wstring& folder, const std::wstring& prefix)
{
    Content content;
    WIN32_FIND_DATAW found;
    const UniqueFind search(
        FindFirstFileExW((prefix + L"*").c_str(), FindExInfoBasic, &found, FindExSearchNameMatch, nullptr, 0));
    if (!search)
    {
        // The root of a drive has no "." and may be empty.
        if (GetLastError() != ERROR_FILE_NOT_FOUND)
        {
            m_unreadableFolders.push_back(folder);
        }
        return content;
    }
    do
    {
        const std::wstring name = found.cFileName;
        if (name == L"." || name == L"..")
        {
            continue;
        }
        if ((found.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY) == 0)
        {
            content.files.push_back(name);
        }
        else if (name.front() == L'.' || (found.dwFileAttributes & SkippedAttributes) != 0)
        {
            m_skippedFolders.push_back(prefix + name);
        }
        else
        {
            content.folders.push_back(name);
        }
    } while (FindNextFileW(search.Get(), &found) != 0);
    if (GetLastError() != ERROR_NO_MORE_FILES)
    {
        m_unreadableFolders.push_back(folder);
    }
    return content;
}
