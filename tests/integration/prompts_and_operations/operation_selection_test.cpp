#include "OperationTest.h"

namespace
{

/// Which entries take part, and what the provider is asked before.
class OperationSelection : public OperationTest
{
protected:
    /// A bit of FlagsIn that belongs to the host.
    static constexpr unsigned long HostFlag = 0x8;
};

TEST_F(OperationSelection, AsksTheProviderForTheStateBeforeAnythingElse)
{
    AddFile(L"a");
    m_services->RunFileListOperation(nullptr, &m_params, true, &m_provider, Operation::Notify | Operation::CheckIn,
                                     State::Controlled);
    EXPECT_EQ(m_log, (Lines{"QueryStatus [a]", "Notify BeforeCheckIn [a]", "Dialog [a] EntriesCanBeCleared",
                            "Notify FilesConfirmed [a]", "CheckIn [a] comment", "Notify AfterCheckIn [a]"}));
}

TEST_F(OperationSelection, SelectsByTheStateThatTheProviderReports)
{
    AddFile(L"a", 0);
    AddFile(L"b", OrvixFilePermission::CheckOut);
    m_provider.onCall = [](const std::string& operation, OrvixFileList& list) {
        if (operation != "QueryStatus")
        {
            return;
        }
        list.GetActiveFileEntry(0)->SetFlagsOut(OrvixFilePermission::CheckOut);
        list.GetActiveFileEntry(1)->SetFlagsOut(State::NotControlled);
    };
    EXPECT_EQ(m_services->RunFileListOperation(nullptr, &m_params, true, &m_provider, Operation::CheckOut,
                                               OrvixFilePermission::CheckOut),
              OperationResult::Done);
    EXPECT_EQ(m_log, (Lines{"QueryStatus [a b]", "Dialog [a] EntriesCanBeCleared", "CheckOut [a] comment"}));
}

TEST_F(OperationSelection, GoesOnWithTheOldStateWhenTheProviderFailsToReport)
{
    AddFile(L"a");
    m_provider.result = OrvixProviderResult::Failure;
    EXPECT_EQ(
        m_services->RunFileListOperation(nullptr, &m_params, true, &m_provider, Operation::CheckIn, State::Controlled),
        1);
    EXPECT_EQ(m_log, (Lines{"QueryStatus [a]", "Dialog [a] EntriesCanBeCleared", "CheckIn [a] comment"}));
}

TEST_F(OperationSelection, DoesNotAskTheProviderUnlessTold)
{
    AddFile(L"a");
    Run(Operation::CheckIn);
    EXPECT_EQ(m_log, (Lines{"Dialog [a] EntriesCanBeCleared", "CheckIn [a] comment"}));
}

TEST_F(OperationSelection, IsDoneAtOnceWithAnEmptyActiveList)
{
    m_list.CreateEntry(L"a", nullptr, 0, 0)->SetFlagsOut(State::Controlled);
    EXPECT_EQ(Run(Operation::Notify | Operation::CheckIn), OperationResult::Done);
    EXPECT_TRUE(m_log.empty());
}

TEST_F(OperationSelection, AsksTheProviderEvenForAnEmptyActiveList)
{
    EXPECT_EQ(m_services->RunFileListOperation(nullptr, &m_params, true, &m_provider,
                                               Operation::Notify | Operation::CheckIn, State::NotControlled),
              OperationResult::Done);
    EXPECT_EQ(m_log, (Lines{"QueryStatus []"}));
}

TEST_F(OperationSelection, DropsEntriesWhoseStateSharesNoBitWithTheMask)
{
    AddFile(L"a", State::OutOfDate);
    AddFile(L"b", UnpublishedBit | State::Controlled);
    AddFile(L"c", 0);
    AddFile(L"d", State::CheckedOut);
    AddFile(L"e", State::OutOfDate | State::Deleted);
    AddFile(L"f", UnpublishedBit | State::CheckedOut);
    Run(Operation::CheckIn, UnpublishedBit | State::Controlled | State::CheckedOut);
    EXPECT_EQ(m_log, (Lines{"Dialog [b d f] EntriesCanBeCleared", "CheckIn [b d f] comment"}));
    EXPECT_EQ(m_list.NumEntries(), 6U);
}

TEST_F(OperationSelection, LeavesTheActiveListUnchangedWhenNoEntryMatches)
{
    AddFile(L"a", State::OutOfDate).SetFlagsIn(HostFlag);
    AddFile(L"b", State::Deleted).SetFlagsIn(HostFlag);
    for (const unsigned long mask : {0UL, State::CheckedOut, ~(State::OutOfDate | State::Deleted)})
    {
        EXPECT_EQ(Run(Operation::Notify | Operation::CheckIn, mask), OperationResult::Done);
    }
    EXPECT_TRUE(m_log.empty());
    EXPECT_EQ(ActiveNames(&m_list), "[a b]");
    EXPECT_EQ(m_list.GetFileEntry(0)->GetFlagsIn(), HostFlag);
    EXPECT_EQ(m_list.GetFileEntry(1)->GetFlagsIn(), HostFlag);
}

TEST_F(OperationSelection, MarksTheEntriesThatTakePartBeforeAnybodySeesThem)
{
    AddFile(L"a").SetFlagsIn(UnpublishedBit | HostFlag);
    AddFile(L"b", State::OutOfDate).SetFlagsIn(HostFlag);
    static constexpr unsigned long marked = UnpublishedBit | HostFlag | OrvixFileSelection::Selected;
    m_listener.onNotify = [this](OrvixNotifyParams&) {
        EXPECT_EQ(m_list.GetFileEntry(0)->GetFlagsIn(), marked);
        return OrvixListenerAnswer::Accept;
    };
    Run(Operation::Notify | Operation::CheckIn, State::Controlled);
    EXPECT_EQ(m_list.GetFileEntry(0)->GetFlagsIn(), marked);
    EXPECT_EQ(m_list.GetFileEntry(1)->GetFlagsIn(), HostFlag);
    EXPECT_FALSE(m_log.empty());
}

TEST_F(OperationSelection, DropsEveryOccurrenceOfAnEntryThatIsListedTwice)
{
    OrvixFileEntry& dropped = AddFile(L"a", 0);
    OrvixFileEntry& kept = AddFile(L"b");
    m_list.AddActiveEntry(&dropped);
    m_list.AddActiveEntry(&kept);
    Run(Operation::CheckIn, State::Controlled);
    EXPECT_EQ(m_log, (Lines{"Dialog [b b] EntriesCanBeCleared", "CheckIn [b b] comment"}));
}

TEST_F(OperationSelection, WorksOnAnObjectThatWasNeverInitialised)
{
    AddFile(L"a");
    const OrvixServicesPointer services = MakeOrvixServices();
    EXPECT_EQ(
        services->RunFileListOperation(nullptr, &m_params, false, &m_provider, Operation::CheckIn, State::Controlled),
        1);
    EXPECT_EQ(m_log, (Lines{"Dialog [a] EntriesCanBeCleared", "CheckIn [a] comment"}));
}

} // namespace
