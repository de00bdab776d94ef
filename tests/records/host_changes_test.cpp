// Host classes that create, remove and throw in the middle of an operation of the list that calls them.

#include "BraeDiagnostics.h"
#include "ComesBack.h"
#include "OrvixFileEntry.h"
#include "OrvixFileList.h"
#include "OrvixUserEntry.h"
#include "OrvixUserList.h"

#include <gtest/gtest.h>

#include <functional>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

namespace
{

constexpr unsigned long Selected = 1;

OrvixFileEntry* Create(OrvixFileList& list, const wchar_t* file, OrvixFileEntry* parent = nullptr)
{
    return list.CreateEntry(file, parent, Selected, 0);
}

/// A folder that runs the host's code once when its children are counted, and whenever a child is added.
class BusyFolder : public OrvixFileEntry
{
public:
    unsigned int NumChildren() override
    {
        if (onCount)
        {
            std::exchange(onCount, nullptr)();
        }
        return OrvixFileEntry::NumChildren();
    }
    unsigned int AddChild(OrvixFileEntry* child) override
    {
        if (onAdd)
        {
            onAdd(child);
        }
        return OrvixFileEntry::AddChild(child);
    }

    std::function<void()> onCount;
    std::function<void(OrvixFileEntry*)> onAdd;
};

/// An entry that runs the host's code once when its flags are read.
class BusyEntry : public OrvixFileEntry
{
public:
    unsigned long GetFlagsIn() override
    {
        if (onFlags)
        {
            std::exchange(onFlags, nullptr)();
        }
        return OrvixFileEntry::GetFlagsIn();
    }

    std::function<void()> onFlags;
};

/// A list whose first root is the host's, which the list does not own, and which runs the host's code once when an
/// entry is taken off the active list.
class BusyList : public OrvixFileList
{
public:
    explicit BusyList(OrvixFileEntry* first = nullptr) : m_first(first) {}

    unsigned int NumRootEntries() override { return OrvixFileList::NumRootEntries() + Extra(); }
    OrvixFileEntry* GetRootEntry(unsigned int index) override
    {
        return index < Extra() ? m_first : OrvixFileList::GetRootEntry(index - Extra());
    }
    bool RemoveActiveEntry(OrvixFileEntry* entry) override
    {
        if (onRemoveActive)
        {
            std::exchange(onRemoveActive, nullptr)();
        }
        return OrvixFileList::RemoveActiveEntry(entry);
    }

    std::function<void()> onRemoveActive;

private:
    unsigned int Extra() const { return m_first != nullptr ? 1 : 0; }

    OrvixFileEntry* m_first;
};

std::vector<std::wstring> Names(OrvixFileList& list)
{
    std::vector<std::wstring> names;
    for (unsigned int i = 0; i < list.NumEntries(); ++i)
    {
        names.emplace_back(list.GetFileEntry(i)->GetFile());
    }
    return names;
}

std::vector<std::wstring> ActiveNames(OrvixFileList& list)
{
    std::vector<std::wstring> names;
    for (unsigned int i = 0; i < list.NumActiveEntries(); ++i)
    {
        names.emplace_back(list.GetActiveFileEntry(i)->GetFile());
    }
    return names;
}

using List = std::vector<std::wstring>;

} // namespace

TEST(HostChangesDuringRemoveEntry, EntriesThatAreCreatedMeanwhileStay)
{
    BusyFolder folder;
    BusyList list(&folder);
    OrvixFileEntry* removed = Create(list, L"removed");
    folder.onCount = [&] {
        for (int i = 0; i < 1000; ++i)
        {
            Create(list, L"new");
        }
    };
    EXPECT_TRUE(list.RemoveEntry(removed));
    EXPECT_EQ(Names(list), List(1000, L"new"));
    EXPECT_EQ(list.NumRootEntries(), 1001u);
}

TEST(HostChangesDuringRemoveEntry, AnotherEntryThatIsRemovedMeanwhileIsRemovedOnce)
{
    for (const wchar_t* first : {L"a", L"b", L"c"})
    {
        BusyFolder folder;
        BusyList list(&folder);
        for (const wchar_t* name : {L"a", L"b", L"c"})
        {
            Create(list, name);
        }
        folder.onCount = [&] { EXPECT_TRUE(list.RemoveEntry(0u)); };
        OrvixFileEntry* removed = nullptr;
        for (unsigned int i = 0; i < list.NumEntries(); ++i)
        {
            removed = list.GetFileEntry(i)->GetFile() == std::wstring(first) ? list.GetFileEntry(i) : removed;
        }
        EXPECT_TRUE(list.RemoveEntry(removed));
        List rest = {L"b", L"c"};
        std::erase(rest, first);
        EXPECT_EQ(Names(list), rest) << "removed with the first one";
    }
}

TEST(HostChangesDuringRemoveEntry, EntriesThatLeaveWithTheActiveListAreRemovedOnce)
{
    for (const unsigned int other : {0u, 1u, 2u})
    {
        BusyList list;
        Create(list, L"a");
        Create(list, L"b");
        Create(list, L"c");
        list.BuildActiveList(Selected, false);
        OrvixFileEntry* b = list.GetFileEntry(1);
        list.onRemoveActive = [&] { EXPECT_TRUE(list.RemoveEntry(other)); };
        EXPECT_TRUE(list.RemoveEntry(b));
        List rest = {L"a", L"c"};
        std::erase(rest, other == 0 ? L"a" : other == 2 ? L"c" : L"b");
        EXPECT_EQ(Names(list), rest);
        EXPECT_EQ(ActiveNames(list), rest);
    }
}

TEST(HostChangesDuringRemoveEntry, ANewEntryInThePlaceOfTheRemovedOneStays)
{
    BusyList list;
    OrvixFileEntry* removed = Create(list, L"removed");
    list.BuildActiveList(Selected, false);
    list.onRemoveActive = [&] {
        EXPECT_TRUE(list.RemoveEntry(0u));
        // One of them probably has the address of the removed one.
        for (int i = 0; i < 100; ++i)
        {
            Create(list, L"new");
        }
    };
    EXPECT_TRUE(list.RemoveEntry(removed));
    EXPECT_EQ(Names(list), List(100, L"new"));
}

TEST(HostChangesDuringRemoveEntry, AListThatIsEmptiedMeanwhileStaysEmpty)
{
    BusyFolder folder;
    BusyList list(&folder);
    Create(list, L"child", Create(list, L"parent"));
    folder.onCount = [&] { list.RemoveAll(); };
    EXPECT_TRUE(list.RemoveEntry(1u));
    EXPECT_EQ(list.NumEntries(), 0u);
    EXPECT_EQ(list.NumRootEntries(), 1u) << "the host's";
}

TEST(HostChangesDuringBuildActiveList, EntriesThatAreRemovedOnTheWayAreNotTouched)
{
    BusyFolder folder;
    BusyList list(&folder);
    OrvixFileEntry* parent = Create(list, L"parent", &folder);
    Create(list, L"child", parent);
    Create(list, L"last");
    folder.onCount = [&] { EXPECT_TRUE(list.RemoveEntry(parent)); };
    list.BuildActiveList(Selected, true);
    EXPECT_EQ(ActiveNames(list), (List{L"last"}));
}

TEST(HostChangesDuringBuildActiveList, AnAncestorThatIsRemovedOnTheWayEndsItsBranch)
{
    BusyFolder folder;
    BusyEntry entry;
    for (OrvixFileEntry* child : {static_cast<OrvixFileEntry*>(&folder), static_cast<OrvixFileEntry*>(&entry)})
    {
        OrvixFileList list;
        Create(list, L"first");
        OrvixFileEntry* parent = Create(list, L"parent");
        parent->AddChild(child);
        const auto remove = [&] { EXPECT_TRUE(list.RemoveEntry(parent)); };
        folder.onCount = remove;
        entry.onFlags = remove;
        list.BuildActiveList(Selected, true);
        EXPECT_EQ(ActiveNames(list), (List{L"first"}));
        EXPECT_EQ(Names(list), (List{L"first"}));
    }
}

TEST(HostChangesDuringRemoveEntry, AnAncestorThatIsRemovedOnTheWayEndsItsBranch)
{
    BusyFolder folder;
    OrvixFileList list;
    OrvixFileEntry* parent = Create(list, L"parent");
    OrvixFileEntry* removed = Create(list, L"removed");
    Create(list, L"last");
    parent->AddChild(&folder);
    folder.onCount = [&] { EXPECT_TRUE(list.RemoveEntry(parent)); };
    EXPECT_TRUE(list.RemoveEntry(removed));
    EXPECT_EQ(Names(list), (List{L"last"}));
}

TEST(HostChangesDuringBuildActiveList, AFillingWithinTheFillingKeepsTheOrderOfRemovals)
{
    BusyEntry entry;
    entry.SetFlagsIn(Selected);
    entry.SetFile(L"busy");
    OrvixFileList list;
    Create(list, L"a");
    OrvixFileEntry* root = Create(list, L"root");
    root->AddChild(&entry);
    OrvixFileEntry last;
    last.SetFlagsIn(Selected);
    last.SetFile(L"last");
    root->AddChild(&last);
    entry.onFlags = [&] { list.BuildActiveList(Selected, false); };
    list.BuildActiveList(Selected, true);
    ASSERT_EQ(ActiveNames(list), (List{L"a", L"root", L"busy", L"last", L"root"}));
    EXPECT_TRUE(list.RemoveActiveEntry(&entry));
    EXPECT_TRUE(list.RemoveActiveEntry(root));
    EXPECT_EQ(ActiveNames(list), (List{L"a", L"last", L"root"})) << "the first one is removed";
}

TEST(HostChangesDuringBuildActiveList, ACircleIsBoundedWhenAnotherListWalksItMeanwhile)
{
    struct WalkingEntry : OrvixFileEntry
    {
        OrvixFileEntry* GetChild(unsigned int index) override
        {
            if (!std::exchange(isWalking, true))
            {
                other->BuildActiveList(Selected, true);
                isWalking = false;
            }
            return OrvixFileEntry::GetChild(index);
        }
        OrvixFileList* other = nullptr;
        bool isWalking = false;
    };
    WalkingEntry entry;
    entry.SetFlagsIn(Selected);
    entry.SetFile(L"entry");
    entry.AddChild(&entry);
    OrvixFileList other;
    entry.other = &other;
    Create(other, L"other")->AddChild(&entry);
    OrvixFileList list;
    Create(list, L"root")->AddChild(&entry);
    list.BuildActiveList(Selected, true);
    EXPECT_EQ(ActiveNames(list), (List{L"entry", L"root"}));
    EXPECT_EQ(ActiveNames(other), (List{L"entry", L"other"}));
}

TEST(HostChangesDuringCreateEntry, AParentThatThrowsLeavesTheEntryInTheList)
{
    BusyFolder folder;
    folder.onAdd = [](OrvixFileEntry*) { throw std::runtime_error("parent"); };
    OrvixFileList list;
    OrvixFileEntry* child = Create(list, L"child", &folder);
    ASSERT_NE(child, nullptr);
    EXPECT_EQ(list.GetFileEntry(0), child);
    EXPECT_EQ(folder.NumChildren(), 0u);
}

TEST(HostChangesDuringCreateEntry, AParentThatRemovesTheEntryGivesNull)
{
    BusyFolder folder;
    OrvixFileList list;
    folder.onAdd = [&](OrvixFileEntry* child) { EXPECT_TRUE(list.RemoveEntry(child)); };
    // The folder links the deleted entry all the same; nothing here follows that link.
    EXPECT_EQ(Create(list, L"child", &folder), nullptr);
    EXPECT_EQ(list.NumEntries(), 0u);
}

TEST(CircleOfChildren, EndsForTheActiveListAndForARemoval)
{
    OrvixFileList list;
    OrvixFileEntry* top = Create(list, L"top");
    OrvixFileEntry* inner = Create(list, L"inner", top);
    inner->AddChild(top);
    inner->AddChild(inner);
    OrvixFileEntry* leaf = Create(list, L"leaf", inner);
    EXPECT_TRUE(ComesBack([&] { list.BuildActiveList(Selected, true); }));
    EXPECT_EQ(ActiveNames(list), (List{L"leaf", L"inner", L"top"}));
    EXPECT_TRUE(ComesBack([&] { EXPECT_TRUE(list.RemoveEntry(leaf)); }));
    EXPECT_EQ(inner->NumChildren(), 2u);
    EXPECT_EQ(Names(list), (List{L"top", L"inner"}));
}

TEST(UserListCreateEntryFromAUser, CatchesWhatAGetterThrows)
{
    struct ThrowingUser : OrvixUserEntry
    {
        const wchar_t* GetEmail() override { throw std::runtime_error("getter"); }
    };
    ThrowingUser source;
    OrvixUserList list;
    const long blocks = BraeDiagnostics::LiveBlocks();
    EXPECT_EQ(list.CreateEntry(source), nullptr);
    EXPECT_EQ(list.NumEntries(), 0u);
    EXPECT_EQ(BraeDiagnostics::LiveBlocks(), blocks);
}

TEST(UserListCreateEntryFromAUser, TakesTextsThatLiveUntilTheNextGetterOnly)
{
    struct OneBuffer : OrvixUserEntry
    {
        const wchar_t* GetUserNameW() override { return Text(L"user"); }
        const wchar_t* GetFirstName() override { return Text(L"first"); }
        const wchar_t* GetLastName() override { return Text(L"last"); }
        const wchar_t* GetEmail() override { return Text(L"mail"); }
        const wchar_t* Text(const wchar_t* text)
        {
            buffer = std::make_unique<std::wstring>(text);
            return buffer->c_str();
        }
        std::unique_ptr<std::wstring> buffer;
    };
    OneBuffer source;
    OrvixUserList list;
    OrvixUserEntry* user = list.CreateEntry(source);
    ASSERT_NE(user, nullptr);
    EXPECT_STREQ(user->GetUserNameW(), L"user");
    EXPECT_STREQ(user->GetFirstName(), L"first");
    EXPECT_STREQ(user->GetLastName(), L"last");
    EXPECT_STREQ(user->GetEmail(), L"mail");
}
