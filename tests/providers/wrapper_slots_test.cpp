#include "VTable.h"
#include "WrapperTest.h"

using testing::ElementsAre;
using testing::IsEmpty;

namespace
{

using WrapperSlots = WrapperTest;

/// Calls the n-th operation after the destructor.
template <typename Value, typename... Arguments>
Value Call(OrvixProviderWrapper& wrapper, std::size_t n, Arguments... arguments)
{
    return CallSlot<Value>(static_cast<IOrvixProvider*>(&wrapper), DestructorSlots + n, arguments...);
}

} // namespace

TEST_F(WrapperSlots, AreInTheOrderOfTheContract)
{
    OrvixProviderWrapper& wrapper = *m_wrapper;
    ActiveList files{L"C:\\a"};
    OrvixFileList* const list = files.Get();
    m_scc.getCommandOptions = [](LPVOID, HWND, SCCCOMMAND, LPCMDOPTS* block) {
        return block != nullptr ? SCC_OK : SCC_I_ADV_SUPPORT;
    };
    m_scc.results["SccHistory"] = SCC_I_RELOADFILE;

    EXPECT_STREQ(Call<const wchar_t*>(wrapper, 0), L"Recorded");
    EXPECT_FALSE(Call<bool>(wrapper, 2));
    EXPECT_EQ(Call<int>(wrapper, 4, &m_info), Result::Success);
    EXPECT_TRUE(Call<bool>(wrapper, 2));
    EXPECT_FALSE(Call<bool>(wrapper, 3));
    EXPECT_EQ(Call<int>(wrapper, 6, L"C:\\p", L"open"), Result::Success);
    EXPECT_TRUE(Call<bool>(wrapper, 3));
    m_scc.Take();

    EXPECT_EQ(Call<int>(wrapper, 10, list, L"in", Option::KeepCheckedOut), Result::Success);
    EXPECT_EQ(Call<int>(wrapper, 11, list, L"out", Option::GetLatest), Result::Success);
    EXPECT_EQ(Call<int>(wrapper, 12, list, 0ul), Result::Success);
    EXPECT_EQ(Call<int>(wrapper, 13, list, 0ul), Result::Success);
    EXPECT_EQ(Call<int>(wrapper, 16, list, L"add", Option::KeepCheckedOut), Result::Success);
    EXPECT_EQ(Call<int>(wrapper, 17, list), Result::ReloadFiles);
    EXPECT_EQ(Call<int>(wrapper, 18, list), Result::Success);
    EXPECT_EQ(Call<int>(wrapper, 19, list, 0ul), Result::Success);
    EXPECT_EQ(files.FlagsOf(0), State::NotControlled | Permission::Add);
    EXPECT_EQ(Call<int>(wrapper, 22), Result::Success);
    EXPECT_EQ(Call<int>(wrapper, 23), Result::Success);
    EXPECT_EQ(Call<int>(wrapper, 7), Result::Success);
    EXPECT_EQ(Call<int>(wrapper, 5), Result::Success);
    EXPECT_THAT(m_scc.Take(),
                ElementsAre(R"(SccCheckin(0x77, 0x1234, 0x1, ["C:\a"], "in", 0x1000, 0x0))",
                            R"(SccGet(0x77, 0x1234, 0x1, ["C:\a"], 0x0, 0x0))",
                            R"(SccCheckout(0x77, 0x1234, 0x1, ["C:\a"], "out", 0x0, 0x0))",
                            R"(SccUncheckout(0x77, 0x1234, 0x1, ["C:\a"], 0x0, 0x0))",
                            R"(SccGet(0x77, 0x1234, 0x1, ["C:\a"], 0x0, 0x0))",
                            R"(SccAdd(0x77, 0x1234, 0x1, ["C:\a"], "add", [0x1000], 0x0))",
                            R"(SccHistory(0x77, 0x1234, 0x1, ["C:\a"], 0x0, 0x0))",
                            R"(SccProperties(0x77, 0x1234, "C:\a"))", R"(SccQueryInfo(0x77, 0x1, ["C:\a"], [0x0]))",
                            "SccGetCommandOptions(0x77, 0x1234, 0xa, null)",
                            "SccGetCommandOptions(0x77, 0x1234, 0xa, block 0x0)", "SccRunScc(0x77, 0x1234, 0x0, null)",
                            "SccCloseProject(0x77)", "SccUninitialize(0x77)"));
}

TEST_F(WrapperSlots, OfReservedOperationsGiveTheirFixedResultsAndLoadNothing)
{
    OrvixProviderWrapper& wrapper = *m_wrapper;
    EXPECT_EQ(Call<int>(wrapper, 1), Result::Success);
    EXPECT_EQ(Call<int>(wrapper, 8), Result::Success);
    EXPECT_EQ(Call<int>(wrapper, 9), Result::NotOffered);
    unsigned long first = 7;
    unsigned long second = 8;
    EXPECT_EQ(Call<int>(wrapper, 14, static_cast<void*>(nullptr), &first, &second), Result::NotOffered);
    EXPECT_EQ(first, 0u);
    EXPECT_EQ(second, 0u);
    EXPECT_EQ(Call<int>(wrapper, 15), Result::NotOffered);
    EXPECT_EQ(Call<int>(wrapper, 20), Result::NotOffered);
    EXPECT_EQ(Call<int>(wrapper, 21), Result::NotOffered);
    EXPECT_EQ(Call<int>(wrapper, 24), Result::NotOffered);
    EXPECT_TRUE(Call<bool>(wrapper, 25));
    EXPECT_THAT(m_scc.calls, IsEmpty());
}

TEST_F(WrapperSlots, BeginWithTheDestructorWhichDeletesTheBridge)
{
    Open();
    DeleteThroughTable(static_cast<IOrvixProvider*>(m_wrapper.release()));
    EXPECT_THAT(m_scc.calls, ElementsAre("SccCloseProject(0x77)", "SccUninitialize(0x77)", "unload recording_full"));
}
