#pragma once

#include "GitStatus.h"

#include <memory>
#include <string>
#include <string_view>
#include <unordered_map>
#include <unordered_set>
#include <utility>

/// What Git knows about the files of a repository at one moment.
class GitSnapshot
{
public:
    struct Item
    {
        bool isTracked = false;
        const GitStatus::File* changed = nullptr; ///< null: no difference from the last commit
    };
    using Entry = std::pair<const std::string_view, Item>;

    /// `status` is the output of "git status", and `tracked` that of "git ls-files -z", not null.
    GitSnapshot(std::string_view status, std::shared_ptr<const std::string> tracked);
    GitSnapshot(const GitSnapshot&) = delete;
    GitSnapshot& operator=(const GitSnapshot&) = delete;
    ~GitSnapshot() = default;

    const GitStatus& Status() const { return m_status; }

    /// The entry of a file, with the path in Git's spelling; null when Git knows nothing of it, as of an ignored file.
    /// A path that differs only in letter case means the same file.
    const Entry* Find(const std::string& path) const;

    /// Names the files that the upstream has changed: the output of "git diff --name-only -z".
    void SetOutOfDate(std::string printed);
    bool IsOutOfDate(std::string_view path) const { return m_outOfDate.contains(path); }

private:
    GitStatus m_status;
    std::shared_ptr<const std::string> m_tracked;
    std::string m_upstreamChanges;
    std::unordered_map<std::string_view, Item> m_items; ///< the keys are in the members above
    std::unordered_set<std::string_view> m_outOfDate;
    mutable std::unordered_map<std::wstring, const Entry*> m_folded; ///< made when it is needed
};
