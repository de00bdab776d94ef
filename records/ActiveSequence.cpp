#include "ActiveSequence.h"

#include "ExceptionBarrier.h"

#include <algorithm>

namespace
{

constexpr auto NoSlot = SlotIndex::NoSlot;

/// As far as a reader that goes through holes may jump; a longer jump closes the holes first.
constexpr std::size_t MaxJump = 32;

/// How far removals in order are looked for before the index is asked.
constexpr std::size_t Near = 8;

/// An index is made when as many slots have been searched as this times the length, and never for a short sequence: it
/// costs about ten searched slots for each entry.
constexpr std::size_t SearchesWorthAnIndex = 2;
constexpr std::size_t ShortSequence = 64;

} // namespace

void ActiveSequence::Clear()
{
    m_slots.clear();
    m_index.Clear();
    m_holes = 0;
    m_distinct = true;
    m_firstSlot = m_nextSlot = 0;
    m_cursor = m_cursorIndex = 0;
    m_searched = 0;
    ++m_fill;
}

bool ActiveSequence::Remove(OrvixFileEntry* entry)
{
    if (entry == nullptr || Size() == 0)
    {
        return false;
    }
    const std::size_t slot = Find(entry);
    if (slot == NoSlot)
    {
        return false;
    }
    if (Size() == 1)
    {
        Clear();
        return true;
    }
    m_slots[slot] = nullptr;
    ++m_holes;
    m_nextSlot = slot + 1;
    while (m_slots[m_firstSlot] == nullptr)
    {
        ++m_firstSlot;
    }
    if (slot < m_cursor && m_cursorIndex > 0)
    {
        --m_cursorIndex;
    }
    return true;
}

/// Reads on from the entry that was read last.
OrvixFileEntry* ActiveSequence::AtWithHoles(std::size_t index)
{
    if (index < m_cursorIndex || m_cursor < m_firstSlot)
    {
        m_cursor = m_firstSlot;
        m_cursorIndex = 0;
    }
    if (index - m_cursorIndex > MaxJump)
    {
        CloseHoles();
        return m_slots[index];
    }
    for (;; ++m_cursor)
    {
        if (m_slots[m_cursor] != nullptr && m_cursorIndex++ == index)
        {
            --m_cursorIndex;
            return m_slots[m_cursor];
        }
    }
}

void ActiveSequence::CloseHoles()
{
    if (m_holes == 0)
    {
        return;
    }
    std::erase(m_slots, nullptr);
    m_index.Clear();
    m_holes = 0;
    m_firstSlot = m_nextSlot = 0;
    m_cursor = m_cursorIndex = 0;
}

/// Slot of the first occurrence, which the caller then empties; `NoSlot` when there is none.
std::size_t ActiveSequence::Find(const OrvixFileEntry* entry)
{
    if (m_index.IsEmpty() && Size() > ShortSequence && m_searched > SearchesWorthAnIndex * Size())
    {
        MakeIndex();
    }
    if (m_index.IsEmpty())
    {
        return m_distinct ? FindInOrder(entry) : FindBetween(m_firstSlot, m_slots.size(), entry);
    }
    if (!m_index.HasRepetition())
    {
        const std::size_t slot = FindBetween(m_nextSlot, std::min(m_nextSlot + Near, m_slots.size()), entry);
        if (slot != NoSlot)
        {
            return slot;
        }
    }
    return m_index.Take(m_slots, entry);
}

/// Of distinct entries any occurrence is the first: the search begins after the last removal.
std::size_t ActiveSequence::FindInOrder(const OrvixFileEntry* entry)
{
    const std::size_t slot = FindBetween(m_nextSlot, m_slots.size(), entry);
    return slot != NoSlot ? slot : FindBetween(m_firstSlot, m_nextSlot, entry);
}

std::size_t ActiveSequence::FindBetween(std::size_t from, std::size_t to, const OrvixFileEntry* entry)
{
    std::size_t slot = from;
    while (slot < to && m_slots[slot] != entry)
    {
        ++slot;
    }
    m_searched += slot - from;
    return slot < to ? slot : NoSlot;
}

/// Without memory there is none, and the search stays linear.
void ActiveSequence::MakeIndex()
{
    m_searched = 0;
    if (!Completes([this] { m_index.Make(m_slots, Size()); }))
    {
        m_index.Clear();
    }
}
