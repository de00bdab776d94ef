#pragma once

#include <windows.h>

#include <string>

/// The lock files that Git makes while it changes a repository. A program that was ended in the middle leaves them
/// behind, and Git then refuses to work.
class LockFiles
{
public:
    /// Begins a change of the repository with these two folders of Git, which may be the same. Without `withIndex` a
    /// lock file of the index belongs to another program, and stays.
    LockFiles(const std::wstring& gitFolder, const std::wstring& commonFolder, bool withIndex);

    /// Deletes the lock files that have been written since then. One that a program holds open stays.
    void DeleteNew() const noexcept;

private:
    void DeleteIn(const std::wstring& folder, bool withSubfolders) const;

    const std::wstring& m_gitFolder;
    const std::wstring& m_commonFolder;
    bool m_withIndex;
    FILETIME m_begin{};
};
