#include "LockFiles.h"

#include <filesystem>
#include <system_error>

namespace
{

constexpr int Attempts = 20; // a program that was ended needs a moment to close its files
constexpr DWORD Pause = 50;  // milliseconds

} // namespace

LockFiles::LockFiles(const std::wstring& gitFolder, const std::wstring& commonFolder, bool withIndex)
    : m_gitFolder(gitFolder), m_commonFolder(commonFolder), m_withIndex(withIndex)
{
    GetSystemTimeAsFileTime(&m_begin);
}

void LockFiles::DeleteNew() const noexcept
{
    try
    {
        DeleteIn(m_gitFolder, false);
        DeleteIn(m_commonFolder, false);
        DeleteIn(m_commonFolder + L"\\refs", true);
        DeleteIn(m_commonFolder + L"\\objects", false);
        DeleteIn(m_commonFolder + L"\\objects\\info", false);
    }
    catch (...)
    {
        return; // Git's own message about the lock file says what to do
    }
}

void LockFiles::DeleteIn(const std::wstring& folder, bool withSubfolders) const
{
    std::error_code error;
    for (std::filesystem::recursive_directory_iterator entry(folder, error), end; !error && entry != end;
         entry.increment(error))
    {
        if (!withSubfolders)
        {
            entry.disable_recursion_pending();
        }
        WIN32_FILE_ATTRIBUTE_DATA data{};
        // A new file may get the creation time of an older one with its name.
        if (entry->path().extension() != L".lock" || (!m_withIndex && entry->path().filename() == L"index.lock") ||
            GetFileAttributesExW(entry->path().c_str(), GetFileExInfoStandard, &data) == FALSE ||
            CompareFileTime(&data.ftLastWriteTime, &m_begin) < 0)
        {
            continue;
        }
        for (int i = 0; i < Attempts && !DeleteFileW(entry->path().c_str()); ++i)
        {
            Sleep(Pause);
        }
    }
}
