#include "ArchiveLock.h"

ArchiveLock::ArchiveLock(const std::wstring& lockFile, std::chrono::milliseconds wait)
{
    const auto end = std::chrono::steady_clock::now() + wait;
    while (!(m_file = ArchiveFiles::Open(lockFile, GENERIC_WRITE, 0, OPEN_ALWAYS)))
    {
        if (GetLastError() != ERROR_SHARING_VIOLATION)
        {
            ArchiveFiles::ThrowLastError(L"The archive cannot be locked");
        }
        if (std::chrono::steady_clock::now() >= end)
        {
            throw ArchiveFailure{ArchiveError::Busy, L"Another program is using the archive", {}};
        }
        Sleep(5);
    }
}
