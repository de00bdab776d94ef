#pragma once

#include <algorithm>

class OrvixFileEntry;

/// A sequence of links to entries that an entry keeps in plain members: storage of the ordinary allocator, the number
/// of links in it and the number that fit. Refers to the members; made for one operation.
class EntryLinks
{
public:
    EntryLinks(OrvixFileEntry**& items, unsigned int& count, unsigned int& capacity)
        : m_items(items), m_count(count), m_capacity(capacity)
    {
    }

    /// Makes room for one more link. Throws std::bad_alloc with nothing changed.
    void Reserve()
    {
        if (m_count < m_capacity)
        {
            return;
        }
        const unsigned int capacity = std::max(2 * m_capacity, 4U);
        auto** items = new OrvixFileEntry*[capacity];
        std::copy_n(m_items, m_count, items);
        delete[] m_items;
        m_items = items;
        m_capacity = capacity;
    }

    /// Throws std::bad_alloc with nothing changed.
    void Append(OrvixFileEntry* entry)
    {
        Reserve();
        m_items[m_count++] = entry;
    }

    /// Closes the gap; `index` is below the number of links.
    void Remove(unsigned int index)
    {
        std::copy(m_items + index + 1, m_items + m_count, m_items + index);
        --m_count;
    }

private:
    OrvixFileEntry**& m_items;
    unsigned int& m_count;
    unsigned int& m_capacity;
};
