#pragma once

#include <cstddef>
#include <vector>

class OrvixFileEntry;

/// The active list's storage: entry pointers in order, never null, with a gap at the place of the last
/// removal. Removals that walk through the list in order, as operations on files make them, therefore cost
/// as much as one walk; any other removal costs a linear search and a move.
///
/// Part of `OrvixFileList`; not exported. `Append`, `AppendDistinct` and `Reserve` may throw std::bad_alloc,
/// with nothing changed.
class ActiveSequence
{
public:
    std::size_t Size() const { return m_slots.size() - (m_gapEnd - m_gapBegin); }

    OrvixFileEntry* At(std::size_t index) const
    {
        return m_slots[index < m_gapBegin ? index : index + (m_gapEnd - m_gapBegin)];
    }

    /// Empties the sequence; the storage is kept.
    void Clear();
    void Reserve(std::size_t count) { m_slots.reserve(count); }

    /// Appends an entry that may already be there.
    void Append(OrvixFileEntry* entry)
    {
        if (m_slots.size() == m_slots.capacity())
        {
            CloseGap();
        }
        m_slots.push_back(entry);
        m_distinct = false;
        m_searched = 0;
    }

    /// Appends to an empty or distinct sequence an entry that is known not to be there.
    void AppendDistinct(OrvixFileEntry* entry) { m_slots.push_back(entry); }

    /// Removes the first occurrence of the entry; false when it is not there.
    bool Remove(OrvixFileEntry* entry);

private:
    std::size_t PositionOf(OrvixFileEntry* entry);
    bool HasNoRepetition() const;
    void CloseGap();

    std::vector<OrvixFileEntry*> m_slots;
    std::size_t m_gapBegin = 0;
    std::size_t m_gapEnd = 0;
    bool m_distinct = true;     ///< no entry is known to be in the sequence twice
    std::size_t m_searched = 0; ///< slots searched since that was last unknown
};
