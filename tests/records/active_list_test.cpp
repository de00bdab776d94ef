#include "BraeDiagnostics.h"
#include "OrvixFileEntry.h"
#include "OrvixFileList.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <climits>
#include <functional>
#include <map>
#include <random>
#include <string>
#include <vector>

namespace
{

using Entries = std::vector<OrvixFileEntry*>;

OrvixFileEntry* Create(OrvixFileList& list, OrvixFileEntry* parent, unsigned long flags)
{
    return list.CreateEntry(L"f", parent, flags, 0);
}

Entries Active(OrvixFileList& list)
{
    Entries active;
    for (unsigned int n = 0; n < list.NumActiveEntries(); ++n)
    {
        active.push_back(list.GetActiveFileEntry(n));
    }
    return active;
}

/// Calls itself selected, whatever it stores.
class SelectedEntry : public OrvixFileEntry
{
public:
    unsigned long GetFlagsIn() override { return 1; }
};

/// A folder with one child that is not in the library's own storage.
class HostFolder : public SelectedEntry
{
public:
    unsigned int NumChildren() override { return 1; }
    OrvixFileEntry* GetChild(unsigned int index) override { return index == 0 ? &child : nullptr; }

    SelectedEntry child;
};

/// A list whose entries and roots are the host's own, a null entry among them.
class HostList : public OrvixFileList
{
public:
    unsigned int NumEntries() override { return 3; }
    OrvixFileEntry* GetFileEntry(unsigned int index) override
    {
        OrvixFileEntry* const entries[] = {&first, nullptr, &folder};
        return index < 3 ? entries[index] : nullptr;
    }
    unsigned int NumRootEntries() override { return 2; }
    OrvixFileEntry* GetRootEntry(unsigned int index) override
    {
        OrvixFileEntry* const roots[] = {&folder, &first};
        return index < 2 ? roots[index] : nullptr;
    }

    SelectedEntry first;
    HostFolder folder;
};

/// Answers for the number of active entries.
class CountingList : public OrvixFileList
{
public:
    unsigned int NumActiveEntries() override { return 77; }
};

} // namespace

TEST(BuildActiveList, TakesChildrenBeforeTheirParentsFromTheRoots)
{
    OrvixFileList list;
    OrvixFileEntry* a = Create(list, nullptr, 1);
    OrvixFileEntry* b = Create(list, a, 1);
    OrvixFileEntry* c = Create(list, a, 1);
    EXPECT_EQ(list.BuildActiveList(1, true), 3u);
    EXPECT_EQ(Active(list), (Entries{b, c, a}));
}

TEST(BuildActiveList, TakesTheOrderOfCreationFromTheEntries)
{
    OrvixFileList list;
    OrvixFileEntry* a = Create(list, nullptr, 1);
    OrvixFileEntry* b = Create(list, a, 1);
    OrvixFileEntry* c = Create(list, a, 1);
    EXPECT_EQ(list.BuildActiveList(1, false), 3u);
    EXPECT_EQ(Active(list), (Entries{a, b, c}));
}

TEST(BuildActiveList, WalksTreesPostOrderRootAfterRoot)
{
    OrvixFileList list;
    OrvixFileEntry* second = nullptr;
    OrvixFileEntry* first = Create(list, nullptr, 1);
    second = Create(list, nullptr, 1);
    OrvixFileEntry* secondChild = Create(list, second, 1);
    OrvixFileEntry* left = Create(list, first, 1);
    OrvixFileEntry* right = Create(list, first, 1);
    OrvixFileEntry* rightLeaf = Create(list, right, 1);
    OrvixFileEntry* leftLeaf = Create(list, left, 1);
    list.BuildActiveList(1, true);
    EXPECT_EQ(Active(list), (Entries{leftLeaf, left, rightLeaf, right, first, secondChild, second}));
}

TEST(BuildActiveList, SelectsOnAnyCommonBitOfFlagsIn)
{
    for (const bool fromRoots : {false, true})
    {
        OrvixFileList list;
        OrvixFileEntry* one = Create(list, nullptr, 0x1);
        OrvixFileEntry* both = Create(list, nullptr, 0x80000001);
        OrvixFileEntry* high = Create(list, nullptr, 0x80000000);
        OrvixFileEntry* none = Create(list, nullptr, 0);
        none->SetFlagsOut(0xFFFFFFFF);
        list.BuildActiveList(0x1, fromRoots);
        EXPECT_EQ(Active(list), (Entries{one, both}));
        list.BuildActiveList(0x80000000, fromRoots);
        EXPECT_EQ(Active(list), (Entries{both, high}));
        list.BuildActiveList(0xFFFFFFFF, fromRoots);
        EXPECT_EQ(Active(list), (Entries{one, both, high}));
        list.BuildActiveList(0x2, fromRoots);
        EXPECT_EQ(Active(list), Entries{});
    }
}

TEST(BuildActiveList, IsEmptyForAMaskOfZero)
{
    OrvixFileList list;
    Create(list, nullptr, 0xFFFFFFFF);
    list.AddActiveEntry(list.GetFileEntry(0));
    EXPECT_EQ(list.BuildActiveList(0, false), 0u);
    EXPECT_EQ(list.NumActiveEntries(), 0u);
    EXPECT_EQ(list.BuildActiveList(0, true), 0u);
}

TEST(BuildActiveList, VisitsTheChildrenOfAnEntryThatIsNotSelected)
{
    OrvixFileList list;
    OrvixFileEntry* root = Create(list, nullptr, 0);
    OrvixFileEntry* inner = Create(list, root, 0);
    OrvixFileEntry* leaf = Create(list, inner, 1);
    list.BuildActiveList(1, true);
    EXPECT_EQ(Active(list), Entries{leaf});
}

TEST(BuildActiveList, TakesAnEntryTwiceThatTwoPathsReach)
{
    OrvixFileList list;
    OrvixFileEntry* a = Create(list, nullptr, 1);
    OrvixFileEntry* b = Create(list, nullptr, 1);
    OrvixFileEntry* shared = Create(list, a, 1);
    OrvixFileEntry* leaf = Create(list, shared, 1);
    b->AddChild(shared);
    a->AddChild(b);
    EXPECT_EQ(list.BuildActiveList(1, true), 9u);
    EXPECT_EQ(Active(list), (Entries{leaf, shared, leaf, shared, b, a, leaf, shared, b}));
    EXPECT_EQ(list.BuildActiveList(1, false), 4u);
}

TEST(BuildActiveList, LeavesAttachmentsOut)
{
    for (const bool fromRoots : {false, true})
    {
        OrvixFileList list;
        OrvixFileEntry* entry = Create(list, nullptr, 1);
        entry->AddAttachment(L"attached", nullptr, 1, 0);
        list.BuildActiveList(1, fromRoots);
        EXPECT_EQ(Active(list), Entries{entry});
    }
}

TEST(BuildActiveList, ReachesFromTheRootsWhatTheListDoesNotOwn)
{
    OrvixFileList list;
    OrvixFileEntry stranger;
    stranger.SetFlagsIn(1);
    OrvixFileEntry* root = Create(list, nullptr, 1);
    root->AddChild(&stranger);
    list.BuildActiveList(1, true);
    EXPECT_EQ(Active(list), (Entries{&stranger, root}));
    list.BuildActiveList(1, false);
    EXPECT_EQ(Active(list), Entries{root});
}

TEST(BuildActiveList, DoesNotReachEntriesBelowAStrangersTreeFromTheRoots)
{
    OrvixFileEntry parent;
    OrvixFileList list;
    OrvixFileEntry* entry = Create(list, &parent, 1);
    EXPECT_EQ(list.BuildActiveList(1, true), 0u);
    list.BuildActiveList(1, false);
    EXPECT_EQ(Active(list), Entries{entry});
}

TEST(BuildActiveList, StartsFromScratchEveryTime)
{
    OrvixFileList list;
    OrvixFileEntry stranger;
    OrvixFileEntry* entry = Create(list, nullptr, 1);
    for (int n = 0; n < 3; ++n)
    {
        list.AddActiveEntry(&stranger);
        EXPECT_EQ(list.BuildActiveList(1, n == 1), 1u);
        EXPECT_EQ(Active(list), Entries{entry});
    }
}

TEST(BuildActiveList, GivesZeroForAnEmptyList)
{
    OrvixFileList list;
    EXPECT_EQ(list.BuildActiveList(0xFFFFFFFF, false), 0u);
    EXPECT_EQ(list.BuildActiveList(0xFFFFFFFF, true), 0u);
}

TEST(BuildActiveList, ReadsEntriesThroughVirtualOperationsOnly)
{
    HostList list;
    EXPECT_EQ(list.BuildActiveList(1, false), 2u);
    EXPECT_EQ(Active(list), (Entries{&list.first, &list.folder}));
    EXPECT_EQ(list.BuildActiveList(2, false), 0u);
}

TEST(BuildActiveList, ReadsRootsAndChildrenThroughVirtualOperationsOnly)
{
    HostList list;
    EXPECT_EQ(list.BuildActiveList(1, true), 3u);
    EXPECT_EQ(Active(list), (Entries{&list.folder.child, &list.folder, &list.first}));
}

TEST(BuildActiveList, GivesWhatTheVirtualCountSays)
{
    CountingList list;
    EXPECT_EQ(list.BuildActiveList(1, false), 77u);
    EXPECT_EQ(list.BuildActiveList(1, true), 77u);
}

TEST(AddActiveEntry, AppendsWithoutLookingForDuplicatesOrOwners)
{
    OrvixFileList list;
    OrvixFileEntry stranger;
    OrvixFileEntry* entry = Create(list, nullptr, 0);
    EXPECT_EQ(list.AddActiveEntry(entry), 1u);
    EXPECT_EQ(list.AddActiveEntry(&stranger), 2u);
    EXPECT_EQ(list.AddActiveEntry(entry), 3u);
    EXPECT_EQ(Active(list), (Entries{entry, &stranger, entry}));
}

TEST(AddActiveEntry, IgnoresNullAndGivesTheCurrentCount)
{
    OrvixFileList list;
    EXPECT_EQ(list.AddActiveEntry(nullptr), 0u);
    list.AddActiveEntry(Create(list, nullptr, 0));
    EXPECT_EQ(list.AddActiveEntry(nullptr), 1u);
    EXPECT_EQ(list.NumActiveEntries(), 1u);
}

TEST(AddActiveEntry, GivesWhatTheVirtualCountSays)
{
    CountingList list;
    OrvixFileEntry entry;
    EXPECT_EQ(list.AddActiveEntry(&entry), 77u);
    EXPECT_EQ(list.AddActiveEntry(nullptr), 77u);
}

TEST(RemoveActiveEntry, RemovesTheFirstOccurrenceAndMovesLaterOnesDown)
{
    OrvixFileList list;
    OrvixFileEntry a;
    OrvixFileEntry b;
    OrvixFileEntry c;
    for (OrvixFileEntry* entry : {&b, &a, &c, &a})
    {
        list.AddActiveEntry(entry);
    }
    EXPECT_TRUE(list.RemoveActiveEntry(&a));
    EXPECT_EQ(Active(list), (Entries{&b, &c, &a}));
    EXPECT_TRUE(list.RemoveActiveEntry(&a));
    EXPECT_EQ(Active(list), (Entries{&b, &c}));
    EXPECT_FALSE(list.RemoveActiveEntry(&a));
    EXPECT_EQ(Active(list), (Entries{&b, &c}));
}

TEST(RemoveActiveEntry, GivesFalseForNullAndOnAnEmptyList)
{
    OrvixFileList list;
    OrvixFileEntry entry;
    EXPECT_FALSE(list.RemoveActiveEntry(&entry));
    EXPECT_FALSE(list.RemoveActiveEntry(nullptr));
    list.AddActiveEntry(&entry);
    EXPECT_FALSE(list.RemoveActiveEntry(nullptr));
    EXPECT_EQ(list.NumActiveEntries(), 1u);
}

TEST(RemoveActiveEntry, LeavesTheEntryInTheListAndAlive)
{
    OrvixFileList list;
    OrvixFileEntry* entry = Create(list, nullptr, 1);
    list.BuildActiveList(1, false);
    const long blocks = BraeDiagnostics::LiveBlocks();
    EXPECT_TRUE(list.RemoveActiveEntry(entry));
    EXPECT_EQ(BraeDiagnostics::LiveBlocks(), blocks);
    EXPECT_EQ(list.NumEntries(), 1u);
    EXPECT_EQ(list.NumRootEntries(), 1u);
}

namespace
{

/// A file list and, beside it, what its operations should leave, kept in plain vectors. Every step is done on
/// both; `Compare` then compares everything that can be read.
class ListAndModel
{
public:
    explicit ListAndModel(unsigned int seed) : m_random(seed) {}

    void Step()
    {
        switch (Below(m_entries.empty() ? 1 : 12))
        {
        case 0:
            CreateEntry();
            break;
        case 1:
            LinkAgain();
            break;
        case 2:
            Build();
            break;
        case 3:
            RemoveEntry();
            break;
        case 4:
            DropWhileWalking();
            break;
        case 5:
            if (Below(10) == 0)
            {
                RemoveAll();
            }
            break;
        case 6:
            RemoveActive(nullptr);
            break;
        case 7:
        case 8:
            RemoveActive(AnyEntry());
            break;
        default:
            AddActive(AnyEntry());
            break;
        }
    }

    void Compare()
    {
        ASSERT_EQ(Active(m_list), m_active);
        ASSERT_EQ(m_list.GetActiveFileEntry(static_cast<unsigned int>(m_active.size())), nullptr);
        ASSERT_EQ(m_list.NumEntries(), m_entries.size());
        for (unsigned int n = 0; n < m_entries.size(); ++n)
        {
            ASSERT_EQ(m_list.GetFileEntry(n), m_entries[n]);
        }
        ASSERT_EQ(m_list.NumRootEntries(), m_roots.size());
        for (unsigned int n = 0; n < m_roots.size(); ++n)
        {
            ASSERT_EQ(m_list.GetRootEntry(n), m_roots[n]);
        }
        for (OrvixFileEntry* entry : m_entries)
        {
            ASSERT_EQ(entry->NumChildren(), m_children[entry].size());
            for (unsigned int n = 0; n < entry->NumChildren(); ++n)
            {
                ASSERT_EQ(entry->GetChild(n), m_children[entry][n]);
            }
        }
    }

private:
    unsigned int Below(std::size_t bound) { return static_cast<unsigned int>(m_random() % bound); }
    OrvixFileEntry* AnyEntry() { return m_entries[Below(m_entries.size())]; }

    void CreateEntry()
    {
        if (m_entries.size() == 12)
        {
            return;
        }
        OrvixFileEntry* parent = m_entries.empty() || Below(3) == 0 ? nullptr : AnyEntry();
        OrvixFileEntry* entry = Create(m_list, parent, Below(8));
        m_entries.push_back(entry);
        (parent != nullptr ? m_children[parent] : m_roots).push_back(entry);
    }

    /// A second path to an entry; only from older to newer ones, so that no ring comes about.
    void LinkAgain()
    {
        const unsigned int child = Below(m_entries.size());
        if (child == 0)
        {
            return;
        }
        OrvixFileEntry* parent = m_entries[Below(child)];
        if (m_children[parent].size() >= 3)
        {
            return;
        }
        parent->AddChild(m_entries[child]);
        m_children[parent].push_back(m_entries[child]);
    }

    void AddActive(OrvixFileEntry* entry)
    {
        m_active.push_back(entry);
        ASSERT_EQ(m_list.AddActiveEntry(entry), m_active.size());
    }

    void RemoveActive(OrvixFileEntry* entry)
    {
        const auto place = std::find(m_active.begin(), m_active.end(), entry);
        const bool found = place != m_active.end();
        ASSERT_EQ(m_list.RemoveActiveEntry(entry), found);
        if (found)
        {
            m_active.erase(place);
        }
    }

    /// As an operation does that drops the files whose state does not fit.
    void DropWhileWalking()
    {
        const bool backwards = Below(2) == 0;
        const unsigned int oneIn = 1 + Below(4);
        for (unsigned int n = 0; n < m_active.size();)
        {
            const std::size_t place = backwards ? m_active.size() - 1 - n : n;
            if (Below(oneIn) == 0)
            {
                RemoveActive(m_list.GetActiveFileEntry(static_cast<unsigned int>(place)));
            }
            else
            {
                ++n;
            }
        }
    }

    void Build()
    {
        const unsigned long mask = Below(8);
        const bool fromRoots = Below(2) == 0;
        m_active.clear();
        const auto select = [&](OrvixFileEntry* entry) {
            if (entry->GetFlagsIn() & mask)
            {
                m_active.push_back(entry);
            }
        };
        const std::function<void(OrvixFileEntry*)> visit = [&](OrvixFileEntry* entry) {
            for (OrvixFileEntry* child : m_children[entry])
            {
                visit(child);
            }
            select(entry);
        };
        if (fromRoots)
        {
            std::for_each(m_roots.begin(), m_roots.end(), visit);
        }
        else
        {
            std::for_each(m_entries.begin(), m_entries.end(), select);
        }
        ASSERT_EQ(m_list.BuildActiveList(mask, fromRoots), m_active.size());
    }

    void RemoveEntry()
    {
        const unsigned int index = Below(m_entries.size() + 1);
        if (index == m_entries.size())
        {
            ASSERT_FALSE(m_list.RemoveEntry(index));
            return;
        }
        OrvixFileEntry* removed = m_entries[index];
        ASSERT_TRUE(Below(2) == 0 ? m_list.RemoveEntry(index) : m_list.RemoveEntry(removed));

        m_entries.erase(m_entries.begin() + index);
        std::erase(m_roots, removed);
        for (OrvixFileEntry* root : m_roots)
        {
            Detach(root, removed);
        }
        if (const auto place = std::find(m_active.begin(), m_active.end(), removed); place != m_active.end())
        {
            m_active.erase(place);
        }
        m_children.erase(removed);
        Compare();
        ForgetLeftLinks(removed);
    }

    void Detach(OrvixFileEntry* from, OrvixFileEntry* removed)
    {
        Entries& children = m_children[from];
        for (std::size_t n = 0; n < children.size(); ++n)
        {
            if (children[n] == removed)
            {
                children.erase(children.begin() + static_cast<std::ptrdiff_t>(n));
                return;
            }
            Detach(children[n], removed);
        }
    }

    /// What a host does about the links to a removed entry that the list leaves.
    void ForgetLeftLinks(OrvixFileEntry* removed)
    {
        for (OrvixFileEntry* entry : m_entries)
        {
            for (unsigned int n = entry->NumChildren(); n-- > 0;)
            {
                if (entry->GetChild(n) == removed)
                {
                    entry->RemoveChild(n);
                }
            }
            std::erase(m_children[entry], removed);
        }
        while (m_list.RemoveActiveEntry(removed))
            ;
        std::erase(m_active, removed);
    }

    void RemoveAll()
    {
        ASSERT_TRUE(m_list.RemoveAll());
        m_entries.clear();
        m_roots.clear();
        m_active.clear();
        m_children.clear();
    }

    std::mt19937 m_random;
    OrvixFileList m_list;
    Entries m_entries;
    Entries m_roots;
    Entries m_active;
    std::map<OrvixFileEntry*, Entries> m_children;
};

} // namespace

TEST(FileListOperations, LeaveWhatPlainVectorsWouldHoldInManyRandomSequences)
{
    const long blocks = BraeDiagnostics::LiveBlocks();
    for (unsigned int seed = 0; seed < 300; ++seed)
    {
        ListAndModel both(seed);
        for (int step = 0; step < 400; ++step)
        {
            both.Step();
            both.Compare();
            if (HasFatalFailure())
            {
                FAIL() << "sequence " << seed << ", step " << step;
            }
        }
    }
    EXPECT_EQ(BraeDiagnostics::LiveBlocks(), blocks);
}

TEST(RemoveActiveEntry, KeepsTheOrderWhateverTheOrderOfRemovalInAListOfDistinctEntries)
{
    constexpr unsigned int Count = 200;
    std::mt19937 random(1);
    OrvixFileList list;
    for (unsigned int n = 0; n < Count; ++n)
    {
        Create(list, nullptr, 1);
    }
    for (int sequence = 0; sequence < 40; ++sequence)
    {
        list.BuildActiveList(1, false);
        Entries expected = Active(list);
        Entries order = expected;
        if (sequence == 1)
        {
            std::reverse(order.begin(), order.end());
        }
        else if (sequence > 1)
        {
            std::shuffle(order.begin(), order.end(), random);
        }
        for (OrvixFileEntry* entry : order)
        {
            ASSERT_TRUE(list.RemoveActiveEntry(entry));
            std::erase(expected, entry);
            ASSERT_EQ(Active(list), expected);
            ASSERT_FALSE(list.RemoveActiveEntry(entry));
        }
    }
}

TEST(RemoveActiveEntry, RemovesFirstOccurrencesInALongListOfRepetitions)
{
    constexpr std::size_t Count = 200;
    OrvixFileList list;
    Entries model;
    for (std::size_t i = 0; i < 2 * Count; ++i)
    {
        OrvixFileEntry* entry = i < Count ? Create(list, nullptr, 1) : model[i - Count];
        list.AddActiveEntry(entry);
        model.push_back(entry);
    }
    const auto remove = [&](OrvixFileEntry* entry) {
        const auto found = std::find(model.begin(), model.end(), entry);
        EXPECT_EQ(list.RemoveActiveEntry(entry), found != model.end());
        if (found != model.end())
        {
            model.erase(found);
        }
    };
    // From the back, so that much is searched and an index is made.
    for (unsigned int i = Count; i-- > Count / 2;)
    {
        remove(list.GetFileEntry(i));
    }
    list.AddActiveEntry(list.GetFileEntry(0));
    model.push_back(list.GetFileEntry(0));
    EXPECT_EQ(Active(list), model);
    for (unsigned int i = 1; i <= Count; i += 1 + i % 3)
    {
        remove(list.GetFileEntry(Count - i));
        // A step, a long jump and a step back over the holes.
        for (const std::size_t at : {std::size_t{1}, model.size() / 2, model.size() / 2 + 40, std::size_t{0}})
        {
            EXPECT_EQ(list.GetActiveFileEntry(static_cast<unsigned int>(at)), at < model.size() ? model[at] : nullptr);
        }
    }
    EXPECT_EQ(Active(list), model);
}

/// Long enough for an index, which is made after some searches; appending ends it and reading from afar closes the
/// gaps.
TEST(RemoveActiveEntry, KeepsTheOrderWhateverTheOrderOfRemovalInALongListWithRepetitions)
{
    for (unsigned int seed = 0; seed < 40; ++seed)
    {
        std::mt19937 random(seed);
        const unsigned int mostOften = 1 + seed % 4;
        OrvixFileList list;
        Entries expected;
        for (unsigned int n = 0; n < 200; ++n)
        {
            expected.insert(expected.end(), 1 + random() % mostOften, Create(list, nullptr, 1));
        }
        if (seed % 3 != 0)
        {
            std::shuffle(expected.begin(), expected.end(), random);
        }
        for (OrvixFileEntry* entry : expected)
        {
            list.AddActiveEntry(entry);
        }
        Entries order = expected;
        if (seed % 2 != 0)
        {
            std::shuffle(order.begin(), order.end(), random);
        }
        for (std::size_t n = 0; n < order.size(); ++n)
        {
            ASSERT_TRUE(list.RemoveActiveEntry(order[n]));
            expected.erase(std::find(expected.begin(), expected.end(), order[n]));
            if (n % 100 == 50)
            {
                expected.push_back(order[n]);
                order.push_back(order[n]);
                ASSERT_EQ(list.AddActiveEntry(order[n]), expected.size());
            }
            const auto middle = static_cast<unsigned int>(expected.size() / 2);
            if (n % 70 == 20 && !expected.empty())
            {
                ASSERT_EQ(list.GetActiveFileEntry(middle), expected[middle]);
            }
            if (n % 10 == 0)
            {
                ASSERT_EQ(Active(list), expected) << "sequence " << seed << ", removal " << n;
            }
        }
        ASSERT_FALSE(list.RemoveActiveEntry(order[0]));
        ASSERT_EQ(list.NumActiveEntries(), 0u);
    }
}
