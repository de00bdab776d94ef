// Every operation of the records that allocates, with each of its allocations failing in turn.

#include "AllocationSweep.h"
#include "ComesBack.h"
#include "OrvixClientInfo.h"
#include "OrvixExploreProviderParams.h"
#include "OrvixFileEntry.h"
#include "OrvixFileList.h"
#include "OrvixFileListDialogParams.h"
#include "OrvixNotifyParams.h"
#include "OrvixUserEntry.h"
#include "OrvixUserList.h"

#include <gtest/gtest.h>

#include <cstddef>
#include <string>
#include <vector>

namespace
{

constexpr const wchar_t* LongText = L"a text too long to be inside a string object";
constexpr const wchar_t* OtherLongText = L"another text that is too long for that, and longer than the first";
OrvixFileEntry* const NoParent = nullptr;

/// Each round runs with this many elements in place, so that sequences are met at every fill of their storage.
constexpr unsigned int MostElements = 9;

template <typename Record>
void SweepTextSetter(const wchar_t* (Record::*get)(), void (Record::*set)(const wchar_t*))
{
    const long failures = SweepAllocations([&](AllocationRound& round) {
        Record record;
        (record.*set)(LongText);
        round.Attempt([&] { (record.*set)(OtherLongText); });
        EXPECT_STREQ((record.*get)(), round.Failed() ? LongText : OtherLongText);
        (record.*set)(OtherLongText);
        EXPECT_STREQ((record.*get)(), OtherLongText);
    });
    EXPECT_GT(failures, 0);
}

/// Files, roots, children and active list of a file list, to compare before and after.
std::vector<const void*> Snapshot(OrvixFileList& list)
{
    std::vector<const void*> snapshot;
    for (unsigned int n = 0; n < list.NumEntries(); ++n)
    {
        OrvixFileEntry* entry = list.GetFileEntry(n);
        snapshot.push_back(entry);
        for (unsigned int child = 0; child < entry->NumChildren(); ++child)
        {
            snapshot.push_back(entry->GetChild(child));
        }
        snapshot.push_back(nullptr);
    }
    for (unsigned int n = 0; n < list.NumRootEntries(); ++n)
    {
        snapshot.push_back(list.GetRootEntry(n));
    }
    snapshot.push_back(nullptr);
    for (unsigned int n = 0; n < list.NumActiveEntries(); ++n)
    {
        snapshot.push_back(list.GetActiveFileEntry(n));
    }
    return snapshot;
}

} // namespace

TEST(AllocationFailureSupport, StrikesTheChosenAllocationOfTheLibraryOnly)
{
    LibraryHeap heap;
    OrvixFileEntry entry;
    heap.Fail(1, false);
    const std::wstring ownAllocation(1000, L'x');
    entry.SetFile(ownAllocation.c_str());
    EXPECT_TRUE(heap.Stop());
    EXPECT_STREQ(entry.GetFile(), L"");

    heap.Fail(1, false);
    entry.SetFile(LongText);
    entry.SetFile(LongText);
    EXPECT_TRUE(heap.Stop());
    EXPECT_STREQ(entry.GetFile(), LongText);

    heap.Fail(1, true);
    entry.SetFile(ownAllocation.c_str());
    entry.SetFile(ownAllocation.c_str());
    EXPECT_TRUE(heap.Stop());
    EXPECT_STREQ(entry.GetFile(), LongText);

    heap.Fail(1000, false);
    entry.SetFile(ownAllocation.c_str());
    EXPECT_FALSE(heap.Stop());
}

TEST(AllocationFailureSupport, CountsTheLibrarysBlocks)
{
    LibraryHeap heap;
    const long blocks = heap.LiveBlocks();
    {
        OrvixFileEntry entry;
        entry.SetFile(LongText);
        EXPECT_EQ(heap.LiveBlocks(), blocks + 1);
    }
    EXPECT_EQ(heap.LiveBlocks(), blocks);
}

TEST(AllocationFailureSupport, NoticesWhenTheLibraryMeetsAFailureOfTheHostsHeap)
{
    HostHeap heap;
    OrvixUserList list;
    heap.Fail(2, false);
    EXPECT_NE(list.CreateEntry(L"a"), nullptr);
    EXPECT_EQ(list.CreateEntry(L"b"), nullptr);
    EXPECT_TRUE(heap.Stop());
    heap.Fail(2, false);
    EXPECT_NE(list.CreateEntry(L"c"), nullptr);
    EXPECT_FALSE(heap.Stop());
}

TEST(AllocationFailure, NeverLeavesATextSetterAndKeepsTheOldText)
{
    using Client = OrvixClientInfo;
    using Dialog = OrvixFileListDialogParams;
    using User = OrvixUserEntry;
    SweepTextSetter(&OrvixFileEntry::GetFile, &OrvixFileEntry::SetFile);
    SweepTextSetter(&Client::GetClientName, &Client::SetClientName);
    SweepTextSetter(&Client::GetUserNameW, &Client::SetUserName);
    SweepTextSetter(&Client::GetProviderPluginPath, &Client::SetProviderPluginPath);
    SweepTextSetter(&Client::GetConfigFilePath, &Client::SetConfigFilePath);
    SweepTextSetter(&Dialog::GetTitle, &Dialog::SetTitle);
    SweepTextSetter(&Dialog::GetMessageW, &Dialog::SetMessage);
    SweepTextSetter(&Dialog::GetComment, &Dialog::SetComment);
    SweepTextSetter(&OrvixExploreProviderParams::GetTitle, &OrvixExploreProviderParams::SetTitle);
    SweepTextSetter(&User::GetUserNameW, &User::SetUserName);
    SweepTextSetter(&User::GetFirstName, &User::SetFirstName);
    SweepTextSetter(&User::GetLastName, &User::SetLastName);
    SweepTextSetter(&User::GetEmail, &User::SetEmail);
}

TEST(AllocationFailure, DoesNotApplyTheDoubleSlashRuleToThePathThatStays)
{
    SweepAllocations([](AllocationRound& round) {
        OrvixFileEntry entry;
        entry.SetFile(L"//");
        round.Attempt([&] { entry.SetFile(L"//server/share/a longer path"); });
        EXPECT_STREQ(entry.GetFile(), round.Failed() ? L"//" : L"\\\\server/share/a longer path");
    });
}

TEST(AllocationFailure, LeavesAPathEmptyThatIsSetForTheFirstTime)
{
    const long failures = SweepAllocations([](AllocationRound& round) {
        OrvixFileEntry entry;
        round.Attempt([&] { entry.SetFile(LongText); });
        EXPECT_STREQ(entry.GetFile(), round.Failed() ? L"" : LongText);
        entry.SetFile(LongText);
        EXPECT_STREQ(entry.GetFile(), LongText);
    });
    EXPECT_EQ(failures, 2) << "one allocation, failing once and for good";
}

TEST(AllocationFailure, GivesZeroFromAddChildAndKeepsTheOtherChildren)
{
    long failures = 0;
    for (unsigned int present = 0; present < MostElements; ++present)
    {
        failures += SweepAllocations([&](AllocationRound& round) {
            std::vector<OrvixFileEntry> children(MostElements + 1);
            OrvixFileEntry parent;
            for (unsigned int n = 0; n < present; ++n)
            {
                parent.AddChild(&children[n]);
            }
            const unsigned int count = round.Attempt([&] { return parent.AddChild(&children[present]); });
            EXPECT_EQ(count, round.Failed() ? 0 : present + 1);
            EXPECT_EQ(parent.NumChildren(), round.Failed() ? present : present + 1);
            EXPECT_EQ(parent.GetChild(present), round.Failed() ? nullptr : &children[present]);
            EXPECT_EQ(parent.AddChild(&children.back()), round.Failed() ? present + 1 : present + 2);
            EXPECT_EQ(parent.GetChild(parent.NumChildren() - 1), &children.back());
            for (unsigned int n = 0; n < present; ++n)
            {
                EXPECT_EQ(parent.GetChild(n), &children[n]);
            }
        });
    }
    EXPECT_GE(failures, 4) << "the first child and a later one find no room";
}

TEST(AllocationFailure, RefusesOnlyTheChildrenThatNeedMoreRoom)
{
    constexpr unsigned int Count = 1000;
    const long failures = SweepAllocations([](AllocationRound& round) {
        OrvixFileEntry child;
        OrvixFileEntry parent;
        unsigned int accepted = 0;
        round.Attempt([&] {
            for (unsigned int n = 0; n < Count; ++n)
            {
                accepted += parent.AddChild(&child) != 0 ? 1 : 0;
            }
        });
        EXPECT_EQ(parent.NumChildren(), accepted);
        EXPECT_EQ(accepted == Count, !round.Failed());
    });
    EXPECT_LE(failures, 2 * 10) << "the storage grows in few steps";
}

TEST(AllocationFailure, GivesZeroFromAddAttachmentOfAPathAndChangesNothing)
{
    for (unsigned int present = 0; present < MostElements; ++present)
    {
        const long failures = SweepAllocations([&](AllocationRound& round) {
            OrvixFileEntry owner;
            for (unsigned int n = 0; n < present; ++n)
            {
                owner.AddAttachment(L"a", NoParent, 0, 0);
            }
            const unsigned int count = round.Attempt([&] { return owner.AddAttachment(LongText, NoParent, 1, 2); });
            EXPECT_EQ(count, round.Failed() ? 0 : present + 1);
            EXPECT_EQ(owner.NumAttachments(), round.Failed() ? present : present + 1);
            EXPECT_EQ(owner.AddAttachment(LongText, NoParent, 1, 2), round.Failed() ? present + 1 : present + 2);
            EXPECT_STREQ(owner.GetAttachment(present)->GetFile(), LongText);
        });
        EXPECT_GE(failures, 4) << "the entry and its text";
    }
}

TEST(AllocationFailure, GivesZeroFromAddAttachmentOfAnEntryAndChangesNothing)
{
    for (unsigned int present = 0; present < MostElements; ++present)
    {
        const long failures = SweepAllocations([&](AllocationRound& round) {
            OrvixFileEntry source;
            source.SetFile(LongText);
            OrvixFileEntry owner;
            for (unsigned int n = 0; n < present; ++n)
            {
                owner.AddAttachment(L"a", NoParent, 0, 0);
            }
            const unsigned int count = round.Attempt([&] { return owner.AddAttachment(&source); });
            EXPECT_EQ(count, round.Failed() ? 0 : present + 1);
            EXPECT_EQ(owner.NumAttachments(), round.Failed() ? present : present + 1);
            EXPECT_EQ(owner.AddAttachment(&source), round.Failed() ? present + 1 : present + 2);
            EXPECT_STREQ(owner.GetAttachment(present)->GetFile(), LongText);
        });
        EXPECT_GE(failures, 4) << "the entry and its text";
    }
}

TEST(AllocationFailure, GivesNullFromCreateEntryOfAPathAndLeavesListAndParentAlone)
{
    for (const bool withParent : {false, true})
    {
        for (unsigned int present = 0; present < MostElements; ++present)
        {
            const long failures = SweepAllocations([&](AllocationRound& round) {
                OrvixFileList list;
                OrvixFileEntry* parent = withParent ? list.CreateEntry(L"p", NoParent, 1, 0) : NoParent;
                for (unsigned int n = 0; n < present; ++n)
                {
                    list.CreateEntry(L"a", parent, 1, 0);
                }
                list.BuildActiveList(1, false);
                const std::vector<const void*> before = Snapshot(list);
                const unsigned int count = list.NumEntries();
                OrvixFileEntry* entry = round.Attempt([&] { return list.CreateEntry(LongText, parent, 1, 2); });
                EXPECT_EQ(entry == nullptr, round.Failed());
                if (round.Failed())
                {
                    EXPECT_EQ(Snapshot(list), before);
                    entry = list.CreateEntry(LongText, parent, 1, 2);
                }
                ASSERT_NE(entry, nullptr);
                EXPECT_EQ(list.NumEntries(), count + 1);
                EXPECT_STREQ(entry->GetFile(), LongText);
                EXPECT_TRUE(list.RemoveEntry(entry));
                EXPECT_EQ(Snapshot(list), before);
            });
            EXPECT_GE(failures, 4) << "the entry and its text";
        }
    }
}

TEST(AllocationFailure, GivesNullFromCreateEntryOfAnEntryAndLeavesListSourceAndParentAlone)
{
    for (const bool withParent : {false, true})
    {
        const long failures = SweepAllocations([&](AllocationRound& round) {
            OrvixFileList list;
            OrvixFileEntry* parent = withParent ? list.CreateEntry(L"p", NoParent, 1, 0) : NoParent;
            OrvixFileEntry* source = list.CreateEntry(LongText, parent, 1, 2);
            for (int n = 0; n < 3; ++n)
            {
                list.CreateEntry(L"child", source, 1, 0);
                source->AddAttachment(OtherLongText, source, 1, 0);
            }
            list.BuildActiveList(1, true);
            const std::vector<const void*> before = Snapshot(list);
            OrvixFileEntry* copy = round.Attempt([&] { return list.CreateEntry(*source); });
            EXPECT_EQ(copy == nullptr, round.Failed());
            if (round.Failed())
            {
                EXPECT_EQ(Snapshot(list), before);
                EXPECT_EQ(source->NumAttachments(), 3u);
                copy = list.CreateEntry(*source);
            }
            ASSERT_NE(copy, nullptr);
            EXPECT_STREQ(copy->GetFile(), LongText);
            EXPECT_EQ(copy->NumChildren(), 3u);
            ASSERT_EQ(copy->NumAttachments(), 3u);
            EXPECT_STREQ(copy->GetAttachment(2)->GetFile(), OtherLongText);
        });
        EXPECT_GE(failures, 2 * (4 + 4)) << "entry and attachments on the host heap, their texts on the library's";
    }
}

TEST(AllocationFailure, LeavesTheActiveListEmptyAfterBuildActiveList)
{
    for (const bool fromRoots : {false, true})
    {
        const long failures = SweepAllocations([&](AllocationRound& round) {
            OrvixFileList list;
            OrvixFileEntry* entry = NoParent;
            for (unsigned int n = 0; n < 20; ++n)
            {
                entry = list.CreateEntry(L"f", n % 3 == 0 ? NoParent : entry, 1, 0);
            }
            list.AddActiveEntry(entry);
            const unsigned int count = round.Attempt([&] { return list.BuildActiveList(1, fromRoots); });
            EXPECT_EQ(count, round.Failed() ? 0u : 20u);
            EXPECT_EQ(list.NumActiveEntries(), count);
            EXPECT_EQ(list.BuildActiveList(1, fromRoots), 20u);
        });
        EXPECT_GE(failures, 2);
    }
}

TEST(AllocationFailure, LeavesTheActiveListEmptyWhenATreeReachesMoreThanTheListHolds)
{
    SweepAllocations([](AllocationRound& round) {
        std::vector<OrvixFileEntry> strangers(50);
        OrvixFileList list;
        OrvixFileEntry* root = list.CreateEntry(L"root", NoParent, 1, 0);
        for (OrvixFileEntry& stranger : strangers)
        {
            stranger.SetFlagsIn(1);
            root->AddChild(&stranger);
        }
        const unsigned int count = round.Attempt([&] { return list.BuildActiveList(1, true); });
        EXPECT_EQ(count, round.Failed() ? 0u : 51u);
        EXPECT_EQ(list.NumActiveEntries(), count);
        EXPECT_EQ(list.BuildActiveList(1, true), 51u);
    });
}

TEST(AllocationFailure, GivesTheUnchangedCountFromAddActiveEntry)
{
    long failures = 0;
    for (unsigned int present = 0; present < MostElements; ++present)
    {
        failures += SweepAllocations([&](AllocationRound& round) {
            OrvixFileEntry entry;
            OrvixFileList list;
            for (unsigned int n = 0; n < present; ++n)
            {
                list.AddActiveEntry(&entry);
            }
            const unsigned int count = round.Attempt([&] { return list.AddActiveEntry(&entry); });
            EXPECT_EQ(count, round.Failed() ? present : present + 1);
            EXPECT_EQ(list.NumActiveEntries(), count);
            EXPECT_EQ(list.AddActiveEntry(&entry), count + 1);
        });
    }
    EXPECT_GT(failures, 0);
}

TEST(AllocationFailure, NeverStandsInTheWayOfRemoveActiveEntry)
{
    for (const bool distinct : {false, true})
    {
        for (unsigned int place = 0; place < MostElements; ++place)
        {
            const long failures = SweepAllocations([&](AllocationRound& round) {
                OrvixFileList list;
                for (unsigned int n = 0; n < MostElements; ++n)
                {
                    list.CreateEntry(L"f", NoParent, 1, 0);
                }
                list.BuildActiveList(1, false);
                if (!distinct)
                {
                    list.AddActiveEntry(list.GetFileEntry(place));
                }
                const unsigned int before = list.NumActiveEntries();
                OrvixFileEntry* entry = list.GetActiveFileEntry(place);
                EXPECT_TRUE(round.Attempt([&] { return list.RemoveActiveEntry(entry); }));
                EXPECT_EQ(list.NumActiveEntries(), before - 1);
                EXPECT_EQ(list.RemoveActiveEntry(entry), !distinct);
            });
            EXPECT_EQ(failures, 0) << "nothing to allocate";
        }
    }
}

TEST(AllocationFailure, LeavesTheEntryInTheListWhenRemoveEntryCannotSearchTheTrees)
{
    SweepAllocations([](AllocationRound& round) {
        OrvixFileList list;
        OrvixFileEntry* root = list.CreateEntry(L"root", NoParent, 1, 0);
        OrvixFileEntry* entry = root;
        for (int n = 0; n < 50; ++n)
        {
            entry = list.CreateEntry(L"f", entry, 1, 0);
        }
        OrvixFileEntry* other = list.CreateEntry(L"other", NoParent, 1, 0);
        other->AddChild(entry);
        OrvixFileEntry* parent = entry->GetParent();
        list.BuildActiveList(1, false);
        const bool removed = round.Attempt([&] { return list.RemoveEntry(entry); });
        EXPECT_EQ(removed, !round.Failed());
        if (!removed)
        {
            EXPECT_EQ(list.GetFileEntry(50), entry);
            EXPECT_STREQ(entry->GetFile(), L"f");
            EXPECT_TRUE(list.RemoveEntry(entry));
        }
        EXPECT_EQ(list.NumEntries(), 51u);
        EXPECT_EQ(parent->NumChildren(), 0u);
        EXPECT_EQ(other->NumChildren(), 0u);
        EXPECT_FALSE(list.RemoveActiveEntry(entry));
    });
}

TEST(AllocationFailure, LeavesARootInTheListWhenRemoveEntryCannotSearchTheOtherTrees)
{
    SweepAllocations([](AllocationRound& round) {
        OrvixFileList list;
        OrvixFileEntry* removed = list.CreateEntry(L"removed", NoParent, 1, 0);
        OrvixFileEntry* entry = list.CreateEntry(L"other", NoParent, 1, 0);
        for (int n = 0; n < 50; ++n)
        {
            entry = list.CreateEntry(L"f", entry, 1, 0);
        }
        entry->AddChild(removed);
        const bool done = round.Attempt([&] { return list.RemoveEntry(removed); });
        EXPECT_EQ(done, !round.Failed());
        if (!done)
        {
            EXPECT_EQ(list.GetFileEntry(0), removed);
            EXPECT_TRUE(list.RemoveEntry(removed));
        }
        EXPECT_EQ(list.NumEntries(), 51u);
        EXPECT_EQ(list.NumRootEntries(), 1u);
        EXPECT_EQ(entry->NumChildren(), 0u);
    });
}

TEST(AllocationFailure, IsNotMetByOperationsThatOnlyTakeAway)
{
    const long failures = SweepAllocations([](AllocationRound& round) {
        OrvixFileList list;
        OrvixUserList users;
        OrvixFileEntry owner;
        for (unsigned int n = 0; n < MostElements; ++n)
        {
            list.CreateEntry(LongText, NoParent, 1, 0);
            users.CreateEntry(LongText);
            owner.AddAttachment(LongText, NoParent, 0, 0);
            owner.AddChild(&owner);
        }
        round.Attempt([&] {
            EXPECT_TRUE(owner.RemoveChild(3));
            EXPECT_TRUE(owner.RemoveAllChildren());
            EXPECT_TRUE(owner.RemoveAttachment(3));
            EXPECT_TRUE(owner.RemoveAllAttachments());
            EXPECT_TRUE(users.RemoveEntry(3u));
            EXPECT_TRUE(users.RemoveEntry(users.GetUserEntry(0)));
            EXPECT_TRUE(users.RemoveAll());
            EXPECT_TRUE(list.RemoveAll());
        });
    });
    EXPECT_EQ(failures, 0);
}

TEST(ActiveListStorage, IsSizedOnceForAListInOrderOfCreation)
{
    const long failures = SweepAllocations([](AllocationRound& round) {
        OrvixFileList list;
        for (int n = 0; n < 1000; ++n)
        {
            list.CreateEntry(L"f", NoParent, 1, 0);
        }
        round.Attempt([&] { list.BuildActiveList(1, false); });
    });
    EXPECT_EQ(failures, 2) << "one allocation, failing once and for good";
}

TEST(ActiveListStorage, IsKeptByBuildActiveListAndRemoveAll)
{
    const long failures = SweepAllocations([](AllocationRound& round) {
        OrvixFileEntry stranger;
        OrvixFileList list;
        for (int n = 0; n < 100; ++n)
        {
            list.CreateEntry(L"f", NoParent, 1, 0);
        }
        list.BuildActiveList(1, false);
        round.Attempt([&] {
            list.BuildActiveList(1, false);
            list.RemoveAll();
            for (int n = 0; n < 100; ++n)
            {
                list.AddActiveEntry(&stranger);
            }
        });
        EXPECT_EQ(list.NumActiveEntries(), 100u);
    });
    EXPECT_EQ(failures, 0);
}

TEST(ActiveListStorage, DoesNotGrowWhenEntriesComeAndGo)
{
    const long failures = SweepAllocations([](AllocationRound& round) {
        OrvixFileEntry first;
        OrvixFileEntry second;
        OrvixFileList list;
        for (OrvixFileEntry* entry : {&first, &second, &first, &second})
        {
            list.AddActiveEntry(entry);
        }
        round.Attempt([&] {
            for (int n = 0; n < 1000; ++n)
            {
                EXPECT_TRUE(list.RemoveActiveEntry(&second));
                list.AddActiveEntry(&second);
            }
        });
        EXPECT_EQ(list.NumActiveEntries(), 4u);
    });
    EXPECT_EQ(failures, 0);
}

TEST(AllocationFailure, GivesNullFromCreateEntryOfAUserNameAndLeavesTheListAlone)
{
    for (unsigned int present = 0; present < MostElements; ++present)
    {
        const long failures = SweepAllocations([&](AllocationRound& round) {
            OrvixUserList list;
            for (unsigned int n = 0; n < present; ++n)
            {
                list.CreateEntry(L"a");
            }
            OrvixUserEntry* user = round.Attempt([&] { return list.CreateEntry(LongText); });
            EXPECT_EQ(user == nullptr, round.Failed());
            EXPECT_EQ(list.NumEntries(), round.Failed() ? present : present + 1);
            EXPECT_NE(list.CreateEntry(LongText), nullptr);
            EXPECT_STREQ(list.GetUserEntry(present)->GetUserNameW(), LongText);
        });
        EXPECT_GE(failures, 4) << "the user and the text";
    }
}

TEST(AllocationFailure, GivesNullFromCreateEntryOfAUserAndLeavesTheListAlone)
{
    for (unsigned int present = 0; present < MostElements; ++present)
    {
        const long failures = SweepAllocations([&](AllocationRound& round) {
            OrvixUserEntry source;
            source.SetUserName(LongText);
            source.SetFirstName(LongText);
            source.SetLastName(LongText);
            source.SetEmail(OtherLongText);
            OrvixUserList list;
            for (unsigned int n = 0; n < present; ++n)
            {
                list.CreateEntry(L"a");
            }
            OrvixUserEntry* user = round.Attempt([&] { return list.CreateEntry(source); });
            EXPECT_EQ(user == nullptr, round.Failed());
            EXPECT_EQ(list.NumEntries(), round.Failed() ? present : present + 1);
            EXPECT_NE(list.CreateEntry(source), nullptr);
            EXPECT_STREQ(list.GetUserEntry(present)->GetEmail(), OtherLongText);
        });
        EXPECT_GE(failures, 10) << "the user and the four texts";
    }
}

TEST(AllocationFailure, GivesZeroFromAddFilterAndKeepsNamesAndExtensionsTogether)
{
    for (std::uint32_t present = 0; present < MostElements; ++present)
    {
        const long failures = SweepAllocations([&](AllocationRound& round) {
            OrvixExploreProviderParams params;
            for (std::uint32_t n = 0; n < present; ++n)
            {
                params.AddFilter(L"n", L"e");
            }
            const std::uint32_t count = round.Attempt([&] { return params.AddFilter(LongText, OtherLongText); });
            EXPECT_EQ(count, round.Failed() ? 0 : present + 1);
            EXPECT_EQ(params.NumFilters(), round.Failed() ? present : present + 1);
            EXPECT_EQ(params.GetFilterExtensions(params.NumFilters()), nullptr);
            EXPECT_EQ(params.AddFilter(L"last", L"*.last"), round.Failed() ? present + 1 : present + 2);
            EXPECT_STREQ(params.GetFilterName(params.NumFilters() - 1), L"last");
            EXPECT_STREQ(params.GetFilterExtensions(params.NumFilters() - 1), L"*.last");
        });
        EXPECT_GE(failures, 4) << "the two texts";
    }
}

TEST(AllocationFailure, IsNotMetByTheMakingOfARecord)
{
    const long failures = SweepAllocations([](AllocationRound& round) {
        round.Attempt([] {
            OrvixFileEntry file;
            OrvixFileList files;
            OrvixUserEntry user;
            OrvixUserList users;
            OrvixClientInfo client;
            OrvixFileListDialogParams dialog;
            OrvixExploreProviderParams explore;
            OrvixNotifyParams notify;
        });
    });
    EXPECT_EQ(failures, 0);
}

namespace
{

int g_allocationsToFail;
void* (*g_allocate)(std::size_t);

void* FailingAllocate(std::size_t size)
{
    return g_allocationsToFail-- > 0 ? nullptr : g_allocate(size);
}

} // namespace

// Without the warm-up of LibraryHeap. The build runs it in a process of its own, so that it
// really meets the first exception without memory; the thread's own state comes from an exception with memory.
TEST(AllocationFailure, IsSurvivedByAProcessInWhichNoExceptionWasEverWithoutMemory)
{
    ImportHook hook(GetModuleHandleW(L"OrvixCore.dll"), "malloc", reinterpret_cast<void*>(&FailingAllocate));
    ASSERT_TRUE(hook.IsActive());
    g_allocate = hook.Original<void*(std::size_t)>();
    OrvixFileEntry entry;
    EXPECT_TRUE(ComesBack([&] {
        g_allocationsToFail = 1;
        entry.SetFile(LongText);
        g_allocationsToFail = 1000;
        entry.SetFile(LongText);
        g_allocationsToFail = 0;
    }));
    g_allocationsToFail = 0;
    EXPECT_STREQ(entry.GetFile(), L"");
}
