#include "ActiveSequence.h"

#include "ExceptionBarrier.h"

#include <algorithm>
#include <utility>

namespace
{

constexpr auto NoSlot = static_cast<std::size_t>(-1);

/// As far as a reader that goes through holes may jump; a longer jump closes the holes first.
constexpr std::size_t MaxJump = 32;

/// An index is made once as many slots have been searched as this times the length, which is about what it costs, and
/// never for a short sequence.
constexpr std::size_t SearchesWorthAnIndex = 4;
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

/// Slot of the first occurrence; `NoSlot` when there is none.
std::size_t ActiveSequence::Find(OrvixFileEntry* entry)
{
    if (m_distinct)
    {
        // Any occurrence is the first.
        const std::size_t slot = FindBetween(m_nextSlot, m_slots.size(), entry);
        return slot != NoSlot ? slot : FindBetween(m_firstSlot, m_nextSlot, entry);
    }
    if (m_index.IsEmpty() && Size() > ShortSequence && m_searched > SearchesWorthAnIndex * m_slots.size())
    {
        m_searched = 0;
        MakeIndex();
    }
    if (!m_index.IsEmpty())
    {
        std::size_t* const first = m_index.Find(entry);
        if (first == nullptr || *first == NoSlot)
        {
            return NoSlot;
        }
        return std::exchange(*first, m_nextOccurrence[*first]);
    }
    const std::size_t slot = FindBetween(m_firstSlot, m_slots.size(), entry);
    m_searched += (slot == NoSlot ? m_slots.size() : slot) - m_firstSlot;
    return slot;
}

std::size_t ActiveSequence::FindBetween(std::size_t from, std::size_t to, OrvixFileEntry* entry) const
{
    const auto begin = m_slots.begin() + static_cast<std::ptrdiff_t>(from);
    const auto end = m_slots.begin() + static_cast<std::ptrdiff_t>(to);
    const auto found = from < to ? std::find(begin, end, entry) : end;
    return found == end || from >= to ? NoSlot : static_cast<std::size_t>(found - m_slots.begin());
}

/// Without memory there is none, and the search stays linear.
void ActiveSequence::MakeIndex()
{
    const bool made = Completes([this] {
        m_nextOccurrence.assign(m_slots.size(), NoSlot);
        m_index.Reserve(Size());
        for (std::size_t slot = m_slots.size(); slot-- > m_firstSlot;)
        {
            if (m_slots[slot] != nullptr)
            {
                const auto [first, isNew] = m_index.Add(m_slots[slot], slot);
                if (!isNew)
                {
                    m_nextOccurrence[slot] = std::exchange(first, slot);
                }
            }
        }
    });
    if (!made)
    {
        m_index.Clear();
    }
}
