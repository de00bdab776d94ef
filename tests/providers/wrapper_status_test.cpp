#include "WrapperTest.h"

#include <array>

using testing::ElementsAre;
using testing::IsEmpty;

namespace
{

using WrapperStatus = WrapperTest;

/// Flags of FlagsOut, which are set when the status has all bits of `set`, none of `clear` and, unless it is 0, one of
/// `any`.
struct FlagRow
{
    unsigned long flags;
    unsigned long set;
    unsigned long clear;
    unsigned long any;
};

constexpr unsigned long Controlled = SCC_STATUS_CONTROLLED;
constexpr unsigned long CheckedOut = SCC_STATUS_CONTROLLED | SCC_STATUS_CHECKEDOUT;
constexpr unsigned long OutToAnybody = SCC_STATUS_CHECKEDOUT | SCC_STATUS_OUTOTHER;

constexpr FlagRow OpenProjectRows[] = {
    {State::NotControlled, 0, AllBits, 0},
    {State::Controlled, Controlled, 0, 0},
    {State::CheckedOut, SCC_STATUS_CHECKEDOUT, 0, 0},
    {State::CheckedOutByOther, SCC_STATUS_OUTOTHER, 0, 0},
    {State::OutOfDate, SCC_STATUS_OUTOFDATE, 0, 0},
    {State::Deleted, SCC_STATUS_DELETED, 0, 0},
    {State::Modified, SCC_STATUS_MODIFIED, 0, 0},
    {Permission::GetLatest, Controlled, 0, 0},
    {Permission::ShowHistory, Controlled, 0, 0},
    {Permission::CheckIn, CheckedOut, SCC_STATUS_OUTOTHER, 0},
    {Permission::UndoCheckOut, CheckedOut, SCC_STATUS_OUTOTHER, 0},
    {Permission::CheckOut, Controlled, OutToAnybody | SCC_STATUS_OUTOFDATE, 0},
    {Permission::Compare, Controlled, 0, SCC_STATUS_CHECKEDOUT | SCC_STATUS_MODIFIED},
    {Permission::Add, 0, Controlled, 0},
};

/// Flags that a provider has never written.
constexpr unsigned long OldFlags = 0x5555;

unsigned long ExpectedFlags(unsigned long status)
{
    unsigned long flags = 0;
    for (const FlagRow& row : OpenProjectRows)
    {
        if ((status & row.set) == row.set && (status & row.clear) == 0 && (row.any == 0 || (status & row.any) != 0))
        {
            flags |= row.flags;
        }
    }
    return flags;
}

/// Makes the library answer with these status words.
auto Answer(std::vector<LONG> words)
{
    return [words = std::move(words)](LPVOID, LONG, LPCSTR*, LPLONG status) {
        std::copy(words.begin(), words.end(), status);
        return SCC_OK;
    };
}

class WrapperStatusBits : public WrapperTest, public testing::WithParamInterface<unsigned long>
{
};

} // namespace

TEST_P(WrapperStatusBits, AreTranslatedInEveryCombination)
{
    constexpr unsigned long Count = 0x1000;
    Open();
    ActiveList list{};
    std::vector<LONG> words;
    for (unsigned long low = 0; low < Count; ++low)
    {
        list.Append(L"C:\\a");
        words.push_back(static_cast<LONG>(GetParam() | low));
    }
    m_scc.queryInfo = Answer(words);
    ASSERT_EQ(m_wrapper->QueryStatus(list.Get(), 0), Result::Success);
    for (unsigned int low = 0; low < Count; ++low)
    {
        ASSERT_EQ(list->GetActiveFileEntry(low)->GetFlagsOut(), ExpectedFlags(GetParam() | low)) << std::hex << low;
    }
}

INSTANTIATE_TEST_SUITE_P(Under, WrapperStatusBits, testing::Values(0, 0x1000, 0x80000000, 0x7FFFF000, 0xFFFFF000),
                         [](const testing::TestParamInfo<unsigned long>& test) {
                             return "HighBits" + std::to_string(test.param >> 12);
                         });

TEST_F(WrapperStatus, IsTranslatedAsTheContractSays)
{
    Open();
    ActiveList list{L"C:\\a", L"C:\\b", L"C:\\c"};
    m_scc.queryInfo =
        Answer({SCC_STATUS_CONTROLLED | SCC_STATUS_CHECKEDOUT, SCC_STATUS_CONTROLLED, SCC_STATUS_NOTCONTROLLED});
    ASSERT_EQ(m_wrapper->QueryStatus(list.Get(), 0), Result::Success);
    EXPECT_EQ(list.FlagsOf(0), State::Controlled | State::CheckedOut | Permission::CheckIn | Permission::UndoCheckOut |
                                   Permission::Compare | Permission::GetLatest | Permission::ShowHistory);
    EXPECT_EQ(list.FlagsOf(1),
              State::Controlled | Permission::CheckOut | Permission::GetLatest | Permission::ShowHistory);
    EXPECT_EQ(list.FlagsOf(2), State::NotControlled | Permission::Add);
}

TEST_F(WrapperStatus, IsQueriedOnceForAllFilesWithWordsThatAreZero)
{
    Open();
    ActiveList list{L"C:\\a", L"C:\\b"};
    EXPECT_EQ(m_wrapper->QueryStatus(list.Get(), AllBits), Result::Success);
    EXPECT_THAT(m_scc.Take(), ElementsAre(R"(SccQueryInfo(0x77, 0x2, ["C:\a", "C:\b"], [0x0, 0x0]))"));
}

TEST_F(WrapperStatus, OfAFileThatTheLibraryDoesNotFillIsNotControlled)
{
    Open();
    ActiveList list{L"C:\\a", L"C:\\b"};
    m_scc.queryInfo = Answer({SCC_STATUS_CONTROLLED});
    EXPECT_EQ(m_wrapper->QueryStatus(list.Get(), 0), Result::Success);
    EXPECT_EQ(list.FlagsOf(0), ExpectedFlags(SCC_STATUS_CONTROLLED));
    EXPECT_EQ(list.FlagsOf(1), State::NotControlled | Permission::Add);
}

TEST_F(WrapperStatus, IsWrittenToActiveEntriesOnly)
{
    Open();
    ActiveList list{L"C:\\a", L"C:\\b", L"C:\\c"};
    list->GetFileEntry(1)->SetFlagsOut(OldFlags);
    list->RemoveActiveEntry(list->GetFileEntry(1));
    m_scc.queryInfo = Answer({SCC_STATUS_CHECKEDOUT, SCC_STATUS_OUTOTHER});
    EXPECT_EQ(m_wrapper->QueryStatus(list.Get(), 0), Result::Success);
    EXPECT_EQ(list.FlagsOf(0), ExpectedFlags(SCC_STATUS_CHECKEDOUT));
    EXPECT_EQ(list.FlagsOf(1), OldFlags);
    EXPECT_EQ(list.FlagsOf(2), ExpectedFlags(SCC_STATUS_OUTOTHER));
}

TEST_F(WrapperStatus, WithoutAnOpenProjectIsNotControlledAndNotQueried)
{
    ActiveList list{L"C:\\a", L"C:\\b"};
    list->GetFileEntry(0)->SetFlagsOut(OldFlags);
    EXPECT_EQ(m_wrapper->QueryStatus(list.Get(), 0), Result::Success);
    EXPECT_EQ(list.FlagsOf(0), State::NotControlled);
    EXPECT_EQ(list.FlagsOf(1), State::NotControlled);
    EXPECT_THAT(m_scc.calls, IsEmpty());
}

TEST_F(WrapperStatus, ThatCannotBeReadLeavesTheFlags)
{
    Open();
    ActiveList list{L"C:\\a", L"C:\\b"};
    list->GetFileEntry(0)->SetFlagsOut(OldFlags);
    for (const SCCRTN code : {SCC_E_ACCESSFAILURE, SCC_I_OPERATIONCANCELED})
    {
        m_scc.queryInfo = [code](LPVOID, LONG, LPCSTR*, LPLONG status) {
            status[0] = SCC_STATUS_CONTROLLED;
            return code;
        };
        EXPECT_EQ(m_wrapper->QueryStatus(list.Get(), 0), Result::Failure);
        EXPECT_EQ(list.FlagsOf(0), OldFlags);
        EXPECT_EQ(list.FlagsOf(1), 0u);
    }
}

TEST_F(WrapperStatus, OfAListThatBecomesShorterMeanwhileIsWrittenToWhatIsLeft)
{
    Open();
    ActiveList list{L"C:\\a", L"C:\\b", L"C:\\c"};
    m_scc.queryInfo = [&](LPVOID, LONG, LPCSTR*, LPLONG status) {
        status[0] = SCC_STATUS_CHECKEDOUT;
        list->RemoveEntry(2u);
        list->RemoveActiveEntry(list->GetFileEntry(1));
        return SCC_OK;
    };
    EXPECT_EQ(m_wrapper->QueryStatus(list.Get(), 0), Result::Success);
    EXPECT_EQ(list.FlagsOf(0), ExpectedFlags(SCC_STATUS_CHECKEDOUT));
    EXPECT_EQ(list.FlagsOf(1), 0u);

    m_scc.queryInfo = [&](LPVOID, LONG, LPCSTR*, LPLONG) {
        list->RemoveAll();
        return SCC_OK;
    };
    EXPECT_EQ(m_wrapper->QueryStatus(list.Get(), 0), Result::Success);
}

TEST_F(WrapperStatus, OfAListThatGrowsMeanwhileIsWrittenToWhatWasQueried)
{
    Open();
    ActiveList list{L"C:\\a"};
    m_scc.queryInfo = [&](LPVOID, LONG, LPCSTR*, LPLONG) {
        list.Append(L"C:\\b");
        return SCC_OK;
    };
    EXPECT_EQ(m_wrapper->QueryStatus(list.Get(), 0), Result::Success);
    EXPECT_EQ(list.FlagsOf(0), State::NotControlled | Permission::Add);
    EXPECT_EQ(list.FlagsOf(1), 0u);
}

TEST_F(WrapperStatus, AllowsAddingAsLongAsTheProjectIsOpen)
{
    class ClosingEntry : public OrvixFileEntry
    {
    public:
        explicit ClosingEntry(IOrvixProvider& provider) : m_provider(provider) {}
        void SetFlagsOut(unsigned long flags) override
        {
            OrvixFileEntry::SetFlagsOut(flags);
            m_provider.CloseProject();
        }

    private:
        IOrvixProvider& m_provider;
    };
    Open();
    ClosingEntry first(*m_wrapper);
    first.SetFile(L"C:\\first");
    ASSERT_EQ(m_wrapper->OpenProject(L"C:\\Project", L""), Result::Success);
    OrvixFileList list;
    list.AddActiveEntry(&first);
    OrvixFileEntry* second = list.CreateEntry(L"C:\\second", nullptr, 0, 0);
    list.AddActiveEntry(second);
    EXPECT_EQ(m_wrapper->QueryStatus(&list, 0), Result::Success);
    EXPECT_EQ(first.GetFlagsOut(), State::NotControlled | Permission::Add);
    EXPECT_EQ(second->GetFlagsOut(), State::NotControlled);
}

TEST_F(WrapperStatus, AsksTheVirtualOperationWhetherTheProjectIsOpen)
{
    class Derived : public OrvixProviderWrapper
    {
    public:
        int asked = 0;
        bool open = false;
        bool IsProjectOpen() override
        {
            ++asked;
            return open;
        }
    };
    auto derived = std::unique_ptr<Derived>(new Derived);
    derived->SetMSSCC(NewBridge(L"recording_full"));
    ActiveList list{L"C:\\a", L"C:\\b", L"C:\\c"};
    EXPECT_EQ(derived->QueryStatus(list.Get(), 0), Result::Success);
    EXPECT_THAT(m_scc.calls, IsEmpty());
    EXPECT_EQ(derived->asked, 4) << "once before the query, then for each entry";

    derived->open = true;
    EXPECT_EQ(derived->QueryStatus(list.Get(), 0), Result::Success);
    EXPECT_EQ(m_scc.Take().size(), 2u) << "SccGetVersion of the load, SccQueryInfo";
    EXPECT_EQ(list.FlagsOf(2), State::NotControlled | Permission::Add);
}
