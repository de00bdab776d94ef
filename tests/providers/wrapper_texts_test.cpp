#include "OrvixFileFlags.h"
#include "WrapperTest.h"

#include <stdexcept>
#include <string_view>

using testing::Contains;
using testing::Each;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;

namespace
{

/// The letters of these tests are in code page 1252.
class WrapperTexts : public WrapperTest
{
protected:
    void SetUp() override
    {
        if (GetACP() != 1252)
        {
            GTEST_SKIP() << "another ANSI code page";
        }
    }
};

class WrapperTextsOperation : public WrapperTexts, public testing::WithParamInterface<ListOperation>
{
};

/// Paths that would reach the library as those of other files.
constexpr const wchar_t* InexactPaths[] = {
    L"C:\\\u5009.txt",     // becomes a question mark
    L"C:\\\uFF21.txt",     // a full-width A becomes A
    L"C:\\a\u2044b",       // a fraction slash becomes a slash
    L"C:\\\u0100",         // A with macron becomes A
    L"C:\\\u221E",         // infinity becomes 8
    L"C:\\\xD800.txt",     // half a pair
    L"C:\\e\u0301.txt",    // a combining accent
    L"C:\\\xD83D\xDE00.c", // a pair
};

class WrapperOutput : public WrapperTest
{
protected:
    /// Opens a project and returns the callback that the library got.
    LPTEXTOUTPROC OpenForOutput(OrvixProviderWrapper& wrapper)
    {
        LPTEXTOUTPROC output = nullptr;
        m_scc.openProject = [&output](LPVOID, HWND, LPSTR, LPCSTR, LPCSTR, LPSTR, LPCSTR, LPTEXTOUTPROC given, LONG) {
            output = given;
            return SCC_OK;
        };
        EXPECT_EQ(wrapper.OpenProject(L"C:\\Project", L""), Result::Success);
        m_scc.openProject = nullptr;
        return output;
    }

    void InitializeFor(OrvixProviderWrapper& wrapper, IOrvixClientAccess* access)
    {
        Host() = {};
        m_info.SetIOrvixClientAccess(access);
        EXPECT_EQ(wrapper.Initialize(&m_info), Result::Success);
    }
};

} // namespace

TEST_P(WrapperTextsOperation, SendsNothingForAPathThatTheCodePageCannotExpress)
{
    if (std::string_view(GetParam().name) == "QueryStatus")
    {
        return; // leaves such files out, see below
    }
    Open();
    for (const wchar_t* path : InexactPaths)
    {
        ActiveList list{path, L"C:\\plain"};
        EXPECT_EQ(GetParam().run(*m_wrapper, list.Get()), Result::Failure);
        EXPECT_THAT(m_scc.Take(), IsEmpty());
        EXPECT_EQ(list.FlagsOf(1), 0u);
    }
}

TEST_P(WrapperTextsOperation, SendsAPathThatTheCodePageCanExpress)
{
    Open();
    ActiveList list{L"C:\\Caf\u00E9\\\u20AC 100.txt"};
    EXPECT_EQ(GetParam().run(*m_wrapper, list.Get()), Result::Success);
    EXPECT_THAT(m_scc.Take(), Each(HasSubstr("\"C:\\Caf\xE9\\\x80 100.txt\"")));
}

INSTANTIATE_TEST_SUITE_P(Each, WrapperTextsOperation, testing::ValuesIn(ListOperations), NameOfOperation());

TEST_F(WrapperTexts, OneInexactPathAmongManyStopsTheOperation)
{
    Open();
    ActiveList list{L"C:\\a", L"C:\\b", L"C:\\\uFF21"};
    EXPECT_EQ(m_wrapper->CheckIn(list.Get(), L"", 0), Result::Failure);
    EXPECT_THAT(m_scc.Take(), IsEmpty());
}

TEST_F(WrapperTexts, AQueryLeavesInexactPathsOutAsNeitherControlledNorToBeAdded)
{
    Open();
    m_scc.queryInfo = [](LPVOID, LONG, LPCSTR*, LONG* status) {
        status[0] = SCC_STATUS_CONTROLLED;
        status[1] = SCC_STATUS_NOTCONTROLLED;
        return SCC_OK;
    };
    ActiveList list{L"C:\\\u5009", L"C:\\a", L"C:\\\uFF21", L"C:\\b", L"C:\\\u0100"};
    EXPECT_EQ(m_wrapper->QueryStatus(list.Get(), 0), Result::Success);
    EXPECT_THAT(m_scc.Take(), ElementsAre(HasSubstr(R"(0x2, ["C:\a", "C:\b"])")));
    for (const unsigned int leftOut : {0U, 2U, 4U})
    {
        EXPECT_EQ(list.FlagsOf(leftOut), OrvixFileState::NotControlled);
    }
    EXPECT_NE(list.FlagsOf(1) & OrvixFileState::Controlled, 0U);
    EXPECT_NE(list.FlagsOf(3) & OrvixFilePermission::Add, 0U);
}

TEST_F(WrapperTexts, AQueryOfInexactPathsAloneAsksNothing)
{
    Open();
    ActiveList list{L"C:\\\u5009"};
    EXPECT_EQ(m_wrapper->QueryStatus(list.Get(), 0), Result::Success);
    EXPECT_THAT(m_scc.Take(), IsEmpty());
    EXPECT_EQ(list.FlagsOf(0), OrvixFileState::NotControlled);
}

TEST_F(WrapperTexts, ProjectFolderMustBeExact)
{
    ASSERT_EQ(m_wrapper->Initialize(&m_info), Result::Success);
    m_scc.Take();
    for (const wchar_t* path : InexactPaths)
    {
        EXPECT_EQ(m_wrapper->OpenProject(path, L""), Result::Failure);
    }
    EXPECT_THAT(m_scc.Take(), IsEmpty());
    EXPECT_EQ(m_wrapper->OpenProject(L"C:\\Caf\u00E9", L""), Result::Success);
    EXPECT_THAT(m_scc.Take(), ElementsAre(HasSubstr("\"C:\\Caf\xE9\"")));
}

TEST_F(WrapperTexts, CommentsAndNamesMayLoseCharacters)
{
    m_info.SetClientName(L"H\u00F4te \u5009");
    EXPECT_EQ(m_wrapper->Initialize(&m_info), Result::Success);
    EXPECT_THAT(m_scc.Take(), Contains(HasSubstr("\"H\xF4te ?\"")));
    EXPECT_EQ(m_wrapper->OpenProject(L"C:\\p", L"\u00E9 \u5009"), Result::Success);
    ActiveList list{L"C:\\a"};
    EXPECT_EQ(m_wrapper->CheckIn(list.Get(), L"\u00E9 \u5009", 0), Result::Success);
    EXPECT_EQ(m_wrapper->CheckOut(list.Get(), L"\u00E9 \u5009", 0), Result::Success);
    EXPECT_EQ(m_wrapper->Add(list.Get(), L"\u00E9 \u5009", 0), Result::Success);
    const Calls calls = m_scc.Take();
    EXPECT_EQ(calls.size(), 4u);
    EXPECT_THAT(calls, Each(HasSubstr("\"\xE9 ?\"")));
}

TEST_F(WrapperTest, NullCommentIsAnEmptyOne)
{
    EXPECT_EQ(m_wrapper->OpenProject(L"C:\\p", nullptr), Result::Success);
    ActiveList list{L"C:\\a"};
    EXPECT_EQ(m_wrapper->CheckIn(list.Get(), nullptr, 0), Result::Success);
    EXPECT_EQ(m_wrapper->CheckOut(list.Get(), nullptr, 0), Result::Success);
    EXPECT_EQ(m_wrapper->Add(list.Get(), nullptr, 0), Result::Success);
    EXPECT_THAT(m_scc.Take(), ElementsAre("SccGetVersion()", R"(SccOpenProject(0x0, 0x0, "", "", "C:\p", "", "", 0x1))",
                                          R"(SccCheckin(0x0, 0x0, 0x1, ["C:\a"], "", 0x0, 0x0))",
                                          R"(SccCheckout(0x0, 0x0, 0x1, ["C:\a"], "", 0x0, 0x0))",
                                          R"(SccAdd(0x0, 0x0, 0x1, ["C:\a"], "", [0x0], 0x0))"));
}

TEST_F(WrapperTest, NullProjectFolderSendsNothing)
{
    EXPECT_EQ(m_wrapper->OpenProject(nullptr, L""), Result::Failure);
    EXPECT_THAT(m_scc.calls, IsEmpty());
}

TEST_F(WrapperTest, EntryWithoutAPathSendsNothing)
{
    class NullEntry : public OrvixFileEntry
    {
    public:
        const wchar_t* GetFile() override { return nullptr; }
    };
    Open();
    NullEntry entry;
    OrvixFileList list;
    list.AddActiveEntry(&entry);
    EXPECT_EQ(m_wrapper->GetLatest(&list, 0), Result::Failure);
    EXPECT_THAT(m_scc.Take(), IsEmpty());
}

TEST_F(WrapperTest, LongPathsAndCommentsArriveWhole)
{
    Open();
    const std::wstring path = L"C:\\" + std::wstring(5000, L'p');
    const std::wstring comment(70000, L'c');
    ActiveList list{path.c_str()};
    EXPECT_EQ(m_wrapper->CheckIn(list.Get(), comment.c_str(), 0), Result::Success);
    EXPECT_THAT(m_scc.Take(), ElementsAre("SccCheckin(0x77, 0x1234, 0x1, [\"C:\\" + std::string(5000, 'p') + "\"], \"" +
                                          std::string(70000, 'c') + "\", 0x0, 0x0)"));
}

TEST_F(WrapperTest, ManyPathsArriveInTheOrderOfTheList)
{
    Open();
    ActiveList list{};
    std::vector<std::string> expected;
    for (int i = 0; i < 3000; ++i)
    {
        list.Append((L"C:\\" + std::to_wstring(i)).c_str());
        expected.push_back("C:\\" + std::to_string(i));
    }
    std::vector<std::string> received;
    m_scc.get = [&](LPVOID, HWND, LONG count, LPCSTR* names, LONG, LPCMDOPTS) {
        received.assign(names, names + count);
        return SCC_OK;
    };
    EXPECT_EQ(m_wrapper->GetLatest(list.Get(), 0), Result::Success);
    EXPECT_EQ(received, expected);
}

TEST_F(WrapperOutput, BeforeAnyInitializeIsIgnored)
{
    if (testing::UnitTest::GetInstance()->test_to_run_count() != 1)
    {
        GTEST_SKIP() << "needs a process of its own";
    }
    const LPTEXTOUTPROC output = OpenForOutput(*m_wrapper);
    ASSERT_NE(output, nullptr);
    EXPECT_EQ(output("text", SCC_MSG_INFO), SCC_MSG_RTN_OK);
}

TEST_F(WrapperOutput, WithoutClientAccessIsIgnored)
{
    InitializeFor(*m_wrapper, &Host());
    OrvixProviderWrapper other;
    other.SetMSSCC(NewBridge(L"recording_full"));
    InitializeFor(other, nullptr);
    const LPTEXTOUTPROC output = OpenForOutput(*m_wrapper);
    EXPECT_EQ(output("text", SCC_MSG_INFO), SCC_MSG_RTN_OK);
    EXPECT_THAT(Host().lines, IsEmpty());
}

TEST_F(WrapperOutput, TellsWhichFileStopsAnOperationAndWhy)
{
    InitializeFor(*m_wrapper, &Host());
    OpenForOutput(*m_wrapper);
    ActiveList list{L"C:\\a", L"C:\\\xD800.txt"};
    EXPECT_EQ(m_wrapper->GetLatest(list.Get(), 0), Result::Failure);
    ASSERT_EQ(Host().lines.size(), 1U);
    EXPECT_EQ(Host().lines[0].second, 0);
    EXPECT_NE(Host().lines[0].first.find(L"C:\\\xD800.txt: "), std::wstring::npos);
}

TEST_F(WrapperOutput, TellsOnceThatACommentLosesCharacters)
{
    InitializeFor(*m_wrapper, &Host());
    OpenForOutput(*m_wrapper);
    ActiveList list{L"C:\\a"};
    EXPECT_EQ(m_wrapper->CheckIn(list.Get(), L"plain", 0), Result::Success);
    EXPECT_THAT(Host().lines, IsEmpty());
    EXPECT_EQ(m_wrapper->CheckIn(list.Get(), L"\xD800", 0), Result::Success);
    EXPECT_EQ(Host().lines.size(), 1U);
}

TEST_F(WrapperOutput, ReachesTheHostAsWideTextOfKindZero)
{
    InitializeFor(*m_wrapper, &Host());
    const LPTEXTOUTPROC output = OpenForOutput(*m_wrapper);
    for (LONG kind = -1; kind <= 12; ++kind)
    {
        EXPECT_EQ(output("text", kind), SCC_MSG_RTN_OK);
    }
    EXPECT_EQ(output("text", 999), SCC_MSG_RTN_OK);
    EXPECT_EQ(output("", SCC_MSG_INFO), SCC_MSG_RTN_OK);
    EXPECT_EQ(Host().lines.size(), 16u);
    EXPECT_EQ(Host().lines.back(), OutputHost::Line(L"", 0));
    Host().lines.pop_back();
    EXPECT_THAT(Host().lines, Each(OutputHost::Line(L"text", 0)));
}

TEST_F(WrapperOutput, IsReadAsAnsiText)
{
    if (GetACP() != 1252)
    {
        GTEST_SKIP() << "another ANSI code page";
    }
    InitializeFor(*m_wrapper, &Host());
    EXPECT_EQ(OpenForOutput(*m_wrapper)("caf\xE9 \x80", SCC_MSG_INFO), SCC_MSG_RTN_OK);
    EXPECT_THAT(Host().lines, ElementsAre(OutputHost::Line(L"caf\u00E9 \u20AC", 0)));
}

TEST_F(WrapperOutput, WithoutATextIsIgnored)
{
    InitializeFor(*m_wrapper, &Host());
    EXPECT_EQ(OpenForOutput(*m_wrapper)(nullptr, SCC_MSG_INFO), SCC_MSG_RTN_OK);
    EXPECT_THAT(Host().lines, IsEmpty());
}

TEST_F(WrapperOutput, ComesToTheHostDuringAnOperation)
{
    InitializeFor(*m_wrapper, &Host());
    const LPTEXTOUTPROC output = OpenForOutput(*m_wrapper);
    m_scc.get = [&](LPVOID, HWND, LONG, LPCSTR*, LONG, LPCMDOPTS) { return output("getting", SCC_MSG_WARNING); };
    ActiveList list{L"C:\\a"};
    EXPECT_EQ(m_wrapper->GetLatest(list.Get(), 0), Result::Success);
    EXPECT_THAT(Host().lines, ElementsAre(OutputHost::Line(L"getting", 0)));
}

TEST_F(WrapperOutput, OfEveryLibraryGoesToTheHostOfTheLastInitialize)
{
    static OutputHost lastHost; // the wrappers keep it after the test
    OrvixProviderWrapper other;
    other.SetMSSCC(NewBridge(L"recording_full"));
    InitializeFor(*m_wrapper, &Host());
    const LPTEXTOUTPROC output = OpenForOutput(*m_wrapper);
    InitializeFor(other, &lastHost);
    EXPECT_EQ(output("text", SCC_MSG_INFO), SCC_MSG_RTN_OK);
    EXPECT_THAT(Host().lines, IsEmpty());
    EXPECT_THAT(lastHost.lines, ElementsAre(OutputHost::Line(L"text", 0)));
}

TEST_F(WrapperOutput, GoesToTheHostOfAnInitializeThatTheLibraryRefused)
{
    InitializeFor(*m_wrapper, nullptr);
    const LPTEXTOUTPROC output = OpenForOutput(*m_wrapper);
    OrvixProviderWrapper other;
    other.SetMSSCC(NewBridge(L"missing"));
    m_info.SetIOrvixClientAccess(&Host());
    EXPECT_EQ(other.Initialize(&m_info), Result::Failure);
    EXPECT_EQ(output("text", SCC_MSG_INFO), SCC_MSG_RTN_OK);
    EXPECT_THAT(Host().lines, ElementsAre(OutputHost::Line(L"text", 0)));
}

TEST_F(WrapperOutput, OfAHostThatThrowsLetsNothingReachTheLibrary)
{
    InitializeFor(*m_wrapper, &Host());
    const LPTEXTOUTPROC output = OpenForOutput(*m_wrapper);
    Host().onOutput = [] { throw std::runtime_error("no window"); };
    EXPECT_EQ(output("text", SCC_MSG_INFO), SCC_MSG_RTN_OK);
    EXPECT_EQ(Host().lines.size(), 1u);
}

TEST_F(WrapperOutput, LetsTheHostCallBack)
{
    InitializeFor(*m_wrapper, &Host());
    const LPTEXTOUTPROC output = OpenForOutput(*m_wrapper);
    ActiveList list{L"C:\\a"};
    Host().onOutput = [&] { EXPECT_EQ(m_wrapper->QueryStatus(list.Get(), 0), Result::Success); };
    EXPECT_EQ(output("text", SCC_MSG_INFO), SCC_MSG_RTN_OK);
    EXPECT_EQ(list.FlagsOf(0), State::NotControlled | Permission::Add);
}

TEST_F(WrapperOutput, TellsOnceThatACommentIsLongerThanTheLibraryTakes)
{
    m_scc.initialize = [](LPVOID* context, HWND, LPCSTR, LPSTR, LPLONG, LPSTR, LPLONG checkoutLength, LPLONG length) {
        *context = reinterpret_cast<LPVOID>(0x77);
        *checkoutLength = 5;
        *length = 3;
        return SCC_OK;
    };
    InitializeFor(*m_wrapper, &Host());
    OpenForOutput(*m_wrapper);
    ActiveList list{L"C:\\a"};
    m_wrapper->CheckIn(list.Get(), L"abc", 0);
    m_wrapper->Add(list.Get(), L"abc", 0);
    m_wrapper->CheckOut(list.Get(), L"abcde", 0);
    EXPECT_THAT(Host().lines, IsEmpty());
    m_wrapper->CheckIn(list.Get(), L"abcd", 0);
    ASSERT_EQ(Host().lines.size(), 1U);
    EXPECT_NE(Host().lines[0].first.find(L"longer than the 3 bytes"), std::wstring::npos);
    m_wrapper->Add(list.Get(), L"abcd", 0);
    m_wrapper->CheckOut(list.Get(), L"abcdef", 0);
    EXPECT_EQ(Host().lines.size(), 3U);
}

TEST_F(WrapperOutput, ForgetsTheClientAccessWithTheLastWrapperThatUsesIt)
{
    OrvixProviderWrapper other;
    other.SetMSSCC(NewBridge(L"recording_full"));
    InitializeFor(other, &Host());
    InitializeFor(*m_wrapper, &Host());
    const LPTEXTOUTPROC output = OpenForOutput(other);
    m_wrapper.reset();
    EXPECT_EQ(output("text", SCC_MSG_INFO), SCC_MSG_RTN_OK);
    EXPECT_EQ(Host().lines.size(), 1U) << "another one uses it";
    Host() = {};
    InitializeFor(other, nullptr);
    EXPECT_EQ(output("text", SCC_MSG_INFO), SCC_MSG_RTN_OK);
    auto last = std::make_unique<OrvixProviderWrapper>();
    last->SetMSSCC(NewBridge(L"recording_full"));
    InitializeFor(*last, &Host());
    last.reset();
    EXPECT_EQ(output("text", SCC_MSG_INFO), SCC_MSG_RTN_OK);
    EXPECT_THAT(Host().lines, IsEmpty());
}

using WrapperQuery = WrapperTest;

TEST_F(WrapperQuery, OfAnInexactNameWithoutAProjectIsNotControlled)
{
    ActiveList list{L"C:\\a", L"C:\\\xD800.txt"};
    EXPECT_EQ(m_wrapper->QueryStatus(list.Get(), 0), Result::Success);
    EXPECT_EQ(list.FlagsOf(0), State::NotControlled);
    EXPECT_EQ(list.FlagsOf(1), State::NotControlled);
}

TEST_F(WrapperQuery, OfMoreFilesThanTheInterfaceCountsIsRefused)
{
    struct HugeList : OrvixFileList
    {
        unsigned int NumActiveEntries() override { return 0x80000000U; }
    };
    Open();
    HugeList list;
    EXPECT_EQ(m_wrapper->QueryStatus(&list, 0), Result::Failure);
    EXPECT_EQ(m_wrapper->CheckIn(&list, L"", 0), Result::Failure);
    EXPECT_THAT(m_scc.Take(), IsEmpty());
}
