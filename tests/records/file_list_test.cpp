#include "BraeDiagnostics.h"
#include "ComesBack.h"
#include "OrvixFileEntry.h"
#include "OrvixFileList.h"

#include <gtest/gtest.h>

#include <climits>
#include <string>
#include <utility>
#include <vector>

namespace
{

OrvixFileEntry* const NoParent = nullptr;

/// A source of the host's own making, whose values come out of its getters; writes down what it is asked.
class RecordingSource : public OrvixFileEntry
{
public:
    explicit RecordingSource(OrvixFileEntry* parent) : m_recordedParent(parent) {}

    const wchar_t* GetFile() override { return Noted("file", L"//host/computed.txt"); }
    unsigned long GetFlagsIn() override { return Noted("flags in", 0x11ul); }
    unsigned long GetFlagsOut() override { return Noted("flags out", 0x22ul); }
    long long GetClientPtr() override { return Noted("client value", 0x3333333333ll); }
    OrvixFileEntry* GetParent() override { return Noted("parent", m_recordedParent); }
    unsigned int NumChildren() override { return 2; }
    OrvixFileEntry* GetChild(unsigned int index) override
    {
        return Noted("child " + std::to_string(index), &children[index]);
    }
    unsigned int NumAttachments() override { return 2; }
    OrvixFileEntry* GetAttachment(unsigned int index) override
    {
        return Noted("attachment " + std::to_string(index), &attachments[index]);
    }

    OrvixFileEntry children[2];
    OrvixFileEntry attachments[2];
    std::vector<std::string> asked;

private:
    template <typename Value>
    Value Noted(const std::string& what, Value value)
    {
        asked.push_back(what);
        return value;
    }

    OrvixFileEntry* m_recordedParent;
};

/// A parent that takes no children.
class ClosedParent : public OrvixFileEntry
{
public:
    unsigned int AddChild(OrvixFileEntry* child) override
    {
        offered.push_back(child);
        return 0;
    }

    std::vector<OrvixFileEntry*> offered;
};

/// A folder whose children are not in the library's own storage.
class HostFolder : public OrvixFileEntry
{
public:
    unsigned int NumChildren() override { return static_cast<unsigned int>(content.size()); }
    OrvixFileEntry* GetChild(unsigned int index) override { return index < content.size() ? content[index] : nullptr; }
    bool RemoveChild(unsigned int index) override
    {
        removed.push_back(index);
        content.erase(content.begin() + index);
        return true;
    }

    std::vector<OrvixFileEntry*> content;
    std::vector<unsigned int> removed;
};

/// Answers for the operation by index and writes down what it was asked.
class RecordingList : public OrvixFileList
{
public:
    using OrvixFileList::RemoveEntry;
    bool RemoveEntry(unsigned int index) override
    {
        removed.push_back(index);
        return answer;
    }

    bool answer = true;
    std::vector<unsigned int> removed;
};

/// Writes down which entries are taken off the active list.
class ActiveRecordingList : public OrvixFileList
{
public:
    bool RemoveActiveEntry(OrvixFileEntry* entry) override
    {
        deactivated.push_back(entry);
        return OrvixFileList::RemoveActiveEntry(entry);
    }

    std::vector<OrvixFileEntry*> deactivated;
};

OrvixFileEntry* Create(OrvixFileList& list, const wchar_t* file, OrvixFileEntry* parent = NoParent)
{
    return list.CreateEntry(file, parent, 1, 0);
}

} // namespace

TEST(FileList, StartsEmpty)
{
    OrvixFileList list;
    EXPECT_EQ(list.NumEntries(), 0u);
    EXPECT_EQ(list.NumRootEntries(), 0u);
    EXPECT_EQ(list.NumActiveEntries(), 0u);
}

TEST(FileList, GivesNullForAnIndexOutOfRange)
{
    OrvixFileList list;
    EXPECT_EQ(list.GetFileEntry(0), nullptr);
    EXPECT_EQ(list.GetRootEntry(0), nullptr);
    EXPECT_EQ(list.GetActiveFileEntry(0), nullptr);
    list.AddActiveEntry(Create(list, L"a"));
    EXPECT_NE(list.GetFileEntry(0), nullptr);
    EXPECT_NE(list.GetRootEntry(0), nullptr);
    EXPECT_NE(list.GetActiveFileEntry(0), nullptr);
    for (const unsigned int index : {1u, UINT_MAX})
    {
        EXPECT_EQ(list.GetFileEntry(index), nullptr);
        EXPECT_EQ(list.GetRootEntry(index), nullptr);
        EXPECT_EQ(list.GetActiveFileEntry(index), nullptr);
    }
}

TEST(FileListCreateEntryFromAPath, TakesTheGivenValues)
{
    OrvixFileList list;
    OrvixFileEntry* entry = list.CreateEntry(L"//server/a.txt", NoParent, 0xFFFFFFFF, -7);
    ASSERT_NE(entry, nullptr);
    EXPECT_STREQ(entry->GetFile(), L"\\\\server/a.txt");
    EXPECT_EQ(entry->GetFlagsIn(), 0xFFFFFFFF);
    EXPECT_EQ(entry->GetFlagsOut(), 0u);
    EXPECT_EQ(entry->GetClientPtr(), -7);
    EXPECT_EQ(entry->GetParent(), nullptr);
    EXPECT_EQ(entry->NumChildren(), 0u);
    EXPECT_EQ(entry->NumAttachments(), 0u);
}

TEST(FileListCreateEntryFromAPath, MakesARootWithoutAParent)
{
    OrvixFileList list;
    OrvixFileEntry* a = Create(list, L"a");
    OrvixFileEntry* b = Create(list, L"b");
    EXPECT_EQ(list.NumEntries(), 2u);
    EXPECT_EQ(list.GetFileEntry(0), a);
    EXPECT_EQ(list.GetFileEntry(1), b);
    EXPECT_EQ(list.NumRootEntries(), 2u);
    EXPECT_EQ(list.GetRootEntry(0), a);
    EXPECT_EQ(list.GetRootEntry(1), b);
    EXPECT_EQ(list.NumActiveEntries(), 0u);
}

TEST(FileListCreateEntryFromAPath, MakesAChildOfItsParentAndNoRoot)
{
    OrvixFileList list;
    OrvixFileEntry* parent = Create(list, L"parent");
    OrvixFileEntry* child = Create(list, L"child", parent);
    EXPECT_EQ(child->GetParent(), parent);
    ASSERT_EQ(parent->NumChildren(), 1u);
    EXPECT_EQ(parent->GetChild(0), child);
    EXPECT_EQ(list.NumEntries(), 2u);
    EXPECT_EQ(list.NumRootEntries(), 1u);
}

TEST(FileListCreateEntryFromAPath, TakesAParentOfAnotherOwner)
{
    OrvixFileEntry parent;
    OrvixFileList list;
    OrvixFileEntry* child = Create(list, L"child", &parent);
    EXPECT_EQ(parent.GetChild(0), child);
    EXPECT_EQ(list.NumRootEntries(), 0u);
    EXPECT_EQ(list.NumEntries(), 1u);
}

TEST(FileListCreateEntryFromAPath, CreatesNothingForNull)
{
    OrvixFileList list;
    OrvixFileEntry* parent = Create(list, L"parent");
    const long blocks = BraeDiagnostics::LiveBlocks();
    EXPECT_EQ(list.CreateEntry(nullptr, parent, 1, 1), nullptr);
    EXPECT_EQ(list.CreateEntry(nullptr, NoParent, 1, 1), nullptr);
    EXPECT_EQ(list.NumEntries(), 1u);
    EXPECT_EQ(list.NumRootEntries(), 1u);
    EXPECT_EQ(parent->NumChildren(), 0u);
    EXPECT_EQ(BraeDiagnostics::LiveBlocks(), blocks);
}

TEST(FileListCreateEntryFromAPath, LinksThroughTheParentsOwnAddChildWhateverItAnswers)
{
    ClosedParent parent;
    OrvixFileList list;
    OrvixFileEntry* child = Create(list, L"child", &parent);
    ASSERT_NE(child, nullptr);
    EXPECT_EQ(parent.offered, std::vector{child});
    EXPECT_EQ(child->GetParent(), &parent);
    EXPECT_EQ(list.NumEntries(), 1u);
    EXPECT_EQ(list.GetFileEntry(0), child);
    EXPECT_EQ(list.NumRootEntries(), 0u);
}

TEST(FileListCreateEntryFromAnEntry, CopiesPathFlagsAndClientValue)
{
    OrvixFileList list;
    OrvixFileEntry* source = list.CreateEntry(L"a path longer than a short text.txt", NoParent, 1, 3);
    source->SetFlagsOut(2);
    OrvixFileEntry* copy = list.CreateEntry(*source);
    ASSERT_NE(copy, nullptr);
    EXPECT_NE(copy, source);
    source->SetFile(L"changed");
    EXPECT_STREQ(copy->GetFile(), L"a path longer than a short text.txt");
    EXPECT_EQ(copy->GetFlagsIn(), 1u);
    EXPECT_EQ(copy->GetFlagsOut(), 2u);
    EXPECT_EQ(copy->GetClientPtr(), 3);
}

TEST(FileListCreateEntryFromAnEntry, MakesARootOfACopyWithoutAParent)
{
    OrvixFileList list;
    OrvixFileEntry source;
    OrvixFileEntry* copy = list.CreateEntry(source);
    EXPECT_EQ(list.NumEntries(), 1u);
    EXPECT_EQ(list.GetFileEntry(0), copy);
    EXPECT_EQ(list.NumRootEntries(), 1u);
    EXPECT_EQ(list.GetRootEntry(0), copy);
    EXPECT_EQ(list.NumActiveEntries(), 0u);
}

TEST(FileListCreateEntryFromAnEntry, MakesASiblingOfASourceThatHasAParent)
{
    OrvixFileList list;
    OrvixFileEntry* parent = Create(list, L"parent");
    OrvixFileEntry* source = Create(list, L"source", parent);
    OrvixFileEntry* copy = list.CreateEntry(*source);
    EXPECT_EQ(copy->GetParent(), parent);
    ASSERT_EQ(parent->NumChildren(), 2u);
    EXPECT_EQ(parent->GetChild(0), source);
    EXPECT_EQ(parent->GetChild(1), copy);
    EXPECT_EQ(list.NumRootEntries(), 1u);
    EXPECT_EQ(list.NumEntries(), 3u);
}

TEST(FileListCreateEntryFromAnEntry, SharesTheSourcesChildrenWhichKeepTheirParent)
{
    OrvixFileList list;
    OrvixFileEntry* source = Create(list, L"source");
    OrvixFileEntry* first = Create(list, L"first", source);
    OrvixFileEntry* second = Create(list, L"second", source);
    OrvixFileEntry* copy = list.CreateEntry(*source);
    ASSERT_EQ(copy->NumChildren(), 2u);
    EXPECT_EQ(copy->GetChild(0), first);
    EXPECT_EQ(copy->GetChild(1), second);
    EXPECT_EQ(first->GetParent(), source);
    EXPECT_EQ(source->NumChildren(), 2u);
    EXPECT_EQ(list.NumEntries(), 4u);
}

TEST(FileListCreateEntryFromAnEntry, CopiesAttachmentsOneLevelDeep)
{
    OrvixFileList list;
    OrvixFileEntry parent;
    OrvixFileEntry source;
    source.AddAttachment(L"first", &parent, 1, 2);
    source.AddAttachment(L"second", NoParent, 3, 4);
    source.GetAttachment(0)->SetFlagsOut(5);
    source.GetAttachment(0)->AddAttachment(L"inner", NoParent, 0, 0);
    OrvixFileEntry* copy = list.CreateEntry(source);
    ASSERT_EQ(copy->NumAttachments(), 2u);
    OrvixFileEntry* attachment = copy->GetAttachment(0);
    EXPECT_NE(attachment, source.GetAttachment(0));
    EXPECT_STREQ(attachment->GetFile(), L"first");
    EXPECT_EQ(attachment->GetParent(), &parent);
    EXPECT_EQ(attachment->GetFlagsIn(), 1u);
    EXPECT_EQ(attachment->GetClientPtr(), 2);
    EXPECT_EQ(attachment->GetFlagsOut(), 5u);
    EXPECT_EQ(attachment->NumAttachments(), 0u);
    EXPECT_STREQ(copy->GetAttachment(1)->GetFile(), L"second");
    EXPECT_EQ(list.NumEntries(), 1u);
    EXPECT_EQ(list.NumRootEntries(), 1u);
}

TEST(FileListCreateEntryFromAnEntry, ReadsTheSourceThroughItsVirtualGettersInOrder)
{
    OrvixFileEntry parent;
    RecordingSource source(&parent);
    source.attachments[1].SetFile(L"attached");
    OrvixFileList list;
    OrvixFileEntry* copy = list.CreateEntry(source);
    ASSERT_NE(copy, nullptr);
    EXPECT_EQ(source.asked, (std::vector<std::string>{"file", "flags in", "flags out", "client value", "parent",
                                                      "child 0", "child 1", "attachment 0", "attachment 1"}));
    EXPECT_STREQ(copy->GetFile(), L"\\\\host/computed.txt");
    EXPECT_EQ(copy->GetFlagsIn(), 0x11u);
    EXPECT_EQ(copy->GetFlagsOut(), 0x22u);
    EXPECT_EQ(copy->GetClientPtr(), 0x3333333333);
    EXPECT_EQ(copy->GetParent(), &parent);
    ASSERT_EQ(copy->NumChildren(), 2u);
    EXPECT_EQ(copy->GetChild(1), &source.children[1]);
    ASSERT_EQ(copy->NumAttachments(), 2u);
    EXPECT_STREQ(copy->GetAttachment(1)->GetFile(), L"attached");
    EXPECT_EQ(parent.GetChild(0), copy);
    EXPECT_EQ(list.NumRootEntries(), 0u);
}

TEST(FileListCreateEntryFromAnEntry, LinksThroughTheParentsOwnAddChildWhateverItAnswers)
{
    ClosedParent parent;
    OrvixFileList list;
    OrvixFileEntry source;
    source.SetParent(&parent);
    OrvixFileEntry* copy = list.CreateEntry(source);
    ASSERT_NE(copy, nullptr);
    EXPECT_EQ(parent.offered, std::vector{copy});
    EXPECT_EQ(list.NumEntries(), 1u);
}

TEST(FileListCreateEntryFromAPath, KeepsTheEntryWhoseParentCreatesAnotherOneMeanwhile)
{
    struct BusyParent : OrvixFileEntry
    {
        unsigned int AddChild(OrvixFileEntry* child) override
        {
            if (list != nullptr)
            {
                OrvixFileList* one = std::exchange(list, nullptr);
                other = one->CreateEntry(L"other", nullptr, 0, 0);
            }
            OrvixFileEntry::AddChild(child);
            return 0;
        }
        OrvixFileList* list = nullptr;
        OrvixFileEntry* other = nullptr;
    };
    BusyParent parent;
    OrvixFileList list;
    parent.list = &list;
    OrvixFileEntry* child = Create(list, L"child", &parent);
    ASSERT_NE(child, nullptr);
    EXPECT_STREQ(child->GetFile(), L"child");
    ASSERT_EQ(list.NumEntries(), 2u);
    EXPECT_EQ(list.GetFileEntry(0), child);
    EXPECT_EQ(list.GetFileEntry(1), parent.other);
}

TEST(FileListCreateEntryFromAnEntry, CopiesAnEntryThatIsItsOwnChild)
{
    OrvixFileList list;
    OrvixFileEntry source;
    source.AddChild(&source);
    OrvixFileEntry* copy = list.CreateEntry(source);
    ASSERT_EQ(copy->NumChildren(), 1u);
    EXPECT_EQ(copy->GetChild(0), &source);
}

TEST(FileListRemoveEntryByIndex, GivesFalseOutOfRange)
{
    OrvixFileList list;
    EXPECT_FALSE(list.RemoveEntry(0u));
    Create(list, L"a");
    EXPECT_FALSE(list.RemoveEntry(1u));
    EXPECT_FALSE(list.RemoveEntry(UINT_MAX));
    EXPECT_EQ(list.NumEntries(), 1u);
}

TEST(FileListRemoveEntryByIndex, DeletesTheEntryWithItsAttachmentsAndClosesTheGap)
{
    OrvixFileList list;
    OrvixFileEntry* a = Create(list, L"a");
    OrvixFileEntry* b = Create(list, L"b");
    OrvixFileEntry* c = Create(list, L"c");
    const long blocks = BraeDiagnostics::LiveBlocks();
    b->AddAttachment(L"attached", NoParent, 0, 0);
    EXPECT_TRUE(list.RemoveEntry(1u));
    EXPECT_EQ(BraeDiagnostics::LiveBlocks(), blocks - 1);
    ASSERT_EQ(list.NumEntries(), 2u);
    EXPECT_EQ(list.GetFileEntry(0), a);
    EXPECT_EQ(list.GetFileEntry(1), c);
    ASSERT_EQ(list.NumRootEntries(), 2u);
    EXPECT_EQ(list.GetRootEntry(1), c);
}

TEST(FileListRemoveEntryByIndex, LeavesChildrenOfARemovedRootInTheList)
{
    OrvixFileList list;
    OrvixFileEntry* root = Create(list, L"root");
    OrvixFileEntry* first = Create(list, L"first", root);
    OrvixFileEntry* second = Create(list, L"second", root);
    list.BuildActiveList(1, false);
    EXPECT_TRUE(list.RemoveEntry(0u));
    EXPECT_EQ(list.NumEntries(), 2u);
    EXPECT_EQ(list.GetFileEntry(0), first);
    EXPECT_EQ(list.GetFileEntry(1), second);
    EXPECT_EQ(list.NumRootEntries(), 0u);
    EXPECT_EQ(first->GetParent(), root);
    EXPECT_EQ(second->GetParent(), root);
    EXPECT_EQ(list.NumActiveEntries(), 2u);
    EXPECT_EQ(list.BuildActiveList(1, true), 0u);
    EXPECT_EQ(list.BuildActiveList(1, false), 2u);
}

TEST(FileListRemoveEntryByIndex, UnlinksAnInnerEntryAndLeavesItsChildrenUnreachable)
{
    OrvixFileList list;
    OrvixFileEntry* root = Create(list, L"root");
    OrvixFileEntry* inner = Create(list, L"inner", root);
    OrvixFileEntry* leaf = Create(list, L"leaf", inner);
    EXPECT_TRUE(list.RemoveEntry(inner));
    EXPECT_EQ(root->NumChildren(), 0u);
    EXPECT_EQ(leaf->GetParent(), inner);
    EXPECT_EQ(list.NumRootEntries(), 1u);
    EXPECT_EQ(list.BuildActiveList(1, true), 1u);
}

TEST(FileListRemoveEntryByIndex, TakesTheFirstOccurrenceOutOfAChildrenSequence)
{
    OrvixFileList list;
    OrvixFileEntry* root = Create(list, L"root");
    OrvixFileEntry* removed = Create(list, L"removed", root);
    OrvixFileEntry* other = Create(list, L"other", root);
    root->AddChild(removed);
    list.RemoveEntry(removed);
    ASSERT_EQ(root->NumChildren(), 2u);
    EXPECT_EQ(root->GetChild(0), other);
    EXPECT_EQ(root->GetChild(1), removed);
}

TEST(FileListRemoveEntryByIndex, WalksEachSequenceDepthFirstAndStopsItAtTheRemovedChild)
{
    OrvixFileList list;
    OrvixFileEntry* root = Create(list, L"root");
    OrvixFileEntry* before = Create(list, L"before", root);
    OrvixFileEntry* removed = Create(list, L"removed", root);
    OrvixFileEntry* after = Create(list, L"after", root);
    OrvixFileEntry* deep = Create(list, L"deep", before);
    OrvixFileEntry* afterDeep = Create(list, L"after deep", before);
    before->AddChild(removed);
    deep->AddChild(removed);
    afterDeep->AddChild(removed);
    after->AddChild(removed);

    EXPECT_TRUE(list.RemoveEntry(removed));
    EXPECT_EQ(deep->NumChildren(), 0u) << "an earlier sibling's children are walked";
    EXPECT_EQ(afterDeep->NumChildren(), 0u) << "a removal further down does not end the walk above it";
    EXPECT_EQ(before->NumChildren(), 2u) << "and is followed by the rest of the sequence above";
    EXPECT_EQ(root->NumChildren(), 2u);
    EXPECT_EQ(after->NumChildren(), 1u) << "a sibling after the removed child is not visited";
}

TEST(FileListRemoveEntryByIndex, WalksEveryRoot)
{
    OrvixFileList list;
    OrvixFileEntry* first = Create(list, L"first");
    OrvixFileEntry* second = Create(list, L"second");
    OrvixFileEntry* removed = Create(list, L"removed", first);
    second->AddChild(removed);
    EXPECT_TRUE(list.RemoveEntry(removed));
    EXPECT_EQ(first->NumChildren(), 0u);
    EXPECT_EQ(second->NumChildren(), 0u);
}

TEST(FileListRemoveEntryByIndex, UnlinksARootFromTheTreesOfOtherRoots)
{
    OrvixFileList list;
    OrvixFileEntry* removed = Create(list, L"removed");
    OrvixFileEntry* other = Create(list, L"other");
    other->AddChild(removed);
    EXPECT_TRUE(list.RemoveEntry(removed));
    EXPECT_EQ(other->NumChildren(), 0u);
    EXPECT_EQ(list.NumRootEntries(), 1u);
    EXPECT_EQ(list.GetRootEntry(0), other);
}

TEST(FileListRemoveEntryByIndex, LeavesLinksThatNoRootReaches)
{
    OrvixFileEntry parent;
    OrvixFileList list;
    OrvixFileEntry* removed = Create(list, L"removed", &parent);
    EXPECT_TRUE(list.RemoveEntry(removed));
    EXPECT_EQ(parent.NumChildren(), 1u);
    EXPECT_EQ(parent.GetChild(0), removed);
}

TEST(FileListRemoveEntryByIndex, DoesNotSearchBelowTheRemovedEntry)
{
    OrvixFileList list;
    OrvixFileEntry* root = Create(list, L"root");
    OrvixFileEntry* removed = Create(list, L"removed", root);
    OrvixFileEntry* child = Create(list, L"child", removed);
    child->AddChild(removed);
    EXPECT_TRUE(list.RemoveEntry(removed));
    EXPECT_EQ(child->NumChildren(), 1u);
}

TEST(FileListRemoveEntryByIndex, ReachesChildrenThroughVirtualOperationsOnly)
{
    HostFolder folder;
    OrvixFileEntry sibling;
    OrvixFileList list;
    OrvixFileEntry* root = Create(list, L"root");
    OrvixFileEntry* removed = Create(list, L"removed");
    root->AddChild(&folder);
    folder.content = {&sibling, removed};
    EXPECT_TRUE(list.RemoveEntry(removed));
    EXPECT_EQ(folder.removed, std::vector<unsigned int>{1});
    EXPECT_EQ(folder.content, std::vector<OrvixFileEntry*>{&sibling});
}

TEST(FileListRemoveEntryByIndex, TakesTheEntryOffTheActiveListThroughTheVirtualOperation)
{
    ActiveRecordingList list;
    OrvixFileEntry* a = Create(list, L"a");
    OrvixFileEntry* b = Create(list, L"b");
    list.BuildActiveList(1, false);
    EXPECT_TRUE(list.RemoveEntry(0u));
    EXPECT_EQ(list.deactivated, std::vector<OrvixFileEntry*>{a});
    ASSERT_EQ(list.NumActiveEntries(), 1u);
    EXPECT_EQ(list.GetActiveFileEntry(0), b);
}

TEST(FileListRemoveEntryByIndex, TakesOneOccurrenceOffTheActiveList)
{
    OrvixFileList list;
    OrvixFileEntry* a = Create(list, L"a");
    OrvixFileEntry* b = Create(list, L"b");
    for (OrvixFileEntry* entry : {a, b, a})
    {
        list.AddActiveEntry(entry);
    }
    list.RemoveEntry(a);
    ASSERT_EQ(list.NumActiveEntries(), 2u);
    EXPECT_EQ(list.GetActiveFileEntry(0), b);
    EXPECT_EQ(list.GetActiveFileEntry(1), a);
}

TEST(FileListRemoveEntryByPointer, RemovesThatEntry)
{
    OrvixFileList list;
    OrvixFileEntry* a = Create(list, L"a");
    OrvixFileEntry* b = Create(list, L"b");
    EXPECT_TRUE(list.RemoveEntry(a));
    ASSERT_EQ(list.NumEntries(), 1u);
    EXPECT_EQ(list.GetFileEntry(0), b);
}

TEST(FileListRemoveEntryByPointer, ChangesNothingForAnEntryThatTheListDoesNotHold)
{
    OrvixFileEntry stranger;
    OrvixFileList list;
    EXPECT_FALSE(list.RemoveEntry(&stranger));
    OrvixFileEntry* root = Create(list, L"root");
    root->AddChild(&stranger);
    list.AddActiveEntry(&stranger);
    EXPECT_FALSE(list.RemoveEntry(&stranger));
    EXPECT_FALSE(list.RemoveEntry(NoParent));
    EXPECT_EQ(list.NumEntries(), 1u);
    EXPECT_EQ(list.NumRootEntries(), 1u);
    EXPECT_EQ(list.NumActiveEntries(), 1u);
    EXPECT_EQ(root->NumChildren(), 1u);
}

TEST(FileListRemoveEntryByPointer, GoesThroughTheOperationByIndex)
{
    RecordingList list;
    Create(list, L"a");
    OrvixFileEntry* b = Create(list, L"b");
    EXPECT_TRUE(list.RemoveEntry(b));
    list.answer = false;
    EXPECT_FALSE(list.RemoveEntry(b));
    EXPECT_EQ(list.removed, (std::vector<unsigned int>{1, 1}));
}

TEST(FileListRemoveEntryByPointer, PassesTheCountForAnEntryThatIsNotThere)
{
    RecordingList list;
    OrvixFileEntry stranger;
    list.RemoveEntry(&stranger);
    Create(list, L"a");
    Create(list, L"b");
    list.RemoveEntry(&stranger);
    EXPECT_EQ(list.removed, (std::vector<unsigned int>{0, 2}));
}

TEST(FileListRemoveAll, DeletesEveryEntryAndEmptiesRootsAndActiveList)
{
    OrvixFileList list;
    const long blocks = BraeDiagnostics::LiveBlocks();
    EXPECT_TRUE(list.RemoveAll());
    OrvixFileEntry* root = Create(list, L"root");
    Create(list, L"child", root)->AddAttachment(L"attached", NoParent, 0, 0);
    list.BuildActiveList(1, true);
    EXPECT_EQ(BraeDiagnostics::LiveBlocks(), blocks + 3);
    EXPECT_TRUE(list.RemoveAll());
    EXPECT_EQ(list.NumEntries(), 0u);
    EXPECT_EQ(list.NumRootEntries(), 0u);
    EXPECT_EQ(list.NumActiveEntries(), 0u);
    EXPECT_EQ(BraeDiagnostics::LiveBlocks(), blocks);
    EXPECT_NE(Create(list, L"again"), nullptr);
}

TEST(FileListRemoveAll, LeavesEntriesOfOtherOwnersAlive)
{
    auto* active = new OrvixFileEntry;
    auto* child = new OrvixFileEntry;
    OrvixFileList list;
    const long blocks = BraeDiagnostics::LiveBlocks();
    Create(list, L"root")->AddChild(child);
    list.AddActiveEntry(active);
    list.RemoveAll();
    EXPECT_EQ(BraeDiagnostics::LiveBlocks(), blocks);
    EXPECT_EQ(list.NumActiveEntries(), 0u);
    delete active;
    delete child;
}

TEST(FileListDestructor, DeletesEveryEntryOnTheHostsHeap)
{
    const long blocks = BraeDiagnostics::LiveBlocks();
    const long foreignFrees = BraeDiagnostics::ForeignFrees();
    {
        OrvixFileEntry source;
        source.AddAttachment(L"attached", NoParent, 0, 0);
        OrvixFileList list;
        list.CreateEntry(source);
        Create(list, L"child", Create(list, L"root"));
        list.BuildActiveList(1, true);
        EXPECT_EQ(BraeDiagnostics::LiveBlocks(), blocks + 5);
    }
    EXPECT_EQ(BraeDiagnostics::LiveBlocks(), blocks);
    EXPECT_EQ(BraeDiagnostics::ForeignFrees(), foreignFrees);
}

namespace
{

constexpr unsigned int Depth = 200'000;

OrvixFileEntry* CreateDeepTree(OrvixFileList& list)
{
    OrvixFileEntry* deepest = nullptr;
    for (unsigned int n = 0; n < Depth; ++n)
    {
        deepest = Create(list, L"f", deepest);
    }
    return deepest;
}

} // namespace

TEST(DeepTree, IsSearchedToItsEndForARemovedEntry)
{
    OrvixFileList list;
    OrvixFileEntry* deepest = CreateDeepTree(list);
    OrvixFileEntry* other = Create(list, L"other");
    deepest->AddChild(other);
    bool removed = false;
    ASSERT_TRUE(ComesBack([&] { removed = list.RemoveEntry(other); }));
    EXPECT_TRUE(removed);
    EXPECT_EQ(deepest->NumChildren(), 0u);
    EXPECT_EQ(list.NumEntries(), Depth);
}

TEST(DeepTree, BecomesAnActiveListFromTheDeepestPlaceUp)
{
    OrvixFileList list;
    CreateDeepTree(list);
    unsigned int count = 0;
    ASSERT_TRUE(ComesBack([&] { count = list.BuildActiveList(1, true); }));
    ASSERT_EQ(count, Depth);
    for (unsigned int n = 0; n < Depth; ++n)
    {
        ASSERT_EQ(list.GetActiveFileEntry(n), list.GetFileEntry(Depth - 1 - n));
    }
}
