#include "CurrentFolder.h"
#include "IsolationTest.h"
#include "TempFolder.h"

#include <gmock/gmock.h>

#include <algorithm>
#include <bit>
#include <cstdint>
#include <set>
#include <sstream>

using testing::HasSubstr;

namespace
{

/// The library itself, and its proxy.
std::vector<std::filesystem::path> BothWays()
{
    return {ORVIX_MISBEHAVING_SCC, IsolationTest::Proxy()};
}

/// What a library did, as text.
class Transcript
{
public:
    template <typename Value>
    Transcript& operator<<(const Value& value)
    {
        m_text << value << '\n';
        return *this;
    }
    std::string Text() const { return m_text.str(); }

private:
    std::ostringstream m_text;
};

BOOL List(LPVOID data, BOOL add, LONG status, LPSTR name)
{
    auto& transcript = *static_cast<Transcript*>(data);
    transcript << "listed" << add << status << (name != nullptr ? name : "(null)");
    return status < 1 ? TRUE : FALSE;
}

/// Runs without the lines that name a process.
std::string Printed(std::vector<std::string> lines)
{
    std::string text;
    for (const std::string& line : lines)
    {
        text += line.starts_with("process ") ? "" : line + '\n';
    }
    return text;
}

/// Prints the kind as well.
LONG PrintWithKind(LPCSTR text, LONG kind)
{
    return IsolationTest::Output(("kind " + std::to_string(kind) + ": " + (text != nullptr ? text : "null")).c_str(),
                                 SCC_MSG_INFO);
}

class BothWaysTest : public IsolationTest
{
protected:
    /// Calls every function in every way that a host may.
    static std::string Run(const std::filesystem::path& file)
    {
        Transcript seen;
        const SccLibrary library(file);
        HWND window = std::bit_cast<HWND>(std::uintptr_t{0x1234});
        seen << library.getVersion();
        {
            Session session(library, window);
            seen << session.result << session.name.data() << session.label.data() << session.capabilities
                 << session.checkoutLength << session.commentLength;
            seen << session.Open() << session.user.data() << session.auxPath.data();

            std::array<char, SCC_PRJPATH_SIZE> projectName = {"old"};
            std::array<char, MAX_PATH> localPath = {};
            BOOL isNew = TRUE;
            seen << library.getProjPath(session.context, window, session.user.data(), projectName.data(),
                                        localPath.data(), session.auxPath.data(), TRUE, &isNew)
                 << projectName.data() << localPath.data() << isNew;

            LPCMDOPTS block = nullptr;
            seen << library.getCommandOptions(session.context, window, SCC_COMMAND_GET, nullptr);
            seen << library.getCommandOptions(session.context, window, SCC_COMMAND_GET, &block) << (block != nullptr);

            std::array<LPCSTR, 3> names = {"C:\\project\\a.txt", "C:\\project\\b \xE4.txt", ""};
            std::array<LONG, 3> words = {1, -2, 3};
            seen << library.get(session.context, window, 3, names.data(), SCC_GET_RECURSIVE, block)
                 << library.get(session.context, window, 0, nullptr, 0, nullptr)
                 << library.checkout(session.context, window, 2, names.data(), "why", 0, block)
                 << library.checkout(session.context, window, 2, names.data(), nullptr, 0, nullptr)
                 << library.uncheckout(session.context, window, 1, names.data(), 0, nullptr)
                 << library.checkin(session.context, window, 1, names.data(), "line\r\nline", SCC_KEEP_CHECKEDOUT,
                                    nullptr)
                 << library.add(session.context, window, 3, names.data(), "", words.data(), nullptr)
                 << library.history(session.context, window, 1, names.data(), 0, nullptr)
                 << library.properties(session.context, window, names[1])
                 << library.runScc(session.context, nullptr, 0, nullptr)
                 << library.setOption(session.context, SCC_OPT_SHARESUBPROJ, 1) << library.beginBatch()
                 << library.endBatch();
            seen << library.queryInfo(session.context, 3, names.data(), words.data()) << words[0] << words[1];
            seen << library.populateList(session.context, SCC_COMMAND_ADD, 3, names.data(), List, &seen, words.data(),
                                         SCC_PL_DIR);
            seen << library.populateList(session.context, SCC_COMMAND_ADD, 3, names.data(), nullptr, &seen,
                                         words.data(), 0);

            LONG count = 1;
            LPCSTR* added = names.data();
            seen << library.addFromScc(session.context, window, &count, &added) << count << added[0] << added[1];
            seen << library.addFromScc(session.context, window, nullptr, nullptr);
            seen << library.closeProject(session.context) << session.Uninitialize();
        }
        return seen.Text() + Printed(Lines());
    }

    /// Calls every function that the defective library has.
    static std::string RunDefective(const std::filesystem::path& file)
    {
        Transcript seen;
        const SccLibrary library(file);
        seen << library.getVersion();
        Session session(library);
        // A text that fills its buffer has no terminator there; what comes from another process has one.
        seen << session.result << session.name.data() << std::string(session.label.data(), SCC_AUXLABEL_SIZE - 1)
             << session.capabilities << session.checkoutLength << session.commentLength;
        if (session.result != SCC_OK)
        {
            return seen.Text();
        }
        seen << session.Open(PrintWithKind) << session.user.data() << session.auxPath.data();
        std::array<char, 20> first = {"C:\\project\\a.txt"}; // a library writes to names
        std::array<char, 20> second = {"C:\\project\\b.txt"};
        std::array<LPCSTR, 2> names = {first.data(), second.data()};
        std::array<LONG, 2> words = {0, SCC_KEEP_CHECKEDOUT};
        std::array<LONG, 3> status = {-7, -7, -7};
        const auto query = [&] {
            seen << library.queryInfo(session.context, 2, names.data(), status.data()) << status[0] << status[1];
        };
        seen << library.add(session.context, nullptr, 2, names.data(), "", words.data(), nullptr)
             << library.add(session.context, nullptr, 1, names.data(), "", &words[1], nullptr)
             << library.get(session.context, nullptr, 2, names.data(), 0, nullptr);
        query();
        seen << library.checkout(session.context, nullptr, 2, names.data(), "", 0, nullptr);
        query();
        seen << library.uncheckout(session.context, nullptr, 1, names.data(), 0, nullptr);
        query();
        seen << library.checkin(session.context, nullptr, 1, &names[1], "", SCC_KEEP_CHECKEDOUT, nullptr)
             << library.checkin(session.context, nullptr, 2, names.data(), "", 0, nullptr)
             << library.getCommandOptions(session.context, nullptr, SCC_COMMAND_GET, nullptr)
             << library.closeProject(session.context) << session.Uninitialize();
        return seen.Text() + Text();
    }
};

class EveryDefect : public BothWaysTest, public testing::WithParamInterface<const wchar_t*>
{
};

} // namespace

TEST_F(BothWaysTest, EveryFunctionSeesAndReturnsTheSame)
{
    const std::string direct = Run(BothWays()[0]);
    EXPECT_EQ(Run(BothWays()[1]), direct);
    EXPECT_THAT(
        direct,
        HasSubstr("SccCheckin(context, 4660, 1, [\"C:\\project\\a.txt\"], \"line\r\nline\", 4096, no block, )"));
    EXPECT_THAT(direct, HasSubstr("the host says 0"));
    EXPECT_THAT(direct, HasSubstr("Anna\naaaaaaaaaa"));
    EXPECT_EQ(Processes(), 0u);
}

TEST_P(EveryDefect, IsTheSame)
{
    const std::filesystem::path library = std::filesystem::path(ORVIX_DEFECTIVE_MSSCCI) / L"defective_scc.dll";
    const std::string correct = RunDefective(library);
    Misbehave(GetParam());
    const std::string direct = RunDefective(library);
    EXPECT_EQ(RunDefective(IsolatedCopy(library).Proxy()), direct);
    const std::set<std::wstring> unseen = {L"handles", L"texts", L"input-texts", L"input-names", L"info-overrun"};
    EXPECT_EQ(direct == correct, unseen.contains(GetParam())) << "the defect must be used in this test";
}

// Those that end the process or never return have tests of their own: they cannot be run directly.
INSTANTIATE_TEST_SUITE_P(, EveryDefect,
                         testing::Values(L"version", L"handles", L"starts", L"texts", L"no-terminator", L"capabilities",
                                         L"input-texts", L"codes", L"text-without-kind", L"text-null", L"text-output",
                                         L"codes-given-back", L"input-names", L"codes-kept", L"info-left-out",
                                         L"info-overrun", L"info-bits"));

TEST_F(BothWaysTest, ALibraryThatRefusesToStartIsAskedAgain)
{
    for (const std::filesystem::path& file : BothWays())
    {
        Misbehave(L"fail");
        const SccLibrary library(file);
        EXPECT_EQ(Session(library).result, SCC_E_INITIALIZEFAILED);
        EXPECT_EQ(Session(library).result, SCC_E_INITIALIZEFAILED);
    }
    EXPECT_EQ(Processes(), 0u);
}

TEST_F(BothWaysTest, TextArrivesFromThreadsAndBetweenCalls)
{
    Misbehave(L"threads-SccGet");
    for (const std::filesystem::path& file : BothWays())
    {
        const SccLibrary library(file);
        Session session(library);
        ASSERT_EQ(session.Open(), SCC_OK);
        ASSERT_EQ(session.Get(), SCC_OK);
        std::vector<std::string> lines = Lines();
        EXPECT_THAT(lines, testing::Contains("from a thread"));
        const ULONGLONG end = GetTickCount64() + 10000;
        while (std::find(lines.begin(), lines.end(), "between calls") == lines.end() && GetTickCount64() < end)
        {
            Sleep(10);
            const std::vector<std::string> more = Lines();
            lines.insert(lines.end(), more.begin(), more.end());
        }
        EXPECT_EQ(std::count(lines.begin(), lines.end(), "between calls"), 1);
    }
}

TEST_F(BothWaysTest, ACallTakesAHundredThousandFiles)
{
    constexpr LONG Count = 100000;
    const std::string text = "C:\\project\\" + std::string(MAX_PATH - 12, 'x');
    std::vector<LPCSTR> names(Count, text.c_str());
    for (const std::filesystem::path& file : BothWays())
    {
        const SccLibrary library(file);
        Session session(library);
        std::vector<LONG> status(Count);
        ASSERT_EQ(library.queryInfo(session.context, Count, names.data(), status.data()), SCC_OK);
        EXPECT_EQ(status, std::vector<LONG>(Count, static_cast<LONG>(text.size())));
    }
}

TEST_F(BothWaysTest, AnAnswerTakesAHundredThousandFiles)
{
    Misbehave(L"many-SccAddFromScc");
    for (const std::filesystem::path& file : BothWays())
    {
        const SccLibrary library(file);
        Session session(library);
        LONG count = 0;
        LPCSTR* names = nullptr;
        ASSERT_EQ(library.addFromScc(session.context, nullptr, &count, &names), SCC_OK);
        ASSERT_EQ(count, 100000);
        EXPECT_EQ(std::string(names[0]).size(), MAX_PATH - 1u);
        EXPECT_STREQ(names[count - 1], names[0]);
    }
}

TEST_F(BothWaysTest, TheEndWithoutAContextLeavesNoProcess)
{
    std::vector<SCCRTN> results;
    for (const std::filesystem::path& file : BothWays())
    {
        const SccLibrary library(file);
        results.push_back(library.uninitialize(nullptr));
        EXPECT_EQ(Processes(), 0u);
    }
    EXPECT_EQ(results[1], results[0]);
    Misbehave(L"refuse-load");
    const SccLibrary library(Proxy());
    EXPECT_LT(library.uninitialize(nullptr), SCC_OK);
    EXPECT_EQ(Processes(), 0u);
}

TEST_F(BothWaysTest, TheLibraryHasTheHostsFolderAndCodePage)
{
    Misbehave(L"state-SccGet");
    const TempFolder first;
    const TempFolder second;
    std::vector<std::vector<std::string>> seen;
    for (const std::filesystem::path& file : BothWays())
    {
        const CurrentFolder current(first.Path());
        const SccLibrary library(file);
        Session session(library);
        ASSERT_EQ(session.Open(), SCC_OK);
        session.Get();
        const CurrentFolder next(second.Path());
        session.Get();
        seen.push_back(Lines());
        std::erase_if(seen.back(), [](const std::string& line) { return !line.starts_with("folder "); });
    }
    EXPECT_EQ(seen[0].size(), 2u);
    EXPECT_EQ(seen[1], seen[0]);
}

TEST_F(BothWaysTest, TwoContextsAreApart)
{
    for (const std::filesystem::path& file : BothWays())
    {
        const SccLibrary library(file);
        Session one(library);
        Session two(library);
        ASSERT_EQ(one.Open(), SCC_OK);
        ASSERT_EQ(two.Open(), SCC_OK);
        EXPECT_EQ(one.Uninitialize(), SCC_OK);
        EXPECT_EQ(two.Get(), SCC_OK);
    }
    const SccLibrary library(Proxy());
    Session one(library);
    Session two(library);
    EXPECT_EQ(Processes(), 2u);
}

TEST_F(BothWaysTest, BlocksOfTheLibraryComeBack)
{
    for (const std::filesystem::path& file : BothWays())
    {
        const SccLibrary library(file);
        Session session(library);
        session.Open();
        LPCMDOPTS block = nullptr;
        library.getCommandOptions(session.context, nullptr, SCC_COMMAND_GET, &block);
        Lines();
        session.Get(block);
        EXPECT_THAT(Text(), HasSubstr("0, block, )"));
    }
}
