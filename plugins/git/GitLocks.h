#pragma once

#include "GitRunner.h"

#include <chrono>
#include <memory>
#include <string>
#include <string_view>
#include <unordered_map>

/// The locks of a repository on Git LFS's server, as they were last seen. Whether a lock is the user's is Git LFS's own
/// verdict: names are not compared.
class GitLocks
{
public:
    struct Lock
    {
        bool isOurs = false;
        std::wstring owner;
    };

    /// Forgets what was seen. Without files that can be locked, nothing here ever asks the server.
    void Reset(bool hasLockableFiles);

    bool AreInUse() const { return m_inUse; }

    /// Asks the server and waits. The locks last seen stay when it does not answer.
    void Refresh(const GitRunner& runner);

    /// Takes over an answer that has come, and asks the server anew when the last question is a minute old. Never
    /// waits.
    void RefreshInBackground(const GitRunner& runner);

    /// The lock of a file; null when nobody has one.
    const Lock* Find(std::string_view path) const;

    /// Takes or gives back the lock of a file. Throws `GitFailure` with Git LFS's words.
    void Take(const GitRunner& runner, const std::string& path);
    void GiveBack(const GitRunner& runner, const std::string& path);

private:
    void Read(const ProcessResult& result);

    bool m_inUse = false;
    std::unordered_map<std::string, Lock> m_locks; ///< by path
    std::unique_ptr<Process> m_question;           ///< the question that is under way
    std::chrono::steady_clock::time_point m_asked{};
};
