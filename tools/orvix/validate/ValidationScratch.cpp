#include "ValidationScratch.h"

#include "FilePath.h"
#include "ToolError.h"
#include "UniqueHandle.h"

#include <windows.h>

ValidationScratch::ValidationScratch()
{
    std::wstring root(MAX_PATH + 1, L'\0');
    root.resize(GetTempPathW(static_cast<DWORD>(root.size()), root.data()));
    const std::wstring name = root + L"orvix-validate-" + std::to_wstring(GetCurrentProcessId()) + L'-';
    // A folder of an earlier process with the same number may still exist.
    for (int number = 1; m_path.empty(); ++number)
    {
        const std::wstring path = name + std::to_wstring(number);
        const bool isNew = CreateDirectoryW(path.c_str(), nullptr) != 0;
        if (const DWORD error = GetLastError(); !isNew && error != ERROR_ALREADY_EXISTS)
        {
            throw ToolError(ExitCode::Failed, L"no scratch project can be made in the folder of temporary files: " +
                                                  SystemMessage(error, path));
        }
        m_path = isNew ? path : L"";
    }
}

ValidationScratch::~ValidationScratch()
{
    RemoveTree(LongPath(m_path)); // a library may have made long paths in it
}

void ValidationScratch::RemoveTree(const std::wstring& folder)
{
    WIN32_FIND_DATAW found;
    UniqueFind search(FindFirstFileW((folder + L"\\*").c_str(), &found));
    for (bool more = static_cast<bool>(search); more; more = FindNextFileW(search.Get(), &found) != FALSE)
    {
        const std::wstring name = found.cFileName;
        const std::wstring path = folder + L'\\' + name;
        const bool isFolder = (found.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY) != 0;
        const bool isLink = (found.dwFileAttributes & FILE_ATTRIBUTE_REPARSE_POINT) != 0;
        if (name == L"." || name == L"..")
        {
            continue;
        }
        if (!isFolder)
        {
            SetFileAttributesW(path.c_str(), FILE_ATTRIBUTE_NORMAL);
            DeleteFileW(path.c_str());
        }
        else if (isLink)
        {
            RemoveDirectoryW(path.c_str()); // the link, not its target
        }
        else
        {
            RemoveTree(path);
        }
    }
    search.Reset(); // a folder with an open search cannot be deleted
    SetFileAttributesW(folder.c_str(), FILE_ATTRIBUTE_NORMAL);
    RemoveDirectoryW(folder.c_str());
}
