#pragma once

#include "ArchiveFiles.h"

#include <chrono>
#include <string>

/// Keeps every other program from changing an archive, from construction to destruction. The system takes the
/// lock away from a program that ends, so it never stays behind.
class ArchiveLock
{
public:
    /// Throws `ArchiveError::Busy` when the lock is held by somebody else for longer than `wait`.
    ArchiveLock(const std::wstring& lockFile, std::chrono::milliseconds wait);

private:
    ArchiveFiles::UniqueHandle m_file;
};
