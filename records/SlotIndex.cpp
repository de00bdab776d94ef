#include "SlotIndex.h"

#include <algorithm>
#include <bit>

void SlotIndex::Clear()
{
    m_firstSlots.clear();
    m_nextSlots.clear();
}

void SlotIndex::Make(const std::vector<OrvixFileEntry*>& slots, std::size_t count)
{
    m_nextSlots.clear();
    m_firstSlots.assign(std::bit_ceil(2 * std::max<std::size_t>(count, 8)), Free);
    for (std::size_t slot = slots.size(); slot-- > 0;)
    {
        if (slots[slot] == nullptr)
        {
            continue;
        }
        Slot& first = m_firstSlots[PlaceOf(slots, slots[slot])];
        if (first != Free)
        {
            if (m_nextSlots.empty())
            {
                m_nextSlots.assign(slots.size(), Free);
            }
            m_nextSlots[slot] = first;
        }
        first = static_cast<Slot>(slot);
    }
}

std::size_t SlotIndex::Take(const std::vector<OrvixFileEntry*>& slots, const OrvixFileEntry* entry)
{
    Slot& first = m_firstSlots[PlaceOf(slots, entry)];
    if (first == Free)
    {
        return NoSlot;
    }
    const Slot taken = first;
    if (HasRepetition() && m_nextSlots[taken] != Free)
    {
        first = m_nextSlots[taken];
    }
    return taken;
}

/// Where the table has the entry, or the free place where it would be.
std::size_t SlotIndex::PlaceOf(const std::vector<OrvixFileEntry*>& slots, const OrvixFileEntry* entry) const
{
    // Fibonacci hashing: the fraction of the golden ratio as a 64-bit number spreads neighbouring addresses.
    constexpr std::uint64_t GoldenRatio = 0x9E3779B97F4A7C15;
    const std::uint64_t hash = reinterpret_cast<std::uintptr_t>(entry) * GoldenRatio;
    auto place = static_cast<std::size_t>(hash >> (64 - std::countr_zero(m_firstSlots.size())));
    while (m_firstSlots[place] != Free && slots[m_firstSlots[place]] != entry)
    {
        place = (place + 1) & (m_firstSlots.size() - 1);
    }
    return place;
}
