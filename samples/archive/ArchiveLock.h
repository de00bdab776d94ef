#pragma once

#include "ArchiveFiles.h"

#include <chrono>
#include <string>

/// While it exists, no other program changes the archive. The system releases the lock of a program that ends, in
/// whatever way it ends.
class ArchiveLock
{
public:
    /// Waits until no other program has the lock. Throws `ArchiveError::Busy` after `wait`.
    ArchiveLock(const std::wstring& lockFile, std::chrono::milliseconds wait);

private:
    ArchiveFiles::UniqueHandle m_file;
};
