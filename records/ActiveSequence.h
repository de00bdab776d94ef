#pragma once

#include "SlotIndex.h"

#include <cstddef>
#include <vector>

class OrvixFileEntry;

/// The active list's storage: entry pointers in order, never null. It compares pointers and never looks into an entry,
/// which the host may have deleted.
///
/// A removal leaves a hole, so that many removals in a row cost as much as one walk, whatever their order and however
/// often an entry repeats. Reading in order passes the holes; any other access closes them first, which costs a move of
/// the rest.
class ActiveSequence
{
public:
    std::size_t Size() const { return m_slots.size() - m_holes; }

    /// The entry at an index below `Size()`.
    OrvixFileEntry* At(std::size_t index) { return m_holes == 0 ? m_slots[index] : AtWithHoles(index); }

    /// Empties the sequence; the storage is kept.
    void Clear();

    /// Throws std::bad_alloc with nothing changed.
    void Reserve(std::size_t count) { m_slots.reserve(count); }

    /// Appends an entry that may already be there. Throws std::bad_alloc with nothing changed.
    void Append(OrvixFileEntry* entry)
    {
        AppendDistinct(entry);
        m_distinct = false;
    }

    /// Which filling of the sequence this is: `Clear` begins the next one.
    unsigned int Fill() const { return m_fill; }

    /// Appends an entry that is known not to be there. Throws std::bad_alloc with nothing changed.
    void AppendDistinct(OrvixFileEntry* entry)
    {
        if (m_slots.size() == m_slots.capacity())
        {
            CloseHoles();
        }
        m_slots.push_back(entry);
        if (!m_index.IsEmpty())
        {
            m_index.Clear();
        }
    }

    /// Removes the first occurrence of the entry; false when it is not there.
    bool Remove(OrvixFileEntry* entry);

private:
    OrvixFileEntry* AtWithHoles(std::size_t index);
    void CloseHoles();
    std::size_t Find(const OrvixFileEntry* entry);
    std::size_t FindBetween(std::size_t from, std::size_t to, const OrvixFileEntry* entry);
    std::size_t FindInOrder(const OrvixFileEntry* entry);
    void MakeIndex();

    std::vector<OrvixFileEntry*> m_slots; ///< null: a hole
    std::size_t m_holes = 0;
    unsigned int m_fill = 0;
    bool m_distinct = true;        ///< known that no entry repeats
    std::size_t m_firstSlot = 0;   ///< no entry is before it
    std::size_t m_nextSlot = 0;    ///< after the last removal, where the next one is likely
    std::size_t m_cursor = 0;      ///< slot of the entry that was read last, ...
    std::size_t m_cursorIndex = 0; ///< ... and its index; 0 and 0 when none was
    std::size_t m_searched = 0;    ///< slots searched since there was an index
    SlotIndex m_index;             ///< empty: not made
};
