#pragma once

#include "OrvixFileEntry.h"

#include <cstddef>
#include <vector>

/// A walk through trees of entries, depth first.
///
/// Entries are reached through their virtual operations, in which a host's class may change the trees and the list. A
/// list therefore tells its walks of each entry that it deletes (`Forget`). A path that meets itself is not followed
/// further, so that a circle of child links does not hold the walk. The path is kept on the heap: a tree may be deeper
/// than the stack.
class TreeWalk
{
public:
    /// Becomes the innermost walk of a list. `number` is even and differs from that of the list's earlier walks.
    TreeWalk(TreeWalk*& innermost, unsigned long long number);
    TreeWalk(const TreeWalk&) = delete;
    TreeWalk& operator=(const TreeWalk&) = delete;
    ~TreeWalk();

    /// Calls `select` with `root` and with each entry below it, children before their parents, and `take` with those
    /// for which it gives true. Throws std::bad_alloc, and what an entry throws.
    template <typename Select, typename Take>
    void PostOrder(OrvixFileEntry* root, const Select& select, const Take& take);

    /// Removes the first occurrence of `target` from the children of `root` and of each entry below it; the siblings
    /// after an occurrence are not visited. Throws std::bad_alloc, and what an entry throws.
    void Detach(OrvixFileEntry* root, const OrvixFileEntry* target);

    /// Whether an entry was reached a second time.
    bool HasRepetition() const { return m_repetition; }

    /// Called before an entry is deleted: the walk goes on at its parent. Null: before all entries are.
    void Forget(const OrvixFileEntry* entry);

    /// The list's walk in which this one began; null when it began in none.
    TreeWalk* Outer() const { return m_outer; }

private:
    struct Step
    {
        OrvixFileEntry* entry;
        unsigned int nextChild;
    };

    struct ReplacedMark
    {
        OrvixFileEntry* entry;
        unsigned long long mark;
    };

    // The mark of an entry is the number of the last walk that reached it, plus this bit while it is on the path.
    static constexpr unsigned long long OnPath = 1;

    enum class Found
    {
        Nothing, ///< a null child, or the path has become shorter: its last entry is an ancestor of `entry` then
        Child,
        End
    };

    /// Looks at the next child of the path's last entry. The path is not empty.
    Found Advance(OrvixFileEntry*& entry, OrvixFileEntry*& child);

    void Push(OrvixFileEntry* entry)
    {
        const unsigned long long mark = entry->m_walkMark;
        if (mark == (m_number | OnPath))
        {
            return;
        }
        if ((mark & OnPath) != 0)
        {
            m_replacedMarks.push_back({entry, mark});
            m_repetition = true; // this walk's own mark of the entry is lost when it leaves it
        }
        m_path.push_back({entry, 0});
        m_repetition |= mark == m_number;
        entry->m_walkMark = m_number | OnPath;
    }

    void Pop()
    {
        Leave(m_path.back().entry);
        m_path.pop_back();
    }

    /// Marks an entry that leaves the path: as reached, or again as on the path of the walk in which this one began.
    void Leave(OrvixFileEntry* entry)
    {
        entry->m_walkMark = m_number;
        if (!m_replacedMarks.empty() && m_replacedMarks.back().entry == entry)
        {
            entry->m_walkMark = m_replacedMarks.back().mark;
            m_replacedMarks.pop_back();
        }
    }

    TreeWalk*& m_innermost;
    TreeWalk* m_outer;
    unsigned long long m_number;
    std::vector<Step> m_path;
    std::vector<ReplacedMark> m_replacedMarks; ///< of entries that are on another walk's path too, in order
    bool m_repetition = false;
};

inline TreeWalk::Found TreeWalk::Advance(OrvixFileEntry*& entry, OrvixFileEntry*& child)
{
    const std::size_t depth = m_path.size();
    entry = m_path.back().entry;
    const unsigned int position = m_path.back().nextChild;
    const bool hasNext = position < entry->NumChildren();
    if (m_path.size() < depth)
    {
        return Found::Nothing;
    }
    if (!hasNext)
    {
        return Found::End;
    }
    m_path.back().nextChild = position + 1;
    child = entry->GetChild(position);
    return child != nullptr && m_path.size() == depth ? Found::Child : Found::Nothing;
}

template <typename Select, typename Take>
void TreeWalk::PostOrder(OrvixFileEntry* root, const Select& select, const Take& take)
{
    Push(root);
    while (!m_path.empty())
    {
        OrvixFileEntry* entry = nullptr;
        OrvixFileEntry* child = nullptr;
        const Found found = Advance(entry, child);
        if (found == Found::Child)
        {
            Push(child);
        }
        else if (found == Found::End)
        {
            const std::size_t depth = m_path.size();
            const bool selected = select(entry);
            if (m_path.size() < depth)
            {
                continue;
            }
            if (selected)
            {
                take(entry);
            }
            Pop();
        }
    }
}
