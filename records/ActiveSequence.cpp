#include "ActiveSequence.h"

#include "ExceptionBarrier.h"

#include <algorithm>

void ActiveSequence::Clear()
{
    m_slots.clear();
    m_gapBegin = m_gapEnd = 0;
    m_distinct = true;
}

bool ActiveSequence::Remove(OrvixFileEntry* entry)
{
    const std::size_t position = PositionOf(entry);
    if (position == m_slots.size())
    {
        return false;
    }

    // Move the gap to the entry and let it swallow the entry's slot.
    const auto at = [this](std::size_t slot) { return m_slots.begin() + static_cast<std::ptrdiff_t>(slot); };
    if (m_gapBegin == m_gapEnd)
    {
        m_gapBegin = position;
        m_gapEnd = position + 1;
    }
    else if (position >= m_gapEnd)
    {
        std::move(at(m_gapEnd), at(position), at(m_gapBegin));
        m_gapBegin += position - m_gapEnd;
        m_gapEnd = position + 1;
    }
    else
    {
        std::move_backward(at(position + 1), at(m_gapBegin), at(m_gapEnd));
        m_gapEnd -= m_gapBegin - (position + 1);
        m_gapBegin = position;
    }
    return true;
}

/// Slot of the first occurrence; the number of slots when there is none.
std::size_t ActiveSequence::PositionOf(OrvixFileEntry* entry)
{
    const auto find = [&](std::size_t from, std::size_t to) {
        const auto begin = m_slots.begin();
        const auto end = begin + static_cast<std::ptrdiff_t>(to);
        const auto found = std::find(begin + static_cast<std::ptrdiff_t>(from), end, entry);
        return found == end ? m_slots.size() : static_cast<std::size_t>(found - begin);
    };

    // Sorting pays once as much has been searched from the front as it costs.
    constexpr std::size_t SearchesWorthASort = 16;
    if (!m_distinct && m_searched > SearchesWorthASort * Size())
    {
        m_distinct = HasNoRepetition();
        m_searched = 0;
    }

    // Without repetition any occurrence is the first, and the search may start after the gap.
    if (m_distinct)
    {
        const std::size_t position = find(m_gapEnd, m_slots.size());
        return position < m_slots.size() ? position : find(0, m_gapBegin);
    }
    std::size_t position = find(0, m_gapBegin);
    if (position == m_slots.size())
    {
        position = find(m_gapEnd, m_slots.size());
    }
    m_searched += position;
    return position;
}

bool ActiveSequence::HasNoRepetition() const
{
    return WithBarrier(false, [this] {
        std::vector<OrvixFileEntry*> sorted;
        sorted.reserve(Size());
        for (std::size_t i = 0; i < Size(); ++i)
        {
            sorted.push_back(At(i));
        }
        std::sort(sorted.begin(), sorted.end());
        return std::adjacent_find(sorted.begin(), sorted.end()) == sorted.end();
    });
}

void ActiveSequence::CloseGap()
{
    const auto begin = m_slots.begin();
    m_slots.erase(begin + static_cast<std::ptrdiff_t>(m_gapBegin), begin + static_cast<std::ptrdiff_t>(m_gapEnd));
    m_gapEnd = m_gapBegin;
}
