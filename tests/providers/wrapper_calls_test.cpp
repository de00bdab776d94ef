#include "WrapperTest.h"

#include <climits>
#include <string_view>

using testing::Contains;
using testing::Each;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;

namespace
{

using Wrapper = WrapperTest;

class WrapperOperation : public WrapperTest, public testing::WithParamInterface<ListOperation>
{
};

/// Every code of the interface, and the smallest and the greatest number.
std::vector<SCCRTN> CodesOtherThanOK()
{
    std::vector<SCCRTN> codes = {LONG_MIN, LONG_MAX};
    for (SCCRTN code = -31; code <= 7; ++code)
    {
        if (code != SCC_OK)
        {
            codes.push_back(code);
        }
    }
    return codes;
}

} // namespace

TEST_F(Wrapper, NameIsThatOfTheBridgeAndLoadsNothing)
{
    EXPECT_STREQ(m_wrapper->GetName(), L"Recorded");
    EXPECT_FALSE(m_wrapper->IsInitialized());
    EXPECT_FALSE(m_wrapper->IsProjectOpen());
    EXPECT_THAT(m_scc.calls, IsEmpty());
}

TEST_F(Wrapper, LifeIsTheLibrarysLife)
{
    EXPECT_EQ(m_wrapper->Initialize(&m_info), Result::Success);
    EXPECT_TRUE(m_wrapper->IsInitialized());
    EXPECT_FALSE(m_wrapper->IsProjectOpen());
    EXPECT_EQ(m_wrapper->OpenProject(L"C:\\Project", L"a comment"), Result::Success);
    EXPECT_TRUE(m_wrapper->IsProjectOpen());
    EXPECT_EQ(m_wrapper->CloseProject(), Result::Success);
    EXPECT_FALSE(m_wrapper->IsProjectOpen());
    EXPECT_TRUE(m_wrapper->IsInitialized());
    EXPECT_EQ(m_wrapper->Uninitialize(), Result::Success);
    EXPECT_FALSE(m_wrapper->IsInitialized());
    EXPECT_THAT(m_scc.calls, ElementsAre("load recording_full", "SccGetVersion()",
                                         R"(SccInitialize(0x0, 0x1234, "Test host", "Recorded", ""))",
                                         R"(SccOpenProject(0x77, 0x1234, "", "", "C:\Project", "", "a comment", 0x1))",
                                         "SccCloseProject(0x77)", "SccUninitialize(0x77)"));
}

TEST_F(Wrapper, InitializeOfAnInitialisedLibraryOnlyTakesTheWindow)
{
    Open();
    m_info.SetParentWindow(nullptr);
    EXPECT_EQ(m_wrapper->Initialize(&m_info), Result::Success);
    EXPECT_THAT(m_scc.Take(), IsEmpty());
    EXPECT_EQ(m_wrapper->RunProviderClient(), Result::Success);
    EXPECT_THAT(m_scc.Take(), ElementsAre("SccRunScc(0x77, 0x0, 0x0, null)"));
}

TEST_F(Wrapper, InitializeWithoutInfoFailsAndSendsNothing)
{
    EXPECT_EQ(m_wrapper->Initialize(nullptr), Result::Failure);
    EXPECT_THAT(m_scc.calls, IsEmpty());
}

TEST_F(Wrapper, InitializeAcceptsEveryCapabilityBit)
{
    m_scc.initialize = [](LPVOID*, HWND, LPCSTR, LPSTR, LPLONG capabilities, LPSTR, LPLONG, LPLONG) {
        *capabilities = static_cast<LONG>(0x80000000);
        return SCC_OK;
    };
    EXPECT_EQ(m_wrapper->Initialize(&m_info), Result::Success);
    EXPECT_TRUE(m_wrapper->IsInitialized());
}

TEST_F(Wrapper, CheckInPassesPathsCommentAndKeepOption)
{
    Open();
    ActiveList list{L"C:\\a", L"C:\\b"};
    EXPECT_EQ(m_wrapper->CheckIn(list.Get(), L"why", Option::KeepCheckedOut), Result::Success);
    EXPECT_EQ(m_wrapper->CheckIn(list.Get(), L"why", AllBits), Result::Success);
    EXPECT_EQ(m_wrapper->CheckIn(list.Get(), L"why", 0), Result::Success);
    EXPECT_EQ(m_wrapper->CheckIn(list.Get(), L"why", ~Option::KeepCheckedOut), Result::Success);
    EXPECT_THAT(m_scc.Take(), ElementsAre(R"(SccCheckin(0x77, 0x1234, 0x2, ["C:\a", "C:\b"], "why", 0x1000, 0x0))",
                                          R"(SccCheckin(0x77, 0x1234, 0x2, ["C:\a", "C:\b"], "why", 0x1000, 0x0))",
                                          R"(SccCheckin(0x77, 0x1234, 0x2, ["C:\a", "C:\b"], "why", 0x0, 0x0))",
                                          R"(SccCheckin(0x77, 0x1234, 0x2, ["C:\a", "C:\b"], "why", 0x0, 0x0))"));
}

TEST_F(Wrapper, CheckOutPassesPathsAndComment)
{
    Open();
    ActiveList list{L"C:\\a", L"C:\\b"};
    EXPECT_EQ(m_wrapper->CheckOut(list.Get(), L"why", 0), Result::Success);
    EXPECT_EQ(m_wrapper->CheckOut(list.Get(), L"why", ~Option::GetLatest), Result::Success);
    EXPECT_THAT(m_scc.Take(), ElementsAre(R"(SccCheckout(0x77, 0x1234, 0x2, ["C:\a", "C:\b"], "why", 0x0, 0x0))",
                                          R"(SccCheckout(0x77, 0x1234, 0x2, ["C:\a", "C:\b"], "why", 0x0, 0x0))"));
}

TEST_F(Wrapper, CheckOutGetsFirstWhenAskedTo)
{
    Open();
    ActiveList list{L"C:\\a", L"C:\\b"};
    EXPECT_EQ(m_wrapper->CheckOut(list.Get(), L"why", Option::GetLatest), Result::Success);
    EXPECT_THAT(m_scc.Take(), ElementsAre(R"(SccGet(0x77, 0x1234, 0x2, ["C:\a", "C:\b"], 0x0, 0x0))",
                                          R"(SccCheckout(0x77, 0x1234, 0x2, ["C:\a", "C:\b"], "why", 0x0, 0x0))"));
}

TEST_F(Wrapper, CheckOutGoesOnAfterAFailedGetAndReturnsItsOwnResult)
{
    Open();
    ActiveList list{L"C:\\a"};
    m_scc.results = {{"SccGet", SCC_E_ACCESSFAILURE}};
    EXPECT_EQ(m_wrapper->CheckOut(list.Get(), L"", Option::GetLatest), Result::Success);
    EXPECT_EQ(m_scc.Take().size(), 2u);
    m_scc.results = {{"SccCheckout", SCC_E_NONSPECIFICERROR}};
    EXPECT_EQ(m_wrapper->CheckOut(list.Get(), L"", Option::GetLatest), Result::Failure);
}

TEST_F(Wrapper, UndoCheckOutPassesPaths)
{
    Open();
    ActiveList list{L"C:\\a", L"C:\\b"};
    EXPECT_EQ(m_wrapper->UndoCheckOut(list.Get(), 0), Result::Success);
    EXPECT_EQ(m_wrapper->UndoCheckOut(list.Get(), ~Option::GetLatest), Result::Success);
    EXPECT_THAT(m_scc.Take(), ElementsAre(R"(SccUncheckout(0x77, 0x1234, 0x2, ["C:\a", "C:\b"], 0x0, 0x0))",
                                          R"(SccUncheckout(0x77, 0x1234, 0x2, ["C:\a", "C:\b"], 0x0, 0x0))"));
}

TEST_F(Wrapper, UndoCheckOutGetsAfterwardsWhenAskedTo)
{
    Open();
    ActiveList list{L"C:\\a", L"C:\\b"};
    EXPECT_EQ(m_wrapper->UndoCheckOut(list.Get(), Option::GetLatest), Result::Success);
    EXPECT_THAT(m_scc.Take(), ElementsAre(R"(SccUncheckout(0x77, 0x1234, 0x2, ["C:\a", "C:\b"], 0x0, 0x0))",
                                          R"(SccGet(0x77, 0x1234, 0x2, ["C:\a", "C:\b"], 0x0, 0x0))"));
}

TEST_F(Wrapper, UndoCheckOutReturnsTheResultOfTheGetThatFollows)
{
    Open();
    ActiveList list{L"C:\\a"};
    m_scc.results = {{"SccUncheckout", SCC_E_NOTCHECKEDOUT}};
    EXPECT_EQ(m_wrapper->UndoCheckOut(list.Get(), Option::GetLatest), Result::Success);
    EXPECT_EQ(m_scc.Take().size(), 2u);
    m_scc.results = {{"SccGet", SCC_E_ACCESSFAILURE}};
    EXPECT_EQ(m_wrapper->UndoCheckOut(list.Get(), Option::GetLatest), Result::Failure);
}

TEST_F(Wrapper, GetLatestIgnoresItsOptions)
{
    Open();
    ActiveList list{L"C:\\a", L"C:\\b"};
    EXPECT_EQ(m_wrapper->GetLatest(list.Get(), 0), Result::Success);
    EXPECT_EQ(m_wrapper->GetLatest(list.Get(), AllBits), Result::Success);
    EXPECT_THAT(m_scc.Take(), ElementsAre(R"(SccGet(0x77, 0x1234, 0x2, ["C:\a", "C:\b"], 0x0, 0x0))",
                                          R"(SccGet(0x77, 0x1234, 0x2, ["C:\a", "C:\b"], 0x0, 0x0))"));
}

TEST_F(Wrapper, AddPassesAnOptionWordForEachFile)
{
    Open();
    ActiveList list{L"C:\\a", L"C:\\b", L"C:\\c"};
    EXPECT_EQ(m_wrapper->Add(list.Get(), L"new", Option::KeepCheckedOut), Result::Success);
    EXPECT_EQ(m_wrapper->Add(list.Get(), L"new", ~Option::KeepCheckedOut), Result::Success);
    EXPECT_THAT(
        m_scc.Take(),
        ElementsAre(R"(SccAdd(0x77, 0x1234, 0x3, ["C:\a", "C:\b", "C:\c"], "new", [0x1000, 0x1000, 0x1000], 0x0))",
                    R"(SccAdd(0x77, 0x1234, 0x3, ["C:\a", "C:\b", "C:\c"], "new", [0x0, 0x0, 0x0], 0x0))"));
}

TEST_F(Wrapper, ShowHistoryPassesPaths)
{
    Open();
    ActiveList list{L"C:\\a", L"C:\\b"};
    EXPECT_EQ(m_wrapper->ShowHistory(list.Get()), Result::Success);
    EXPECT_THAT(m_scc.Take(), ElementsAre(R"(SccHistory(0x77, 0x1234, 0x2, ["C:\a", "C:\b"], 0x0, 0x0))"));
}

TEST_F(Wrapper, ShowPropertiesShowsTheFirstActiveFileAlone)
{
    Open();
    ActiveList list{L"C:\\inactive", L"C:\\b", L"C:\\c", L"C:\\\u5009"};
    list->RemoveActiveEntry(list->GetFileEntry(0));
    EXPECT_EQ(m_wrapper->ShowProperties(list.Get()), Result::Success);
    EXPECT_THAT(m_scc.Take(), ElementsAre(R"(SccProperties(0x77, 0x1234, "C:\b"))"));
}

TEST_F(Wrapper, ShowOptionsShowsTheOptionsOfALibraryThatHasThem)
{
    Open();
    m_scc.getCommandOptions = [](LPVOID, HWND, SCCCOMMAND, LPCMDOPTS* block) {
        return block != nullptr ? SCC_OK : SCC_I_ADV_SUPPORT;
    };
    EXPECT_EQ(m_wrapper->ShowOptions(), Result::Success);
    EXPECT_THAT(m_scc.Take(), ElementsAre("SccGetCommandOptions(0x77, 0x1234, 0xa, null)",
                                          "SccGetCommandOptions(0x77, 0x1234, 0xa, block 0x0)"));
    m_scc.getCommandOptions = [](LPVOID, HWND, SCCCOMMAND, LPCMDOPTS*) { return SCC_I_OPERATIONCANCELED; };
    EXPECT_EQ(m_wrapper->ShowOptions(), Result::Failure);
}

TEST_F(Wrapper, ShowOptionsFailsForALibraryThatHasNone)
{
    Open();
    EXPECT_EQ(m_wrapper->ShowOptions(), Result::Failure);
    EXPECT_THAT(m_scc.Take(), ElementsAre("SccGetCommandOptions(0x77, 0x1234, 0xa, null)"));
}

TEST_F(Wrapper, RunProviderClientPassesNoFiles)
{
    Open();
    EXPECT_EQ(m_wrapper->RunProviderClient(), Result::Success);
    EXPECT_THAT(m_scc.Take(), ElementsAre("SccRunScc(0x77, 0x1234, 0x0, null)"));
}

TEST_F(Wrapper, OperationsWithoutFilesFailForEveryCodeExceptOK)
{
    for (const SCCRTN code : CodesOtherThanOK())
    {
        SCOPED_TRACE(code);
        m_scc.results = {{"SccOpenProject", code}, {"SccGetProjPath", code}, {"SccRunScc", code}};
        m_scc.initialize = nullptr;
        m_scc.results["SccInitialize"] = code;
        EXPECT_EQ(m_wrapper->Initialize(&m_info), Result::Failure);
        EXPECT_FALSE(m_wrapper->IsInitialized());
        m_scc.results.erase("SccInitialize");
        EXPECT_EQ(m_wrapper->Initialize(&m_info), Result::Success);
        EXPECT_EQ(m_wrapper->OpenProject(L"C:\\p", L""), Result::Failure);
        EXPECT_FALSE(m_wrapper->IsProjectOpen());
        EXPECT_EQ(m_wrapper->RunProviderClient(), Result::Failure);
        m_scc.results = {{"SccCloseProject", code}, {"SccUninitialize", code}};
        EXPECT_EQ(m_wrapper->OpenProject(L"C:\\p", L""), Result::Success);
        EXPECT_EQ(m_wrapper->CloseProject(), Result::Failure);
        EXPECT_EQ(m_wrapper->Uninitialize(), Result::Failure);
    }
}

TEST_F(Wrapper, CloseProjectWithoutAProjectFailsAndLoadsNothing)
{
    EXPECT_EQ(m_wrapper->CloseProject(), Result::Failure);
    EXPECT_THAT(m_scc.calls, IsEmpty());
}

TEST_F(Wrapper, ShowHistoryReportsFilesToReload)
{
    Open();
    ActiveList list{L"C:\\a"};
    m_scc.results["SccHistory"] = SCC_I_RELOADFILE;
    EXPECT_EQ(m_wrapper->ShowHistory(list.Get()), Result::ReloadFiles);
    for (const SCCRTN code : CodesOtherThanOK())
    {
        if (code == SCC_I_RELOADFILE)
        {
            continue;
        }
        m_scc.results["SccHistory"] = code;
        EXPECT_EQ(m_wrapper->ShowHistory(list.Get()), code < 0 ? Result::Failure : Result::Success) << code;
    }
}

TEST_F(Wrapper, OperationsWorkWithoutAnOpenProject)
{
    ActiveList list{L"C:\\a"};
    ASSERT_EQ(m_wrapper->Initialize(&m_info), Result::Success);
    EXPECT_EQ(m_wrapper->GetLatest(list.Get(), 0), Result::Success);
    EXPECT_THAT(m_scc.Take(), Contains(R"(SccGet(0x77, 0x1234, 0x1, ["C:\a"], 0x0, 0x0))"));
}

TEST_F(Wrapper, HostMayCallBackDuringAnOperation)
{
    Open();
    ActiveList list{L"C:\\a"};
    ActiveList other{L"C:\\other", L"C:\\one more"};
    m_scc.add = [&](LPVOID, HWND, LONG count, LPCSTR* names, LPCSTR comment, LONG* options, LPCMDOPTS) {
        EXPECT_EQ(m_wrapper->CheckIn(other.Get(), L"inner", 0), Result::Success);
        EXPECT_EQ(m_wrapper->QueryStatus(other.Get(), 0), Result::Success);
        EXPECT_EQ(count, 1);
        EXPECT_STREQ(names[0], "C:\\a");
        EXPECT_STREQ(comment, "outer");
        EXPECT_EQ(options[0], SCC_KEEP_CHECKEDOUT);
        return SCC_OK;
    };
    EXPECT_EQ(m_wrapper->Add(list.Get(), L"outer", Option::KeepCheckedOut), Result::Success);
    EXPECT_EQ(m_scc.Take().size(), 3u);
    EXPECT_EQ(other.FlagsOf(1), State::NotControlled | Permission::Add);
}

TEST_F(Wrapper, LibraryMayReorderTheArrayOfNames)
{
    Open();
    ActiveList list{L"C:\\a", L"C:\\b"};
    m_scc.get = [](LPVOID, HWND, LONG, LPCSTR* names, LONG, LPCMDOPTS) {
        names[0] = nullptr;
        return SCC_OK;
    };
    EXPECT_EQ(m_wrapper->GetLatest(list.Get(), 0), Result::Success);
    EXPECT_EQ(m_wrapper->GetLatest(list.Get(), 0), Result::Success);
    EXPECT_THAT(m_scc.Take(), Each(R"(SccGet(0x77, 0x1234, 0x2, ["C:\a", "C:\b"], 0x0, 0x0))"));
}

TEST_P(WrapperOperation, SendsNothingForAnEmptyActiveList)
{
    Open();
    ActiveList list{L"C:\\a"};
    list->RemoveActiveEntry(list->GetFileEntry(0));
    EXPECT_EQ(GetParam().run(*m_wrapper, list.Get()), Result::Failure);
    EXPECT_THAT(m_scc.Take(), IsEmpty());
    EXPECT_EQ(list.FlagsOf(0), 0u);
}

TEST_P(WrapperOperation, SendsNothingForNoList)
{
    Open();
    EXPECT_EQ(GetParam().run(*m_wrapper, nullptr), Result::Failure);
    EXPECT_THAT(m_scc.Take(), IsEmpty());
}

TEST_P(WrapperOperation, SendsNothingForAListWithAMissingEntry)
{
    class ListWithAHole : public OrvixFileList
    {
    public:
        OrvixFileEntry* GetActiveFileEntry(unsigned int) override { return nullptr; }
    };
    Open();
    ListWithAHole list;
    list.AddActiveEntry(list.CreateEntry(L"C:\\a", nullptr, 0, 0));
    EXPECT_EQ(GetParam().run(*m_wrapper, &list), Result::Failure);
    EXPECT_THAT(m_scc.Take(), IsEmpty());
}

TEST_P(WrapperOperation, WhoseListThrowsFails)
{
    class ThrowingList : public OrvixFileList
    {
    public:
        unsigned int NumActiveEntries() override { throw 1; }
    };
    Open();
    ThrowingList list;
    EXPECT_EQ(GetParam().run(*m_wrapper, &list), Result::Failure);
    EXPECT_THAT(m_scc.Take(), IsEmpty());
}

TEST_P(WrapperOperation, FailsForEveryCodeExceptOK)
{
    Open();
    ActiveList list{L"C:\\a"};
    for (const SCCRTN code : CodesOtherThanOK())
    {
        if (code > 0 && GetParam().name == std::string_view("ShowHistory"))
        {
            continue;
        }
        m_scc.results[GetParam().function] = code;
        EXPECT_EQ(GetParam().run(*m_wrapper, list.Get()), Result::Failure) << code;
    }
}

TEST_P(WrapperOperation, FailsWhenTheLibraryHasNoSuchFunction)
{
    const std::string function = GetParam().function;
    m_wrapper->SetMSSCC(NewBridge(L"recording_without_" + std::wstring(function.begin(), function.end())));
    Open();
    ActiveList list{L"C:\\a"};
    EXPECT_EQ(GetParam().run(*m_wrapper, list.Get()), Result::Failure);
    EXPECT_THAT(m_scc.Take(), Not(Contains(HasSubstr(function))));
}

TEST_P(WrapperOperation, FailsWhenThereIsNoLibrary)
{
    m_wrapper->SetMSSCC(NewBridge(L"missing"));
    ActiveList list{L"C:\\a"};
    const bool asksNothing = GetParam().name == std::string_view("QueryStatus"); // without a project
    EXPECT_EQ(GetParam().run(*m_wrapper, list.Get()), asksNothing ? Result::Success : Result::Failure);
}

INSTANTIATE_TEST_SUITE_P(Each, WrapperOperation, testing::ValuesIn(ListOperations), NameOfOperation());

TEST_F(Wrapper, DestructorEndsAndFreesTheLibrary)
{
    Open();
    m_wrapper.reset();
    EXPECT_THAT(m_scc.calls, ElementsAre("SccCloseProject(0x77)", "SccUninitialize(0x77)", "unload recording_full"));
}

TEST_F(Wrapper, WithoutABridgeCanBeDestroyed)
{
    EXPECT_NO_THROW(OrvixProviderWrapper());
    EXPECT_THAT(m_scc.calls, IsEmpty());
}

TEST_F(Wrapper, NewBridgeReplacesAndDeletesTheOldOne)
{
    Open();
    m_wrapper->SetMSSCC(NewBridge(L"recording_without_SccAdd"));
    EXPECT_THAT(m_scc.calls, ElementsAre("SccCloseProject(0x77)", "SccUninitialize(0x77)", "unload recording_full"));
    m_scc.calls.clear();
    EXPECT_FALSE(m_wrapper->IsInitialized());
    EXPECT_EQ(m_wrapper->Initialize(&m_info), Result::Success);
    EXPECT_THAT(m_scc.calls, Contains("load recording_without_SccAdd"));
}
