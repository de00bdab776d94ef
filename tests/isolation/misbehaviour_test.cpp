#include "Display.h"
#include "IsolatedLibrary.h"
#include "IsolationTest.h"
#include "TempFolder.h"

#include <gmock/gmock.h>

#include <atomic>
#include <cfloat>
#include <chrono>
#include <clocale>
#include <cstdlib>
#include <filesystem>
#include <functional>
#include <memory>
#include <string_view>
#include <tuple>

using testing::AnyOf;
using testing::Contains;
using testing::HasSubstr;
using testing::StartsWith;

namespace
{

using namespace std::chrono_literals;
using Clock = std::chrono::steady_clock;

/// A call of one function of the interface on a started context, and its name.
struct Function
{
    const char* name;
    SCCRTN (*call)(const SccLibrary& library, LPVOID context);
};

LPCSTR file = "C:\\project\\a.txt";
std::array<char, SCC_PRJPATH_SIZE> text = {};
LONG word = 0;
BOOL isNew = FALSE;
LPCMDOPTS block = nullptr;
LPCSTR* added = nullptr;

BOOL KeepGoing(LPVOID, BOOL, LONG, LPSTR)
{
    return TRUE;
}

// SccGetVersion, SccInitialize, SccOpenProject and SccUninitialize have tests of their own.
constexpr Function Functions[] = {
    {"SccCloseProject", [](const SccLibrary& library, LPVOID context) { return library.closeProject(context); }},
    {"SccGetProjPath",
     [](const SccLibrary& library, LPVOID context) {
         return library.getProjPath(context, nullptr, text.data(), text.data(), text.data(), text.data(), TRUE, &isNew);
     }},
    {"SccGet",
     [](const SccLibrary& library, LPVOID context) { return library.get(context, nullptr, 1, &file, 0, nullptr); }},
    {"SccCheckout", [](const SccLibrary& library,
                       LPVOID context) { return library.checkout(context, nullptr, 1, &file, "", 0, nullptr); }},
    {"SccUncheckout", [](const SccLibrary& library,
                         LPVOID context) { return library.uncheckout(context, nullptr, 1, &file, 0, nullptr); }},
    {"SccCheckin", [](const SccLibrary& library,
                      LPVOID context) { return library.checkin(context, nullptr, 1, &file, "", 0, nullptr); }},
    {"SccAdd", [](const SccLibrary& library,
                  LPVOID context) { return library.add(context, nullptr, 1, &file, "", &word, nullptr); }},
    {"SccHistory",
     [](const SccLibrary& library, LPVOID context) { return library.history(context, nullptr, 1, &file, 0, nullptr); }},
    {"SccProperties",
     [](const SccLibrary& library, LPVOID context) { return library.properties(context, nullptr, file); }},
    {"SccQueryInfo",
     [](const SccLibrary& library, LPVOID context) { return library.queryInfo(context, 1, &file, &word); }},
    {"SccPopulateList",
     [](const SccLibrary& library, LPVOID context) {
         return library.populateList(context, SCC_COMMAND_GET, 1, &file, KeepGoing, nullptr, &word, 0);
     }},
    {"SccRunScc", [](const SccLibrary& library, LPVOID context) { return library.runScc(context, nullptr, 1, &file); }},
    {"SccGetCommandOptions",
     [](const SccLibrary& library, LPVOID context) {
         return library.getCommandOptions(context, nullptr, SCC_COMMAND_GET, &block);
     }},
    {"SccAddFromScc",
     [](const SccLibrary& library, LPVOID context) { return library.addFromScc(context, nullptr, &word, &added); }},
    {"SccSetOption", [](const SccLibrary& library, LPVOID context) { return library.setOption(context, 6, 1); }},
};

// They have no context, and reach every one.
constexpr Function Batch[] = {{"SccBeginBatch", [](const SccLibrary& library, LPVOID) { return library.beginBatch(); }},
                              {"SccEndBatch", [](const SccLibrary& library, LPVOID) { return library.endBatch(); }}};

/// A way to die, and what the host's user reads about it.
struct Death
{
    std::string_view defect;
    const char* said;
};

constexpr Death Hang = {"hang", "hangs in FUNCTION and was ended: no answer and no window for 2 seconds"};
constexpr Death Deaths[] = {{"crash", "crashed in FUNCTION: access violation (0xC0000005) in "},
                            {"exit", "ended its process in FUNCTION, with exit code 3"},
                            {"kill", "ended its process in FUNCTION, with exit code 9"},
                            Hang};

std::string Replace(std::string sentence, const std::string& what, const std::string& by)
{
    return sentence.replace(sentence.find(what), what.size(), by);
}

std::wstring Wide(const std::string& ascii)
{
    return {ascii.begin(), ascii.end()};
}

class MisbehaviourTest : public IsolationTest
{
protected:
    /// A fresh process works, after the library behaves again.
    void ExpectWorks() const
    {
        Misbehave(L"");
        Session session(m_library);
        EXPECT_EQ(session.result, SCC_OK);
        EXPECT_EQ(session.Open(), SCC_OK);
        EXPECT_EQ(session.Get(), SCC_OK);
        EXPECT_EQ(session.Uninitialize(), SCC_OK);
        EXPECT_EQ(Processes(), 0u);
    }

    /// The library for a way to die: hangs are waited for.
    const SccLibrary& LibraryFor(const Death& death) const
    {
        return death.defect == Hang.defect ? m_impatient : m_library;
    }

    const SccLibrary m_library{Proxy()};
    const SccLibrary m_impatient{ImpatientProxy()};
};

class EveryFunction : public MisbehaviourTest, public testing::WithParamInterface<std::tuple<Function, Death>>
{
};

std::string NameOf(const testing::TestParamInfo<std::tuple<Function, Death>>& info)
{
    return std::string(std::get<Function>(info.param).name) + '_' + std::string(std::get<Death>(info.param).defect);
}

} // namespace

TEST_P(EveryFunction, MayEndTheProcessAndTheHostGoesOn)
{
    const auto& [function, death] = GetParam();
    Misbehave(Wide(std::string(death.defect) + '-' + function.name));
    const SccLibrary& library = LibraryFor(death);
    {
        Session session(library);
        ASSERT_EQ(session.Open(), SCC_OK);
        const Clock::time_point start = Clock::now();
        EXPECT_EQ(function.call(library, session.context), SCC_E_NONSPECIFICERROR);
        EXPECT_LT(Clock::now() - start, 20s);
        EXPECT_THAT(Text(), HasSubstr("error: Isolated " + Replace(death.said, "FUNCTION", function.name)));
        EXPECT_EQ(session.Get(), SCC_E_NONSPECIFICERROR);
        EXPECT_EQ(function.call(library, session.context), SCC_E_NONSPECIFICERROR);
        EXPECT_EQ(session.Open(), SCC_E_NONSPECIFICERROR);
        EXPECT_EQ(session.Uninitialize(), SCC_E_NONSPECIFICERROR);
        EXPECT_EQ(Text(), "") << "it is said once";
    }
    ExpectWorks();
}

// Hangs take time: those of the functions with a context come in one test, at the same time.
INSTANTIATE_TEST_SUITE_P(, EveryFunction,
                         testing::Combine(testing::ValuesIn(Functions),
                                          testing::ValuesIn(Deaths, std::end(Deaths) - 1)),
                         NameOf);
INSTANTIATE_TEST_SUITE_P(Batch, EveryFunction, testing::Combine(testing::ValuesIn(Batch), testing::ValuesIn(Deaths)),
                         NameOf);

TEST_F(MisbehaviourTest, EveryFunctionMayHang)
{
    std::vector<std::unique_ptr<Session>> sessions;
    for (const Function& function : Functions)
    {
        Misbehave(L"hang-" + Wide(function.name));
        sessions.push_back(std::make_unique<Session>(m_impatient));
        ASSERT_EQ(sessions.back()->Open(), SCC_OK);
    }
    std::array<SCCRTN, std::size(Functions)> results = {};
    std::vector<std::thread> callers;
    for (std::size_t i = 0; i < results.size(); ++i)
    {
        callers.emplace_back([&, i] { results[i] = Functions[i].call(m_impatient, sessions[i]->context); });
    }
    for (std::thread& caller : callers)
    {
        caller.join();
    }
    EXPECT_THAT(results, testing::Each(SCC_E_NONSPECIFICERROR));
    const std::string said = Text();
    for (const Function& function : Functions)
    {
        EXPECT_THAT(said, HasSubstr("error: Isolated " + Replace(Hang.said, "FUNCTION", function.name)));
    }
    sessions.clear();
    ExpectWorks();
}

TEST_F(MisbehaviourTest, AHangAfterSignsOfLifeIsSaidToLastAsLongAsThePatience)
{
    Misbehave(L"talk-SccGet hang-SccGet");
    Session session(m_impatient);
    ASSERT_EQ(session.Open(), SCC_OK);
    EXPECT_EQ(session.Get(), SCC_E_NONSPECIFICERROR);
    EXPECT_THAT(Text(), HasSubstr("hangs in SccGet and was ended: no answer and no window for 2 seconds"));
}

TEST_F(MisbehaviourTest, AHangAfterTheEndIsEndedSoonWhateverThePatience)
{
    Misbehave(L"hang-unload");
    Session session(m_library);
    ASSERT_EQ(session.Open(), SCC_OK);
    const Clock::time_point start = Clock::now();
    EXPECT_EQ(session.Uninitialize(), SCC_OK);
    EXPECT_LT(Clock::now() - start, 40s);
    EXPECT_THAT(Text(), HasSubstr("hangs in SccUninitialize and was ended: no answer and no window for 5 seconds"));
    ExpectWorks();
}

namespace
{

class EveryDeath : public MisbehaviourTest, public testing::WithParamInterface<Death>
{
protected:
    void MisbehaveIn(const char* function) const { Misbehave(Wide(std::string(GetParam().defect) + '-' + function)); }

    const SccLibrary& m_dying = LibraryFor(GetParam());
};

} // namespace

TEST_P(EveryDeath, MayComeBeforeTheStart)
{
    MisbehaveIn("SccGetVersion");
    EXPECT_EQ(m_dying.getVersion(), 0);
    MisbehaveIn("SccInitialize");
    EXPECT_EQ(Session(m_dying).result, SCC_E_NONSPECIFICERROR);
    ExpectWorks();
}

TEST_P(EveryDeath, MayComeWhenTheProjectIsOpened)
{
    MisbehaveIn("SccOpenProject");
    Session session(m_dying);
    EXPECT_EQ(session.Open(), SCC_E_NONSPECIFICERROR);
    EXPECT_THAT(Text(), HasSubstr(Replace(GetParam().said, "FUNCTION", "SccOpenProject")));
    EXPECT_EQ(session.Uninitialize(), SCC_E_NONSPECIFICERROR);
    ExpectWorks();
}

TEST_P(EveryDeath, MayComeAtTheEnd)
{
    MisbehaveIn("SccUninitialize");
    Session session(m_dying);
    ASSERT_EQ(session.Open(), SCC_OK);
    EXPECT_EQ(session.Uninitialize(), SCC_E_NONSPECIFICERROR);
    EXPECT_THAT(Text(), HasSubstr(Replace(GetParam().said, "FUNCTION", "SccUninitialize")));
    ExpectWorks();
}

INSTANTIATE_TEST_SUITE_P(, EveryDeath, testing::ValuesIn(Deaths),
                         [](const auto& death) { return std::string(death.param.defect); });

TEST_F(MisbehaviourTest, AnIdleProcessMayBeKilled)
{
    Session session(m_library);
    ASSERT_EQ(session.Open(), SCC_OK);
    const std::vector<std::string> lines = Lines();
    const auto line =
        std::find_if(lines.begin(), lines.end(), [](const std::string& one) { return one.starts_with("process "); });
    ASSERT_NE(line, lines.end());
    const UniqueKernelHandle process(
        OpenProcess(PROCESS_TERMINATE, FALSE, static_cast<DWORD>(std::stoul(line->substr(8)))));
    ASSERT_TRUE(TerminateProcess(process.Get(), 5));
    EXPECT_EQ(session.Get(), SCC_E_NONSPECIFICERROR);
    EXPECT_THAT(Text(), HasSubstr("ended its process in SccGet, with exit code 5"));
    EXPECT_EQ(session.Uninitialize(), SCC_E_NONSPECIFICERROR);
    ExpectWorks();
}

TEST_F(MisbehaviourTest, OtherCrashesHaveTheirNames)
{
    const std::pair<const wchar_t*, const char*> crashes[] = {
        {L"overflow-SccGet", "SccGet"}, // Wine ends the process without a word
        {L"thread-crash-SccGet", "access violation (0xC0000005) in "},
        {L"abort-SccGet", "SccGet"}};
    for (const auto& [defect, said] : crashes)
    {
        Misbehave(defect);
        Session session(m_library);
        session.Open();
        Lines();
        EXPECT_EQ(session.Get(), SCC_E_NONSPECIFICERROR);
        EXPECT_THAT(Text(), HasSubstr(said));
    }
    ExpectWorks();
}

TEST_F(MisbehaviourTest, ACrashIsSeenThoughTheLibraryHasRemovedTheHandler)
{
    Misbehave(L"change-SccGet crash-SccCheckout");
    Session session(m_library);
    session.Open();
    EXPECT_EQ(session.Get(), SCC_OK);
    EXPECT_EQ(m_library.checkout(session.context, nullptr, 1, &file, "", 0, nullptr), SCC_E_NONSPECIFICERROR);
    EXPECT_THAT(Text(), HasSubstr(" at offset "));
}

TEST_F(MisbehaviourTest, TheHostsListIsNotCalledAfterSccPopulateList)
{
    Misbehave(L"list-SccGet");
    Session session(m_library);
    session.Open();
    int calls = 0;
    const auto count = [](LPVOID data, BOOL, LONG, LPSTR) -> BOOL {
        ++*static_cast<int*>(data);
        return TRUE;
    };
    EXPECT_EQ(m_library.populateList(session.context, SCC_COMMAND_GET, 1, &file, count, &calls, &word, 0), SCC_OK);
    EXPECT_EQ(calls, 1);
    EXPECT_EQ(session.Get(), SCC_OK);
    EXPECT_EQ(calls, 1);
}

TEST_F(MisbehaviourTest, EveryCallHasTheHostsFolder)
{
    Misbehave(L"change-SccGet state-SccCheckout");
    Session session(m_library);
    session.Open();
    EXPECT_EQ(session.Get(), SCC_OK);
    EXPECT_EQ(m_library.checkout(session.context, nullptr, 1, &file, "", 0, nullptr), SCC_OK);
    EXPECT_THAT(Text(), HasSubstr("folder " + std::filesystem::current_path().string() + ','));
}

TEST_F(MisbehaviourTest, AnExceptionIsTheFailureThatOrvixCoreMakesOfIt)
{
    Misbehave(L"throw-SccGet");
    Session session(m_library);
    session.Open();
    EXPECT_EQ(session.Get(), SCC_E_INITIALIZEFAILED);
    EXPECT_EQ(m_library.closeProject(session.context), SCC_OK) << "the process lives on";
}

TEST_F(MisbehaviourTest, ALibraryMayCrashOrRefuseWhenItIsLoaded)
{
    for (const wchar_t* defect : {L"crash-load", L"refuse-load"})
    {
        Misbehave(defect);
        EXPECT_EQ(m_library.getVersion(), 0);
        EXPECT_LT(Session(m_library).result, SCC_OK);
    }
    ExpectWorks();
}

TEST_F(MisbehaviourTest, ALibraryMayEndItsProcessWhenItIsLoaded)
{
    Misbehave(L"kill-load");
    EXPECT_EQ(m_library.getVersion(), 0);
    EXPECT_EQ(Session(m_library).result, SCC_E_NONSPECIFICERROR);
    const auto library =
        std::make_shared<IsolatedLibrary>(IsolationSettings::Read(Proxy().parent_path()), std::wstring());
    EXPECT_EQ(library->Call(SccCalls::GetVersion), SCC_E_NONSPECIFICERROR);
    EXPECT_THAT(library->LastReport(), StartsWith(L"Isolated ended its process in its start, with exit code 9"));
    ExpectWorks();
}

TEST_F(MisbehaviourTest, ACrashInOneContextSparesTheOthers)
{
    Session good(m_library);
    ASSERT_EQ(good.Open(), SCC_OK);
    Misbehave(L"crash-SccGet");
    Session bad(m_library);
    ASSERT_EQ(bad.Open(), SCC_OK);
    EXPECT_EQ(bad.Get(), SCC_E_NONSPECIFICERROR);
    EXPECT_EQ(good.Get(), SCC_OK);
}

TEST_F(MisbehaviourTest, ALibraryThatTalksIsNotEnded)
{
    for (const wchar_t* how : {L"talk-SccGet", L"murmur-SccGet"}) // on its own thread, and on another one
    {
        Misbehave(how);
        Session session(m_impatient);
        session.Open();
        const Clock::time_point start = Clock::now();
        EXPECT_EQ(session.Get(), SCC_OK);
        EXPECT_GE(Clock::now() - start, 2900ms);
    }
}

TEST_F(MisbehaviourTest, TheHostsProcessStaysAsItIs)
{
    Misbehave(L"change-SccGet");
    Session session(m_library);
    session.Open();
    const std::filesystem::path folder = std::filesystem::current_path();
    const std::string locale = std::setlocale(LC_ALL, nullptr);
    const DWORD dllDirectory = GetDllDirectoryW(0, nullptr);
    unsigned before = 0;
    _controlfp_s(&before, 0, 0);
    EXPECT_EQ(session.Get(), SCC_OK);
    unsigned after = 0;
    _controlfp_s(&after, 0, 0);
    EXPECT_EQ(after, before);
    EXPECT_EQ(std::filesystem::current_path(), folder);
    EXPECT_EQ(std::setlocale(LC_ALL, nullptr), locale);
    EXPECT_EQ(GetDllDirectoryW(0, nullptr), dllDirectory);
    EXPECT_EQ(session.Get(), SCC_OK);
}

namespace
{

/// The folder for temporary files of this process and of those that it starts, while this object lives.
class TemporaryFiles
{
public:
    TemporaryFiles()
    {
        for (const wchar_t* variable : Variables)
        {
            std::wstring value(MAX_PATH, L'\0');
            value.resize(GetEnvironmentVariableW(variable, value.data(), MAX_PATH));
            m_before.push_back(value);
            SetEnvironmentVariableW(variable, m_folder.Text().c_str());
        }
    }
    TemporaryFiles(const TemporaryFiles&) = delete;
    TemporaryFiles& operator=(const TemporaryFiles&) = delete;
    ~TemporaryFiles()
    {
        for (std::size_t i = 0; i < m_before.size(); ++i)
        {
            SetEnvironmentVariableW(Variables[i], m_before[i].c_str());
        }
    }

    const std::filesystem::path& Folder() const { return m_folder.Path(); }

private:
    static constexpr const wchar_t* Variables[] = {L"TMP", L"TEMP"};

    TempFolder m_folder;
    std::vector<std::wstring> m_before;
};

} // namespace

TEST_F(MisbehaviourTest, ManyCrashesLeaveNothingBehind)
{
    // ORVIX_CRASHES=1000 makes it a long test.
    const char* const wanted = std::getenv("ORVIX_CRASHES");
    const int crashes = wanted != nullptr ? std::atoi(wanted) : 10;
    const TemporaryFiles temporary;
    const auto files = [&] {
        const std::filesystem::path library = Proxy().parent_path();
        return std::distance(std::filesystem::directory_iterator(temporary.Folder()), {}) +
               std::distance(std::filesystem::directory_iterator(library), {});
    };
    Misbehave(L"crash-SccGet");
    DWORD handlesBefore = 0;
    std::ptrdiff_t filesBefore = 0;
    for (int i = 0; i <= crashes; ++i)
    {
        Session session(m_library);
        ASSERT_EQ(session.Open(), SCC_OK) << i;
        ASSERT_EQ(session.Get(), SCC_E_NONSPECIFICERROR) << i;
        Lines();
        session.Uninitialize();
        if (i == 0) // what is made once
        {
            GetProcessHandleCount(GetCurrentProcess(), &handlesBefore);
            filesBefore = files();
        }
    }
    DWORD handles = 0;
    GetProcessHandleCount(GetCurrentProcess(), &handles);
    EXPECT_EQ(handles, handlesBefore);
    EXPECT_EQ(files(), filesBefore);
    EXPECT_EQ(Processes(), 0u);
    ExpectWorks();
}

// Windows

namespace
{

constexpr UINT Question = WM_APP;

/// What the library waits for that works until the host says.
const wchar_t* const GoOnEvent = L"OrvixTestGoOn";

/// A window of the host, which counts its messages and calls the library when a timer fires.
class HostWindow
{
public:
    explicit HostWindow(const SccLibrary& library) : m_library(library)
    {
        WNDCLASSW windowClass{};
        windowClass.lpszClassName = L"IsolationHost";
        windowClass.lpfnWndProc = Procedure;
        RegisterClassW(&windowClass);
        m_window = CreateWindowExW(0, L"IsolationHost", L"", WS_POPUP | WS_VISIBLE, 0, 0, 100, 100, nullptr, nullptr,
                                   nullptr, this);
        SetWindowLongPtrW(m_window, GWLP_USERDATA, reinterpret_cast<LONG_PTR>(this));
    }
    HostWindow(const HostWindow&) = delete;
    HostWindow& operator=(const HostWindow&) = delete;
    ~HostWindow() { DestroyWindow(m_window); }

    HWND Get() const { return m_window; }

    int timers = 0;
    int questions = 0;
    int clicks = 0;
    SCCRTN inner = SCC_OK; ///< the result of a call of the library within another one
    LPVOID context = nullptr;
    std::function<void()> beforePaint = [] {};
    std::function<void()> afterPaint = [] {};
    std::function<void()> atTimer = [] {};

private:
    static LRESULT CALLBACK Procedure(HWND window, UINT message, WPARAM first, LPARAM second)
    {
        auto* const self = reinterpret_cast<HostWindow*>(GetWindowLongPtrW(window, GWLP_USERDATA));
        if (self == nullptr)
        {
            return DefWindowProcW(window, message, first, second);
        }
        self->timers += message == WM_TIMER ? 1 : 0;
        self->questions += message == Question ? 1 : 0;
        self->clicks += message == WM_LBUTTONDOWN ? 1 : 0;
        if (message == WM_TIMER)
        {
            self->inner = self->m_library.closeProject(self->context);
            self->atTimer();
        }
        if (message == WM_PAINT)
        {
            self->beforePaint();
        }
        const LRESULT result = message == Question ? 42 : DefWindowProcW(window, message, first, second);
        if (message == WM_PAINT)
        {
            self->afterPaint();
        }
        return result;
    }

    const SccLibrary& m_library;
    HWND m_window = nullptr;
};

/// Appends the text of a window to the list.
BOOL CALLBACK AddText(HWND window, LPARAM list)
{
    std::wstring shown(200, L'\0');
    shown.resize(static_cast<std::size_t>(GetWindowTextW(window, shown.data(), static_cast<int>(shown.size()))));
    *reinterpret_cast<std::wstring*>(list) += L'|' + shown + L'|';
    return TRUE;
}

/// The small window of a slow call; null when it does not come.
HWND WaitForSmallWindow()
{
    HWND small = nullptr;
    for (int i = 0; small == nullptr && i < 300; ++i)
    {
        Sleep(100);
        small = FindWindowW(L"#32770", L"Isolated");
    }
    return small;
}

std::atomic<int> printedLines = 0;

/// The host's text output. Keeps errors alone.
LONG CountLines(LPCSTR line, LONG kind)
{
    ++printedLines;
    return kind == SCC_MSG_ERROR ? IsolationTest::Output(line, kind) : SCC_MSG_RTN_OK;
}

class MisbehaviourInWindows : public MisbehaviourTest
{
protected:
    void SetUp() override
    {
        MisbehaviourTest::SetUp();
        if (!HasDisplay())
        {
            GTEST_SKIP() << "no display to show windows on";
        }
    }
};

} // namespace

TEST_F(MisbehaviourInWindows, TheHostsWindowsLiveDuringASlowCallAndDoNotReenterTheLibrary)
{
    Misbehave(L"slow-SccGet");
    HostWindow window(m_library);
    Session session(m_library, window.Get());
    session.Open();
    window.context = session.context;
    SetTimer(window.Get(), 1, 50, nullptr);
    PostMessageW(window.Get(), WM_LBUTTONDOWN, 0, 0);
    EXPECT_EQ(session.Get(), SCC_OK);
    KillTimer(window.Get(), 1);
    EXPECT_GT(window.timers, 3);
    EXPECT_EQ(window.clicks, 0);
    EXPECT_EQ(window.inner, SCC_E_NONSPECIFICERROR);
    EXPECT_EQ(session.Get(), SCC_OK);
}

TEST_F(MisbehaviourInWindows, AWindowThatPaintsForEverDoesNotHoldUpACall)
{
    Misbehave(L"slow-SccGet");
    HostWindow window(m_library);
    Session session(m_library, window.Get());
    session.Open();
    int paints = 0;
    window.afterPaint = [&] {
        ++paints;
        InvalidateRect(window.Get(), nullptr, FALSE);
    };
    InvalidateRect(window.Get(), nullptr, FALSE);
    EXPECT_EQ(session.Get(), SCC_OK);
    EXPECT_GT(paints, 3);
}

TEST_F(MisbehaviourInWindows, AWindowOfTheLibraryThatPaintsForEverDoesNotHoldUpTheNextCall)
{
    Misbehave(L"paint-SccGet");
    HostWindow window(m_library);
    Session session(m_library, window.Get());
    session.Open();
    EXPECT_EQ(session.Get(), SCC_OK);
    for (int i = 0; i < 20; ++i)
    {
        Sleep(10); // the library's process handles its messages
        EXPECT_EQ(m_library.queryInfo(session.context, 1, &file, &word), SCC_OK);
    }
    EXPECT_EQ(session.Uninitialize(), SCC_OK);
}

TEST_F(MisbehaviourInWindows, AWindowIsPaintedWhileItsThreadWaitsForAnothersCall)
{
    Misbehave(L"work-SccGet");
    const UniqueKernelHandle goOn(CreateEventW(nullptr, TRUE, FALSE, GoOnEvent));
    HostWindow window(m_library);
    Session session(m_library, window.Get());
    session.Open();
    Lines();
    std::atomic<int> paints = 0;
    std::atomic<int> paintsAtEnd = 0;
    std::thread other([&] {
        EXPECT_EQ(session.Get(), SCC_OK);
        paintsAtEnd = paints.load();
    });
    for (int i = 0; i < 1000 && Text().find("SccGet(") == std::string::npos; ++i)
    {
        Sleep(10);
    }
    window.beforePaint = [&] {
        if (++paints > 1) // a call of its own that takes long lets the window paint
        {
            return;
        }
        SetEvent(goOn.Get());
        // Within the paint, which is still due, this waits as well.
        EXPECT_EQ(m_library.closeProject(session.context), SCC_OK);
    };
    InvalidateRect(window.Get(), nullptr, FALSE);
    EXPECT_EQ(m_library.closeProject(session.context), SCC_OK);
    other.join();
    EXPECT_EQ(paintsAtEnd, 1);
}

TEST_F(MisbehaviourInWindows, ACallThatWorksOutlivesALongPauseOfTheHost)
{
    Misbehave(L"work-SccGet");
    const UniqueKernelHandle goOn(CreateEventW(nullptr, TRUE, FALSE, GoOnEvent));
    HostWindow window(m_impatient);
    Session session(m_impatient, window.Get());
    session.Open();
    window.context = session.context;
    window.atTimer = [&] {
        KillTimer(window.Get(), 1);
        Sleep(5500); // as a dialog of the host does
        SetEvent(goOn.Get());
    };
    SetTimer(window.Get(), 1, 50, nullptr);
    EXPECT_EQ(session.Get(), SCC_OK);
    EXPECT_EQ(window.timers, 1);
}

TEST_F(MisbehaviourTest, ThreadsWaitForEachOther)
{
    Misbehave(L"slow-SccGet");
    Session session(m_library);
    session.Open();
    SCCRTN result = SCC_E_NONSPECIFICERROR;
    std::thread other([&] { result = session.Get(); });
    EXPECT_EQ(session.Get(), SCC_OK);
    other.join();
    EXPECT_EQ(result, SCC_OK);
}

TEST_F(MisbehaviourInWindows, TheLibraryReachesTheHostsWindow)
{
    Misbehave(L"message-SccGet");
    HostWindow window(m_library);
    Session session(m_library, window.Get());
    session.Open();
    EXPECT_EQ(session.Get(), SCC_OK);
    EXPECT_EQ(window.questions, 1);
    EXPECT_THAT(Text(), HasSubstr("the window answers 42"));
}

TEST_F(MisbehaviourInWindows, AWindowThatACrashedDialogDisabledGetsInputAgain)
{
    Misbehave(L"window-SccGet crash-in-window");
    HostWindow window(m_library);
    Session session(m_library, window.Get());
    session.Open();
    EXPECT_EQ(session.Get(), SCC_E_NONSPECIFICERROR);
    EXPECT_TRUE(IsWindowEnabled(window.Get()));
}

TEST_F(MisbehaviourInWindows, TheUserMayEndASlowCall)
{
    // SccQueryInfo has no window among its arguments: the small window belongs to the one that the host gave last.
    Misbehave(L"hang-SccQueryInfo");
    HostWindow window(m_library);
    Session session(m_library, window.Get());
    session.Open();
    Lines();
    std::wstring shown;
    std::thread user([&shown] {
        const HWND small = WaitForSmallWindow();
        for (int i = 0; i < 300 && shown.find(L'.') == std::wstring::npos; ++i) // until it is complete
        {
            Sleep(100);
            shown.clear();
            EnumChildWindows(small, AddText, reinterpret_cast<LPARAM>(&shown));
        }
        PostMessageW(small, WM_COMMAND, IDCANCEL, 0);
    });
    const Clock::time_point start = Clock::now();
    EXPECT_EQ(m_library.queryInfo(session.context, 1, &file, &word), SCC_E_NONSPECIFICERROR);
    user.join();
    EXPECT_GE(Clock::now() - start, 4900ms);
    EXPECT_LT(Clock::now() - start, 40s);
    EXPECT_NE(shown.find(L"|Isolated is working on SccQueryInfo.|"), std::wstring::npos)
        << std::filesystem::path(shown).string();
    EXPECT_EQ(shown.find(L"|0:00|"), std::wstring::npos) << "its time began with the call";
    EXPECT_THAT(Text(), HasSubstr("was ended by the user, "));
    EXPECT_TRUE(IsWindowEnabled(window.Get()));
}

TEST_F(MisbehaviourInWindows, TheUserMayEndALibraryThatPrintsWithoutAPause)
{
    constexpr int Many = 1000;

    Misbehave(L"chatter-SccGet");
    HostWindow window(m_library);
    Session session(m_library, window.Get());
    session.Open(CountLines);
    int printed = 0; // while the small window was shown
    std::thread user([&] {
        const HWND small = WaitForSmallWindow();
        const int before = printedLines;
        const Clock::time_point start = Clock::now();
        while (printed < Many && Clock::now() - start < 20s)
        {
            Sleep(10);
            printed = printedLines - before;
        }
        PostMessageW(small, WM_COMMAND, IDCANCEL, 0);
    });
    EXPECT_EQ(session.Get(), SCC_E_NONSPECIFICERROR);
    user.join();
    EXPECT_GE(printed, Many);
    EXPECT_THAT(Text(), HasSubstr("was ended by the user, "));
}

TEST_F(MisbehaviourInWindows, TheQuitMessageReachesTheHostsLoop)
{
    Misbehave(L"slow-SccGet");
    HostWindow window(m_library);
    Session session(m_library, window.Get());
    session.Open();
    PostQuitMessage(7);
    EXPECT_EQ(session.Get(), SCC_OK);
    MSG message{};
    while (PeekMessageW(&message, nullptr, 0, 0, PM_REMOVE) && message.message != WM_QUIT)
    {
    }
    EXPECT_EQ(message.message, static_cast<UINT>(WM_QUIT));
    EXPECT_EQ(message.wParam, 7u);
}

TEST_F(MisbehaviourInWindows, ALibraryThatShowsAWindowIsNotEnded)
{
    Misbehave(L"window-SccGet");
    HostWindow window(m_impatient);
    Session session(m_impatient, window.Get());
    session.Open();
    const Clock::time_point start = Clock::now();
    EXPECT_EQ(session.Get(), SCC_OK);
    EXPECT_GE(Clock::now() - start, 2900ms);
}
