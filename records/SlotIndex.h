#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

class OrvixFileEntry;

/// Where the entries of a sequence are: for each entry the slot of its first occurrence, and for each slot the next
/// occurrence of the same entry. Keeps numbers of slots only, in little memory, and reads the entries in the sequence;
/// an empty slot (null) counts as not there.
class SlotIndex
{
public:
    static constexpr auto NoSlot = static_cast<std::size_t>(-1);

    /// Not made, or cleared.
    bool IsEmpty() const { return m_firstSlots.empty(); }

    /// Whether an entry was there twice when the index was made.
    bool HasRepetition() const { return !m_nextSlots.empty(); }

    /// The storage is kept.
    void Clear();

    /// Makes the index of a sequence with `count` entries. Throws std::bad_alloc, and is then of no use.
    void Make(const std::vector<OrvixFileEntry*>& slots, std::size_t count);

    /// The slot of the first occurrence, which the caller then empties; `NoSlot` when there is none.
    std::size_t Take(const std::vector<OrvixFileEntry*>& slots, const OrvixFileEntry* entry);

private:
    using Slot = std::uint32_t;
    static constexpr auto Free = static_cast<Slot>(-1);

    std::size_t PlaceOf(const std::vector<OrvixFileEntry*>& slots, const OrvixFileEntry* entry) const;

    std::vector<Slot> m_firstSlots; ///< a hash table: a power of two, at least half of it free
    std::vector<Slot> m_nextSlots;  ///< by slot; empty without repetition
};
