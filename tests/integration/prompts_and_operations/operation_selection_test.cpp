#include "OperationTest.h"

namespace
{

/// Which entries take part, and what the provider is asked before.
class OperationSelection : public OperationTest
{
};

TEST_F(OperationSelection, AsksTheProviderForTheStateBeforeAnythingElse)
{
    AddFile(L"a");
    m_services->RunFileListOperation(nullptr, &m_params, true, &m_provider, Notify | CheckIn, Controlled);
    EXPECT_EQ(m_log, (Lines{"QueryStatus [a] 0", "Notify 13 [a]", "Dialog [a] 1", "Notify 27 [a]",
                            "CheckIn [a] comment 0", "Notify 14 [a]"}));
}

TEST_F(OperationSelection, SelectsByTheStateThatTheProviderReports)
{
    AddFile(L"a", 0);
    AddFile(L"b", 0x20000);
    m_provider.onCall = [](const std::string& operation, OrvixFileList& list) {
        if (operation != "QueryStatus")
        {
            return;
        }
        list.GetActiveFileEntry(0)->SetFlagsOut(0x20000);
        list.GetActiveFileEntry(1)->SetFlagsOut(0x1);
    };
    EXPECT_EQ(m_services->RunFileListOperation(nullptr, &m_params, true, &m_provider, CheckOut, 0x20000), 1);
    EXPECT_EQ(m_log, (Lines{"QueryStatus [a b] 0", "Dialog [a] 1", "CheckOut [a] comment 0"}));
}

TEST_F(OperationSelection, GoesOnWithTheOldStateWhereTheProviderFailsToReport)
{
    AddFile(L"a");
    m_provider.result = -1;
    EXPECT_EQ(m_services->RunFileListOperation(nullptr, &m_params, true, &m_provider, CheckIn, Controlled), 1);
    EXPECT_EQ(m_log, (Lines{"QueryStatus [a] 0", "Dialog [a] 1", "CheckIn [a] comment 0"}));
}

TEST_F(OperationSelection, DoesNotAskTheProviderUnlessTold)
{
    AddFile(L"a");
    Run(CheckIn);
    EXPECT_EQ(m_log, (Lines{"Dialog [a] 1", "CheckIn [a] comment 0"}));
}

TEST_F(OperationSelection, IsDoneAtOnceWithAnEmptyActiveList)
{
    m_list.CreateEntry(L"a", nullptr, 0, 0)->SetFlagsOut(Controlled);
    EXPECT_EQ(Run(Notify | CheckIn), 1);
    EXPECT_TRUE(m_log.empty());
}

TEST_F(OperationSelection, AsksTheProviderEvenForAnEmptyActiveList)
{
    EXPECT_EQ(m_services->RunFileListOperation(nullptr, &m_params, true, &m_provider, Notify | CheckIn, 1), 1);
    EXPECT_EQ(m_log, (Lines{"QueryStatus [] 0"}));
}

TEST_F(OperationSelection, DropsEntriesWhoseStateSharesNoBitWithTheMask)
{
    AddFile(L"a", 0x10);
    AddFile(L"b", 0x80000002);
    AddFile(L"c", 0);
    AddFile(L"d", 0x4);
    AddFile(L"e", 0x30);
    AddFile(L"f", 0x80000004);
    Run(CheckIn, 0x80000006);
    EXPECT_EQ(m_log, (Lines{"Dialog [b d f] 1", "CheckIn [b d f] comment 0"}));
    EXPECT_EQ(m_list.NumEntries(), 6U);
}

TEST_F(OperationSelection, LeavesTheActiveListUntouchedWhereNoEntryMatches)
{
    AddFile(L"a", 0x10).SetFlagsIn(0x8);
    AddFile(L"b", 0x20).SetFlagsIn(0x8);
    for (const std::uint32_t mask : {0x0U, 0x4U, ~0x30U})
    {
        EXPECT_EQ(Run(Notify | CheckIn, mask), 1);
    }
    EXPECT_TRUE(m_log.empty());
    EXPECT_EQ(ActiveNames(&m_list), "[a b]");
    EXPECT_EQ(m_list.GetFileEntry(0)->GetFlagsIn(), 0x8U);
    EXPECT_EQ(m_list.GetFileEntry(1)->GetFlagsIn(), 0x8U);
}

TEST_F(OperationSelection, MarksTheEntriesThatTakePartBeforeAnybodySeesThem)
{
    AddFile(L"a").SetFlagsIn(0x80000008);
    AddFile(L"b", 0x10).SetFlagsIn(0x8);
    m_listener.onNotify = [this](OrvixNotifyParams&) {
        EXPECT_EQ(m_list.GetFileEntry(0)->GetFlagsIn(), 0x80000009U);
        return 0;
    };
    Run(Notify | CheckIn, Controlled);
    EXPECT_EQ(m_list.GetFileEntry(0)->GetFlagsIn(), 0x80000009U);
    EXPECT_EQ(m_list.GetFileEntry(1)->GetFlagsIn(), 0x8U);
    EXPECT_FALSE(m_log.empty());
}

TEST_F(OperationSelection, DropsEveryOccurrenceOfAnEntryThatIsListedTwice)
{
    OrvixFileEntry& dropped = AddFile(L"a", 0);
    OrvixFileEntry& kept = AddFile(L"b");
    m_list.AddActiveEntry(&dropped);
    m_list.AddActiveEntry(&kept);
    Run(CheckIn, Controlled);
    EXPECT_EQ(m_log, (Lines{"Dialog [b b] 1", "CheckIn [b b] comment 0"}));
}

TEST_F(OperationSelection, WorksOnAnObjectThatWasNeverInitialised)
{
    AddFile(L"a");
    const ServicesPointer services{GetIOrvixServices()};
    EXPECT_EQ(services->RunFileListOperation(nullptr, &m_params, false, &m_provider, CheckIn, Controlled), 1);
    EXPECT_EQ(m_log, (Lines{"Dialog [a] 1", "CheckIn [a] comment 0"}));
}

} // namespace
