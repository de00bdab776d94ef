#include "EntryLinks.h"

#include "OrvixFileEntry.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <array>
#include <vector>

using testing::ElementsAre;

namespace
{

/// The members that an entry keeps its links in. It owns the storage and no entry.
class Links : public testing::Test
{
protected:
    ~Links() override { delete[] m_items; }

    EntryLinks Edit() { return {m_items, m_count, m_capacity}; }
    std::vector<const OrvixFileEntry*> Content() const { return {m_items, m_items + m_count}; }

    /// Makes as many entries and links them in order.
    void AppendNew(std::size_t count)
    {
        m_entries = std::vector<OrvixFileEntry>(count);
        for (OrvixFileEntry& entry : m_entries)
        {
            Edit().Append(&entry);
        }
    }

    std::vector<OrvixFileEntry> m_entries;
    OrvixFileEntry** m_items = nullptr;
    unsigned int m_count = 0;
    unsigned int m_capacity = 0;
};

} // namespace

TEST_F(Links, AreAppendedInOrderThroughEveryGrowthOfTheStorage)
{
    constexpr std::size_t Count = 1000;
    AppendNew(Count);
    ASSERT_EQ(m_count, Count);
    EXPECT_GE(m_capacity, m_count);
    for (std::size_t n = 0; n < Count; ++n)
    {
        ASSERT_EQ(m_items[n], &m_entries[n]) << n;
    }
}

TEST_F(Links, DoubleTheirStorageWhenItIsFull)
{
    unsigned int growths = 0;
    for (unsigned int n = 0; n < 1000; ++n)
    {
        const unsigned int before = m_capacity;
        Edit().Append(nullptr);
        if (m_capacity != before)
        {
            ++growths;
            EXPECT_EQ(before, n) << "the storage was not full";
            EXPECT_GE(m_capacity, 2 * before);
        }
    }
    EXPECT_LE(growths, 10U);
}

TEST_F(Links, ReserveMakesRoomForOneMoreAndChangesNothingElse)
{
    Edit().Reserve();
    EXPECT_EQ(m_count, 0U);
    EXPECT_GE(m_capacity, 1U);
    OrvixFileEntry** const items = m_items;
    Edit().Reserve();
    AppendNew(1);
    EXPECT_EQ(m_items, items) << "there was room for it";
}

TEST_F(Links, CloseTheGapOfARemovedOne)
{
    AppendNew(4);
    Edit().Remove(1);
    EXPECT_THAT(Content(), ElementsAre(&m_entries[0], &m_entries[2], &m_entries[3]));
    Edit().Remove(2);
    EXPECT_THAT(Content(), ElementsAre(&m_entries[0], &m_entries[2]));
    Edit().Remove(0);
    EXPECT_THAT(Content(), ElementsAre(&m_entries[2]));
    Edit().Remove(0);
    EXPECT_EQ(m_count, 0U);
}

TEST_F(Links, KeepTheirStorageForTheNextOnesAfterARemoval)
{
    AppendNew(4);
    const unsigned int capacity = m_capacity;
    OrvixFileEntry** const items = m_items;
    Edit().Remove(0);
    Edit().Append(&m_entries[0]);
    EXPECT_THAT(Content(), ElementsAre(&m_entries[1], &m_entries[2], &m_entries[3], &m_entries[0]));
    EXPECT_EQ(m_capacity, capacity);
    EXPECT_EQ(m_items, items);
}
