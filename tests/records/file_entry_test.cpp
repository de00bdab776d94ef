#include "BraeDiagnostics.h"
#include "OrvixFileEntry.h"

#include <gtest/gtest.h>

#include <array>
#include <climits>
#include <string>

namespace
{

/// A file of the host's own making, whose values come from its getters and are nowhere else.
class ComputedEntry : public OrvixFileEntry
{
public:
    explicit ComputedEntry(OrvixFileEntry* parent) : m_computedParent(parent) {}

    const wchar_t* GetFile() override { return L"//host/computed.txt"; }
    unsigned long GetFlagsIn() override { return 0x11; }
    unsigned long GetFlagsOut() override { return 0x22; }
    long long GetClientPtr() override { return 0x3333333333; }
    OrvixFileEntry* GetParent() override { return m_computedParent; }

private:
    OrvixFileEntry* m_computedParent;
};

} // namespace

TEST(FileEntry, StartsWithAnEmptyPathAndWithoutFlagsOrRelatives)
{
    OrvixFileEntry entry;
    EXPECT_STREQ(entry.GetFile(), L"");
    EXPECT_EQ(entry.GetFlagsIn(), 0u);
    EXPECT_EQ(entry.GetFlagsOut(), 0u);
    EXPECT_EQ(entry.GetClientPtr(), 0);
    EXPECT_EQ(entry.NumChildren(), 0u);
    EXPECT_EQ(entry.GetParent(), nullptr);
    EXPECT_EQ(entry.NumAttachments(), 0u);
}

TEST(FileEntry, KeepsEveryValueApartFromTheOthers)
{
    OrvixFileEntry entry;
    OrvixFileEntry parent;
    entry.SetFile(L"a.txt");
    entry.SetFlagsIn(0xFFFFFFFF);
    entry.SetFlagsOut(0x80000001);
    entry.SetClientPtr(LLONG_MIN);
    entry.SetParent(&parent);
    EXPECT_STREQ(entry.GetFile(), L"a.txt");
    EXPECT_EQ(entry.GetFlagsIn(), 0xFFFFFFFF);
    EXPECT_EQ(entry.GetFlagsOut(), 0x80000001);
    EXPECT_EQ(entry.GetClientPtr(), LLONG_MIN);
    EXPECT_EQ(entry.GetParent(), &parent);
}

TEST(FileEntrySetFile, CopiesTheText)
{
    OrvixFileEntry entry;
    std::wstring path = L"C:\\project\\a long enough path.txt";
    const std::wstring original = path;
    entry.SetFile(path.c_str());
    path.assign(path.size(), L'x');
    EXPECT_EQ(entry.GetFile(), original);
}

TEST(FileEntrySetFile, KeepsThePreviousPathForNull)
{
    OrvixFileEntry entry;
    entry.SetFile(L"a.txt");
    entry.SetFile(nullptr);
    EXPECT_STREQ(entry.GetFile(), L"a.txt");
}

TEST(FileEntrySetFile, EmptiesThePathForAnEmptyText)
{
    OrvixFileEntry entry;
    entry.SetFile(L"a.txt");
    entry.SetFile(L"");
    EXPECT_STREQ(entry.GetFile(), L"");
}

TEST(FileEntrySetFile, TakesATextThatIsPartOfItsOwn)
{
    OrvixFileEntry entry;
    entry.SetFile(L"C:\\a folder with a longer name\\file.txt");
    entry.SetFile(entry.GetFile() + 3);
    EXPECT_STREQ(entry.GetFile(), L"a folder with a longer name\\file.txt");
    entry.SetFile(entry.GetFile());
    EXPECT_STREQ(entry.GetFile(), L"a folder with a longer name\\file.txt");
}

TEST(FileEntrySetFile, DoesNotLimitTheLength)
{
    OrvixFileEntry entry;
    const std::wstring path(1'000'000, L'p');
    entry.SetFile(path.c_str());
    EXPECT_EQ(entry.GetFile(), path);
}

struct PathRule
{
    const wchar_t* given;
    const wchar_t* stored;
};

class LeadingDoubleSlash : public testing::TestWithParam<PathRule>
{
};

TEST_P(LeadingDoubleSlash, IsAppliedBySetFile)
{
    OrvixFileEntry entry;
    entry.SetFile(GetParam().given);
    EXPECT_STREQ(entry.GetFile(), GetParam().stored);
}

TEST_P(LeadingDoubleSlash, IsAppliedToAnAttachmentsPath)
{
    OrvixFileEntry entry;
    entry.AddAttachment(GetParam().given, nullptr, 0, 0);
    EXPECT_STREQ(entry.GetAttachment(0)->GetFile(), GetParam().stored);
}

INSTANTIATE_TEST_SUITE_P(Paths, LeadingDoubleSlash,
                         testing::Values(PathRule{L"//server/share/a.txt", L"\\\\server/share/a.txt"},
                                         PathRule{L"//x", L"\\\\x"}, PathRule{L"//", L"//"}, PathRule{L"/", L"/"},
                                         PathRule{L"", L""}, PathRule{L"///", L"\\\\/"}, PathRule{L"/x/", L"/x/"},
                                         PathRule{L"x//y", L"x//y"}, PathRule{L"/\\x", L"/\\x"},
                                         PathRule{L"\\/x", L"\\/x"}, PathRule{L"\\\\x//y", L"\\\\x//y"},
                                         PathRule{L"C:/a//b", L"C:/a//b"}),
                         [](const auto& test) { return "Number" + std::to_string(test.index); });

TEST(FileEntrySetFile, LeavesTheCallersBufferAlone)
{
    OrvixFileEntry entry;
    const wchar_t path[] = L"//server/a.txt";
    entry.SetFile(path);
    entry.AddAttachment(path, nullptr, 0, 0);
    EXPECT_STREQ(path, L"//server/a.txt");
}

TEST(FileEntryChildren, AreKeptInTheOrderAddedAndCounted)
{
    OrvixFileEntry parent;
    OrvixFileEntry a;
    OrvixFileEntry b;
    EXPECT_EQ(parent.AddChild(&a), 1u);
    EXPECT_EQ(parent.AddChild(&b), 2u);
    EXPECT_EQ(parent.NumChildren(), 2u);
    EXPECT_EQ(parent.GetChild(0), &a);
    EXPECT_EQ(parent.GetChild(1), &b);
}

TEST(FileEntryChildren, MayBeAddedTwice)
{
    OrvixFileEntry parent;
    OrvixFileEntry child;
    parent.AddChild(&child);
    EXPECT_EQ(parent.AddChild(&child), 2u);
    EXPECT_EQ(parent.GetChild(1), &child);
}

TEST(FileEntryChildren, AddingNullGivesZeroAndChangesNothing)
{
    OrvixFileEntry parent;
    OrvixFileEntry child;
    EXPECT_EQ(parent.AddChild(nullptr), 0u);
    parent.AddChild(&child);
    EXPECT_EQ(parent.AddChild(nullptr), 0u);
    EXPECT_EQ(parent.NumChildren(), 1u);
}

TEST(FileEntryChildren, AddingOneLeavesItsParentLinkAlone)
{
    OrvixFileEntry parent;
    OrvixFileEntry other;
    OrvixFileEntry child;
    child.SetParent(&other);
    parent.AddChild(&child);
    EXPECT_EQ(child.GetParent(), &other);
}

TEST(FileEntryChildren, GivesNullForAnIndexOutOfRange)
{
    OrvixFileEntry parent;
    OrvixFileEntry child;
    EXPECT_EQ(parent.GetChild(0), nullptr);
    parent.AddChild(&child);
    EXPECT_EQ(parent.GetChild(1), nullptr);
    EXPECT_EQ(parent.GetChild(UINT_MAX), nullptr);
}

TEST(FileEntryChildren, RemovingOneMovesTheLaterOnesDown)
{
    OrvixFileEntry parent;
    std::array<OrvixFileEntry, 3> children;
    for (OrvixFileEntry& child : children)
    {
        parent.AddChild(&child);
    }
    EXPECT_TRUE(parent.RemoveChild(0));
    ASSERT_EQ(parent.NumChildren(), 2u);
    EXPECT_EQ(parent.GetChild(0), &children[1]);
    EXPECT_EQ(parent.GetChild(1), &children[2]);
}

TEST(FileEntryChildren, RemovingOneNeitherDeletesItNorItsParentLink)
{
    OrvixFileEntry parent;
    auto* child = new OrvixFileEntry;
    child->SetParent(&parent);
    parent.AddChild(child);
    const long blocks = BraeDiagnostics::LiveBlocks();
    parent.RemoveChild(0);
    EXPECT_EQ(BraeDiagnostics::LiveBlocks(), blocks);
    EXPECT_EQ(child->GetParent(), &parent);
    delete child;
}

TEST(FileEntryChildren, RemovingOutOfRangeGivesFalse)
{
    OrvixFileEntry parent;
    OrvixFileEntry child;
    EXPECT_FALSE(parent.RemoveChild(0));
    parent.AddChild(&child);
    EXPECT_FALSE(parent.RemoveChild(1));
    EXPECT_FALSE(parent.RemoveChild(UINT_MAX));
    EXPECT_EQ(parent.NumChildren(), 1u);
}

TEST(FileEntryChildren, RemovingAllUnlinksWithoutDeleting)
{
    OrvixFileEntry parent;
    auto* child = new OrvixFileEntry;
    child->SetParent(&parent);
    parent.AddChild(child);
    const long blocks = BraeDiagnostics::LiveBlocks();
    EXPECT_TRUE(parent.RemoveAllChildren());
    EXPECT_TRUE(parent.RemoveAllChildren());
    EXPECT_EQ(parent.NumChildren(), 0u);
    EXPECT_EQ(BraeDiagnostics::LiveBlocks(), blocks);
    EXPECT_EQ(child->GetParent(), &parent);
    delete child;
}

TEST(FileEntryChildren, OutliveTheirParent)
{
    auto* parent = new OrvixFileEntry;
    auto* child = new OrvixFileEntry;
    parent->AddChild(child);
    const long blocks = BraeDiagnostics::LiveBlocks();
    delete parent;
    EXPECT_EQ(BraeDiagnostics::LiveBlocks(), blocks - 1);
    delete child;
}

TEST(FileEntryParent, IsALinkThatLeavesTheParentsChildrenAlone)
{
    OrvixFileEntry parent;
    OrvixFileEntry child;
    child.SetParent(&parent);
    EXPECT_EQ(parent.NumChildren(), 0u);
    child.SetParent(nullptr);
    EXPECT_EQ(child.GetParent(), nullptr);
}

TEST(FileEntryAttachmentOfAnEntry, CopiesPathFlagsClientValueAndParentLink)
{
    OrvixFileEntry owner;
    OrvixFileEntry parent;
    OrvixFileEntry source;
    source.SetFile(L"source.txt");
    source.SetFlagsIn(1);
    source.SetFlagsOut(2);
    source.SetClientPtr(3);
    source.SetParent(&parent);
    EXPECT_EQ(owner.AddAttachment(&source), 1u);
    EXPECT_EQ(owner.AddAttachment(&source), 2u);
    OrvixFileEntry* copy = owner.GetAttachment(1);
    ASSERT_NE(copy, nullptr);
    EXPECT_NE(copy, &source);
    EXPECT_STREQ(copy->GetFile(), L"source.txt");
    EXPECT_EQ(copy->GetFlagsIn(), 1u);
    EXPECT_EQ(copy->GetFlagsOut(), 2u);
    EXPECT_EQ(copy->GetClientPtr(), 3);
    EXPECT_EQ(copy->GetParent(), &parent);
    EXPECT_EQ(parent.NumChildren(), 0u);
}

TEST(FileEntryAttachmentOfAnEntry, ReadsTheSourceThroughItsVirtualGetters)
{
    OrvixFileEntry owner;
    OrvixFileEntry parent;
    ComputedEntry source(&parent);
    EXPECT_EQ(owner.AddAttachment(&source), 1u);
    OrvixFileEntry* copy = owner.GetAttachment(0);
    EXPECT_STREQ(copy->GetFile(), L"\\\\host/computed.txt");
    EXPECT_EQ(copy->GetFlagsIn(), 0x11u);
    EXPECT_EQ(copy->GetFlagsOut(), 0x22u);
    EXPECT_EQ(copy->GetClientPtr(), 0x3333333333);
    EXPECT_EQ(copy->GetParent(), &parent);
}

TEST(FileEntryAttachmentOfAnEntry, CopiesNeitherChildrenNorAttachments)
{
    OrvixFileEntry owner;
    OrvixFileEntry source;
    OrvixFileEntry child;
    source.AddChild(&child);
    source.AddAttachment(L"inner.txt", nullptr, 0, 0);
    owner.AddAttachment(&source);
    EXPECT_EQ(owner.GetAttachment(0)->NumChildren(), 0u);
    EXPECT_EQ(owner.GetAttachment(0)->NumAttachments(), 0u);
}

TEST(FileEntryAttachmentOfAnEntry, IsIndependentOfItsSource)
{
    OrvixFileEntry owner;
    {
        OrvixFileEntry source;
        source.SetFile(L"a path that is longer than a short text.txt");
        owner.AddAttachment(&source);
        source.SetFile(L"changed");
    }
    EXPECT_STREQ(owner.GetAttachment(0)->GetFile(), L"a path that is longer than a short text.txt");
}

TEST(FileEntryAttachmentOfAnEntry, GivesZeroForNull)
{
    OrvixFileEntry owner;
    owner.AddAttachment(L"a.txt", nullptr, 0, 0);
    EXPECT_EQ(owner.AddAttachment(nullptr), 0u);
    EXPECT_EQ(owner.NumAttachments(), 1u);
}

TEST(FileEntryAttachmentOfAnEntry, MayBeACopyOfTheOwnerOrOfItsOwnAttachment)
{
    OrvixFileEntry owner;
    owner.SetFile(L"owner.txt");
    EXPECT_EQ(owner.AddAttachment(&owner), 1u);
    for (unsigned int n = 2; n < 40; ++n)
    {
        ASSERT_EQ(owner.AddAttachment(owner.GetAttachment(0)), n);
    }
    EXPECT_STREQ(owner.GetAttachment(38)->GetFile(), L"owner.txt");
}

TEST(FileEntryAttachmentOfAPath, TakesTheGivenValues)
{
    OrvixFileEntry owner;
    OrvixFileEntry parent;
    EXPECT_EQ(owner.AddAttachment(L"a.txt", &parent, 0xFFFFFFFF, -5), 1u);
    OrvixFileEntry* attachment = owner.GetAttachment(0);
    EXPECT_STREQ(attachment->GetFile(), L"a.txt");
    EXPECT_EQ(attachment->GetFlagsIn(), 0xFFFFFFFF);
    EXPECT_EQ(attachment->GetFlagsOut(), 0u);
    EXPECT_EQ(attachment->GetClientPtr(), -5);
    EXPECT_EQ(attachment->GetParent(), &parent);
    EXPECT_EQ(parent.NumChildren(), 0u);
    EXPECT_EQ(attachment->NumChildren(), 0u);
    EXPECT_EQ(attachment->NumAttachments(), 0u);
}

TEST(FileEntryAttachmentOfAPath, DoesNotGetTheOwnerAsItsParent)
{
    OrvixFileEntry owner;
    owner.AddAttachment(L"a.txt", nullptr, 0, 0);
    EXPECT_EQ(owner.GetAttachment(0)->GetParent(), nullptr);
}

TEST(FileEntryAttachmentOfAPath, GivesZeroForNull)
{
    OrvixFileEntry owner;
    owner.AddAttachment(L"a.txt", nullptr, 0, 0);
    EXPECT_EQ(owner.AddAttachment(nullptr, nullptr, 1, 1), 0u);
    EXPECT_EQ(owner.NumAttachments(), 1u);
}

TEST(FileEntryAttachments, AreKeptInTheOrderAdded)
{
    OrvixFileEntry owner;
    OrvixFileEntry source;
    source.SetFile(L"b");
    EXPECT_EQ(owner.AddAttachment(L"a", nullptr, 0, 0), 1u);
    EXPECT_EQ(owner.AddAttachment(&source), 2u);
    EXPECT_EQ(owner.AddAttachment(L"c", nullptr, 0, 0), 3u);
    EXPECT_EQ(owner.NumAttachments(), 3u);
    EXPECT_STREQ(owner.GetAttachment(0)->GetFile(), L"a");
    EXPECT_STREQ(owner.GetAttachment(1)->GetFile(), L"b");
    EXPECT_STREQ(owner.GetAttachment(2)->GetFile(), L"c");
}

TEST(FileEntryAttachments, GiveNullForAnIndexOutOfRange)
{
    OrvixFileEntry owner;
    EXPECT_EQ(owner.GetAttachment(0), nullptr);
    owner.AddAttachment(L"a", nullptr, 0, 0);
    EXPECT_EQ(owner.GetAttachment(1), nullptr);
    EXPECT_EQ(owner.GetAttachment(UINT_MAX), nullptr);
}

TEST(FileEntryAttachments, RemovingOneDeletesItAndClosesTheGap)
{
    OrvixFileEntry owner;
    for (const wchar_t* name : {L"a", L"b", L"c"})
    {
        owner.AddAttachment(name, nullptr, 0, 0);
    }
    const long blocks = BraeDiagnostics::LiveBlocks();
    EXPECT_TRUE(owner.RemoveAttachment(1));
    EXPECT_EQ(BraeDiagnostics::LiveBlocks(), blocks - 1);
    ASSERT_EQ(owner.NumAttachments(), 2u);
    EXPECT_STREQ(owner.GetAttachment(0)->GetFile(), L"a");
    EXPECT_STREQ(owner.GetAttachment(1)->GetFile(), L"c");
}

TEST(FileEntryAttachments, RemovingOutOfRangeGivesFalse)
{
    OrvixFileEntry owner;
    EXPECT_FALSE(owner.RemoveAttachment(0));
    owner.AddAttachment(L"a", nullptr, 0, 0);
    EXPECT_FALSE(owner.RemoveAttachment(1));
    EXPECT_FALSE(owner.RemoveAttachment(UINT_MAX));
    EXPECT_EQ(owner.NumAttachments(), 1u);
}

TEST(FileEntryAttachments, RemovingAllDeletesThem)
{
    OrvixFileEntry owner;
    const long blocks = BraeDiagnostics::LiveBlocks();
    for (const wchar_t* name : {L"a", L"b", L"c"})
    {
        owner.AddAttachment(name, nullptr, 0, 0);
    }
    EXPECT_EQ(BraeDiagnostics::LiveBlocks(), blocks + 3);
    EXPECT_TRUE(owner.RemoveAllAttachments());
    EXPECT_TRUE(owner.RemoveAllAttachments());
    EXPECT_EQ(owner.NumAttachments(), 0u);
    EXPECT_EQ(BraeDiagnostics::LiveBlocks(), blocks);
}

TEST(FileEntryAttachments, GoWithTheirOwner)
{
    const long blocks = BraeDiagnostics::LiveBlocks();
    {
        OrvixFileEntry owner;
        owner.AddAttachment(L"a", nullptr, 0, 0);
        owner.GetAttachment(0)->AddAttachment(L"b", nullptr, 0, 0);
        EXPECT_EQ(BraeDiagnostics::LiveBlocks(), blocks + 2);
    }
    EXPECT_EQ(BraeDiagnostics::LiveBlocks(), blocks);
}
