#include "BraeDiagnostics.h"
#include "OrvixClientInfo.h"
#include "OrvixExploreProviderParams.h"
#include "OrvixFileEntry.h"
#include "OrvixFileList.h"
#include "OrvixFileListDialogParams.h"
#include "OrvixNotifyParams.h"
#include "OrvixUserEntry.h"
#include "OrvixUserList.h"

#include <gtest/gtest.h>

#include <type_traits>

template <typename Record>
class RecordOnHostHeap : public testing::Test
{
};

using Records = testing::Types<OrvixFileEntry, OrvixFileList, OrvixUserEntry, OrvixUserList, OrvixClientInfo,
                               OrvixFileListDialogParams, OrvixExploreProviderParams, OrvixNotifyParams>;
TYPED_TEST_SUITE(RecordOnHostHeap, Records);

TYPED_TEST(RecordOnHostHeap, TakesOneBlockAndGivesItBack)
{
    const long blocks = BraeDiagnostics::LiveBlocks();
    const long foreignFrees = BraeDiagnostics::ForeignFrees();
    auto* record = new TypeParam;
    EXPECT_EQ(BraeDiagnostics::LiveBlocks(), blocks + 1);
    delete record;
    EXPECT_EQ(BraeDiagnostics::LiveBlocks(), blocks);
    EXPECT_EQ(BraeDiagnostics::ForeignFrees(), foreignFrees);
}

TYPED_TEST(RecordOnHostHeap, TakesOneBlockForAnArray)
{
    const long blocks = BraeDiagnostics::LiveBlocks();
    const long foreignFrees = BraeDiagnostics::ForeignFrees();
    auto* records = new TypeParam[5];
    EXPECT_EQ(BraeDiagnostics::LiveBlocks(), blocks + 1);
    delete[] records;
    EXPECT_EQ(BraeDiagnostics::LiveBlocks(), blocks);
    EXPECT_EQ(BraeDiagnostics::ForeignFrees(), foreignFrees);
}

TYPED_TEST(RecordOnHostHeap, IsNullWhenTheHeapIsExhausted)
{
    BraeDiagnostics::FailAllocation(1, false);
    EXPECT_EQ(new TypeParam, nullptr);
}

TYPED_TEST(RecordOnHostHeap, IsNotCopied)
{
    EXPECT_FALSE(std::is_copy_constructible_v<TypeParam>);
    EXPECT_FALSE(std::is_copy_assignable_v<TypeParam>);
    EXPECT_TRUE(std::has_virtual_destructor_v<TypeParam>);
}
