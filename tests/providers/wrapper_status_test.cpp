#include "WrapperTest.h"

#include <array>

using testing::ElementsAre;
using testing::IsEmpty;

namespace
{

using WrapperStatus = WrapperTest;

/// When bits of FlagsOut are set: all of `set`, none of `clear` and, unless it is 0, any of `any` in the status.
struct FlagRow
{
    unsigned long flags;
    unsigned long set;
    unsigned long clear;
    unsigned long any;
};

constexpr FlagRow OpenProjectRows[] = {
    {0x1, 0, 0xFFFFFFFF, 0},  {0x2, 0x1, 0, 0},       {0x4, 0x2, 0, 0},       {0x8, 0x4, 0, 0},
    {0x10, 0x20, 0, 0},       {0x20, 0x40, 0, 0},     {0x80, 0x800, 0, 0},    {0x200000, 0x1, 0, 0},
    {0x400000, 0x1, 0, 0},    {0x10000, 0x3, 0x4, 0}, {0x40000, 0x3, 0x4, 0}, {0x20000, 0x1, 0x26, 0},
    {0x80000, 0x1, 0, 0x802}, {0x100000, 0, 0x1, 0},
};

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

/// Has the library answer with these status words.
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
    ASSERT_EQ(m_wrapper->QueryStatus(list.Get(), 0), 0);
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
    m_scc.queryInfo = Answer({0x3, 0x1, 0});
    ASSERT_EQ(m_wrapper->QueryStatus(list.Get(), 0), 0);
    EXPECT_EQ(list.FlagsOf(0), 0x2u | 0x4u | 0x10000u | 0x40000u | 0x80000u | 0x200000u | 0x400000u);
    EXPECT_EQ(list.FlagsOf(1), 0x2u | 0x20000u | 0x200000u | 0x400000u);
    EXPECT_EQ(list.FlagsOf(2), 0x1u | 0x100000u);
}

TEST_F(WrapperStatus, IsAskedOnceForAllFilesWithWordsThatAreZero)
{
    Open();
    ActiveList list{L"C:\\a", L"C:\\b"};
    EXPECT_EQ(m_wrapper->QueryStatus(list.Get(), 0xFFFFFFFF), 0);
    EXPECT_THAT(m_scc.Take(), ElementsAre(R"(SccQueryInfo(0x77, 0x2, ["C:\a", "C:\b"], [0x0, 0x0]))"));
}

TEST_F(WrapperStatus, OfAFileThatTheLibraryDoesNotFillIsNotControlled)
{
    Open();
    ActiveList list{L"C:\\a", L"C:\\b"};
    m_scc.queryInfo = Answer({0x1});
    EXPECT_EQ(m_wrapper->QueryStatus(list.Get(), 0), 0);
    EXPECT_EQ(list.FlagsOf(0), ExpectedFlags(0x1));
    EXPECT_EQ(list.FlagsOf(1), 0x100001u);
}

TEST_F(WrapperStatus, IsWrittenToActiveEntriesOnly)
{
    Open();
    ActiveList list{L"C:\\a", L"C:\\b", L"C:\\c"};
    list->GetFileEntry(1)->SetFlagsOut(0x5555);
    list->RemoveActiveEntry(list->GetFileEntry(1));
    m_scc.queryInfo = Answer({0x2, 0x4});
    EXPECT_EQ(m_wrapper->QueryStatus(list.Get(), 0), 0);
    EXPECT_EQ(list.FlagsOf(0), ExpectedFlags(0x2));
    EXPECT_EQ(list.FlagsOf(1), 0x5555u);
    EXPECT_EQ(list.FlagsOf(2), ExpectedFlags(0x4));
}

TEST_F(WrapperStatus, WithoutAnOpenProjectIsNotControlledAndNotAsked)
{
    ActiveList list{L"C:\\a", L"C:\\b"};
    list->GetFileEntry(0)->SetFlagsOut(0x5555);
    EXPECT_EQ(m_wrapper->QueryStatus(list.Get(), 0), 0);
    EXPECT_EQ(list.FlagsOf(0), 0x1u);
    EXPECT_EQ(list.FlagsOf(1), 0x1u);
    EXPECT_THAT(m_scc.calls, IsEmpty());
}

TEST_F(WrapperStatus, ThatCannotBeHadLeavesTheFlags)
{
    Open();
    ActiveList list{L"C:\\a", L"C:\\b"};
    list->GetFileEntry(0)->SetFlagsOut(0x5555);
    for (const SCCRTN code : {SCC_E_ACCESSFAILURE, SCC_I_OPERATIONCANCELED})
    {
        m_scc.queryInfo = [code](LPVOID, LONG, LPCSTR*, LPLONG status) {
            status[0] = 0x1;
            return code;
        };
        EXPECT_EQ(m_wrapper->QueryStatus(list.Get(), 0), -1);
        EXPECT_EQ(list.FlagsOf(0), 0x5555u);
        EXPECT_EQ(list.FlagsOf(1), 0u);
    }
}

TEST_F(WrapperStatus, OfAListThatBecameShorterMeanwhileIsWrittenToWhatIsLeft)
{
    Open();
    ActiveList list{L"C:\\a", L"C:\\b", L"C:\\c"};
    m_scc.queryInfo = [&](LPVOID, LONG, LPCSTR*, LPLONG status) {
        status[0] = 0x2;
        list->RemoveEntry(2u);
        list->RemoveActiveEntry(list->GetFileEntry(1));
        return SCC_OK;
    };
    EXPECT_EQ(m_wrapper->QueryStatus(list.Get(), 0), 0);
    EXPECT_EQ(list.FlagsOf(0), ExpectedFlags(0x2));
    EXPECT_EQ(list.FlagsOf(1), 0u);

    m_scc.queryInfo = [&](LPVOID, LONG, LPCSTR*, LPLONG) {
        list->RemoveAll();
        return SCC_OK;
    };
    EXPECT_EQ(m_wrapper->QueryStatus(list.Get(), 0), 0);
}

TEST_F(WrapperStatus, OfAListThatGrewMeanwhileIsWrittenToWhatWasAsked)
{
    Open();
    ActiveList list{L"C:\\a"};
    m_scc.queryInfo = [&](LPVOID, LONG, LPCSTR*, LPLONG) {
        list.Append(L"C:\\b");
        return SCC_OK;
    };
    EXPECT_EQ(m_wrapper->QueryStatus(list.Get(), 0), 0);
    EXPECT_EQ(list.FlagsOf(0), 0x100001u);
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
    ASSERT_EQ(m_wrapper->OpenProject(L"C:\\Project", L""), 0);
    OrvixFileList list;
    list.AddActiveEntry(&first);
    OrvixFileEntry* second = list.CreateEntry(L"C:\\second", nullptr, 0, 0);
    list.AddActiveEntry(second);
    EXPECT_EQ(m_wrapper->QueryStatus(&list, 0), 0);
    EXPECT_EQ(first.GetFlagsOut(), 0x100001u);
    EXPECT_EQ(second->GetFlagsOut(), 0x1u);
}

TEST_F(WrapperStatus, AsksThroughItsTableWhetherTheProjectIsOpen)
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
    EXPECT_EQ(derived->QueryStatus(list.Get(), 0), 0);
    EXPECT_THAT(m_scc.calls, IsEmpty());
    EXPECT_EQ(derived->asked, 4) << "once before the query, then for each entry";

    derived->open = true;
    EXPECT_EQ(derived->QueryStatus(list.Get(), 0), 0);
    EXPECT_EQ(m_scc.Take().size(), 2u) << "SccGetVersion of the load, SccQueryInfo";
    EXPECT_EQ(list.FlagsOf(2), 0x100001u);
}
