#include "ValidationScratch.h"

#include "ToolError.h"

#include <windows.h>

#include <filesystem>
#include <memory>

ValidationScratch::ValidationScratch()
{
    const std::wstring name = L"orvix-validate-" + std::to_wstring(GetCurrentProcessId()) + L'-';
    std::error_code error;
    const std::filesystem::path root = std::filesystem::temp_directory_path(error);
    for (int number = 1; !error; ++number) // the number of a process comes again, and what one left behind stays
    {
        const std::filesystem::path path = root / (name + std::to_wstring(number));
        if (std::filesystem::create_directory(path, error))
        {
            m_path = path.wstring();
            return;
        }
    }
    throw ToolError(ExitCode::Failed, L"no scratch project can be made in the folder of temporary files");
}

ValidationScratch::~ValidationScratch()
{
    RemoveTree(L"\\\\?\\" + m_path); // whatever the length of what was made in it
}

void ValidationScratch::RemoveTree(const std::wstring& folder)
{
    WIN32_FIND_DATAW found;
    std::unique_ptr<void, decltype(&FindClose)> search(FindFirstFileW((folder + L"\\*").c_str(), &found), FindClose);
    for (BOOL more = search.get() != INVALID_HANDLE_VALUE; more; more = FindNextFileW(search.get(), &found))
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
            RemoveDirectoryW(path.c_str()); // the link, not what it leads to
        }
        else
        {
            RemoveTree(path);
        }
    }
    search.reset(); // an open search keeps the folder
    SetFileAttributesW(folder.c_str(), FILE_ATTRIBUTE_NORMAL);
    RemoveDirectoryW(folder.c_str());
}
