#pragma once

#include "GitLocks.h"
#include "GitRunner.h"
#include "GitSnapshot.h"

#include <memory>
#include <optional>
#include <string>
#include <unordered_set>
#include <vector>

/// What the provider says about a file.
struct GitFileState
{
    bool isControlled = false;
    bool canAdd = false;     ///< not controlled and not excluded by Git's ignore rules
    bool isModified = false; ///< against the last commit; an added file against the index
    bool isDeleted = false;
    bool isConflicted = false;
    bool isCheckedOut = false; ///< changed, locked by the user, or checked out in this session
    bool isLockedByOther = false;
    bool isOutOfDate = false;
};

/// A working folder of Git, and what the provider does with its files. Paths come as the host gives them: full, of
/// files below the top folder. Every operation throws `GitFailure` with the reason when it fails.
class GitRepository
{
public:
    using Paths = std::vector<std::wstring>;
    using Lines = std::vector<std::wstring>;

    explicit GitRepository(GitRunner& runner) : m_runner(runner) {}

    /// Finds the repository of a folder.
    void Open(const std::wstring& folder);
    void Close();
    bool IsOpen() const { return !m_top.empty(); }

    std::vector<GitFileState> Status(const Paths& paths);

    /// The controlled files in a folder and below, on the disk or not, with the folder's path as it is given. Without
    /// submodules, and without the files that a sparse checkout leaves out of the working folder.
    Paths Files(const std::wstring& folder) const;

    void Add(const Paths& paths);

    /// Commits the files, whatever else is staged. Returns what the user is to know although it has succeeded, such as
    /// a rejected push or a hook that was ended after the commit.
    Lines CheckIn(const Paths& paths, const std::wstring& comment, bool keepCheckedOut);

    /// Checks every file out that can be. Throws at the end when one could not.
    void CheckOut(const Paths& paths);
    void UndoCheckOut(const Paths& paths);
    void GetLatest(const Paths& paths);
    Lines History(const Paths& paths);
    Lines Properties(const std::wstring& path);

    /// Starts the user's client program.
    void RunClient() const;

private:
    void ReadConfiguration(const std::string& printed);
    std::optional<std::string> Relative(const std::wstring& path) const;
    std::string Spelled(const std::wstring& path) const;
    std::vector<std::string> Spelled(const Paths& paths) const;
    std::vector<std::string> SpelledNow(const Paths& paths);
    std::wstring Full(const std::string& path) const;
    void TakeSnapshot();
    GitFileState StateOf(const GitSnapshot::Entry& entry) const;
    ProcessResult Change(const GitCommand& command) const;
    void ChangeOrThrow(const GitCommand& command) const;
    bool AddMany(const std::vector<std::string>& files) const;
    Lines Commit(const std::vector<std::string>& files, const std::wstring& comment) const;
    std::string Head() const;
    Lines Push() const;
    std::unordered_set<std::string> Lockable(const std::vector<std::string>& paths) const;
    void PrepareCheckOut(const std::string& file, unsigned long attributes, bool isLockable);
    Lines GiveLocksBack(const std::vector<std::string>& paths);
    bool HasUpstreamCommit() const;

    /// What tells one file of the index from the next: Git writes a new file for each change.
    struct IndexStamp
    {
        bool operator==(const IndexStamp&) const = default;

        unsigned long long id = 0;
        unsigned long long size = 0;
        unsigned long long written = 0;
    };

    std::optional<IndexStamp> StampOfIndex() const;

    GitRunner& m_runner;
    std::wstring m_top;          ///< without a separator at its end
    std::wstring m_gitFolder;    ///< of this working folder
    std::wstring m_commonFolder; ///< of all working folders of the repository
    bool m_pushes = false;
    std::wstring m_client;
    GitLocks m_locks;
    std::unordered_set<std::string> m_checkedOut; ///< in this session
    std::optional<IndexStamp> m_indexStamp;       ///< of the index that `m_tracked` is from
    std::shared_ptr<const std::string> m_tracked; ///< the paths of the index, as Git prints them
    std::unique_ptr<GitSnapshot> m_snapshot;      ///< the last one; has Git's spelling of paths
};
