// orvix.exe on a terminal, which is a pseudo console of 60 columns.

#include "BuiltFile.h"
#include "PseudoConsole.h"
#include "ToolTest.h"

#include <gmock/gmock.h>

#include <regex>
#include <sstream>

namespace
{

using testing::AllOf;
using testing::ContainsRegex;
using testing::HasSubstr;
using testing::Not;

constexpr const char* Bold = "\x1b[1m";
constexpr const char* Green = "\x1b[32m";
constexpr const char* Red = "\x1b[31m";
constexpr const char* Grey = "\x1b[90m";

constexpr const wchar_t* LongName = L"a folder with a very long name\\another one below it\\the file itself.txt";

class OnATerminal : public ToolTest
{
protected:
    void SetUp() override
    {
        ToolTest::SetUp();
        Write(LongName, "x");
    }

    PseudoConsole::Result RunThere(const std::wstring& arguments)
    {
        return RunToolThere(L"--project " + Quoted(Project()) + L" --unattended " + arguments + L" " +
                            Quoted(Project()));
    }

    /// orvix doctor on a plug-in that does not load.
    PseudoConsole::Result RunDoctorThere(const std::wstring& options = {})
    {
        Write(L"notes.dll", "These are notes, not a library.");
        return RunToolThere(L"doctor --sources plugins --plugins " + Quoted(Project()) + L" " + options);
    }

private:
    static std::wstring Quoted(const std::filesystem::path& path) { return L"\\\"" + path.wstring() + L"\\\""; }

    PseudoConsole::Result RunToolThere(const std::wstring& arguments)
    {
        const std::wstring tool =
            Quoted(BuiltFile(L"orvix.exe").wstring()) + L" --config " + Quoted(Config()) + L" " + arguments;
        return PseudoConsole::Run(L"\"" ORVIX_IN_CONSOLE L"\" \"" + tool + L"\"");
    }
};

/// Columns of UTF-8 text that holds no wide letters.
std::size_t ColumnsOf(const std::string& text)
{
    return static_cast<std::size_t>(
        std::count_if(text.begin(), text.end(), [](char c) { return (static_cast<unsigned char>(c) & 0xC0) != 0x80; }));
}

} // namespace

TEST_F(OnATerminal, ATableFitsAndItsPathsAreShortenedInTheMiddle)
{
    const auto result = RunThere(L"status --no-color");
    EXPECT_EQ(result.code, Success) << result.text;
    EXPECT_THAT(result.text, ContainsRegex("not controlled  a folder.*\xE2\x80\xA6.*the file itself\\.txt\n"));
    std::istringstream lines(result.text);
    for (std::string line; std::getline(lines, line);)
    {
        if (const std::size_t heading = line.find("State  "); heading != std::string::npos)
        {
            line.erase(0, heading); // the texts of the progress, each of which was replaced in its place
        }
        EXPECT_LE(ColumnsOf(line), PseudoConsole::Columns) << line;
    }
}

TEST_F(OnATerminal, HasColours)
{
    EXPECT_THAT(RunThere(L"add").output, AllOf(HasSubstr(Bold), HasSubstr(Green)));
}

TEST_F(OnATerminal, HasNoColoursWhereTheUserWantsNone)
{
    EXPECT_THAT(RunThere(L"add --no-color").output,
                AllOf(HasSubstr("done"), Not(HasSubstr(Bold)), Not(HasSubstr(Green))));
    SetEnvironmentVariableW(L"NO_COLOR", L"1");
    const auto result = RunThere(L"status");
    SetEnvironmentVariableW(L"NO_COLOR", nullptr);
    EXPECT_THAT(result.output, AllOf(HasSubstr("State"), Not(HasSubstr(Bold))));
}

TEST_F(OnATerminal, JsonIsAsInAPipe)
{
    const auto result = RunThere(L"status --json");
    EXPECT_THAT(result.text, HasSubstr("\"summary\": {"));
    EXPECT_THAT(result.output, Not(HasSubstr(Bold)));
}

TEST_F(OnATerminal, TheDoctorColoursWhatIsWrong)
{
    EXPECT_THAT(RunDoctorThere().output,
                AllOf(HasSubstr(std::string(Red) + "problem"), HasSubstr(std::string(Grey) + "note")));
    EXPECT_THAT(RunDoctorThere(L"--no-color").output,
                AllOf(HasSubstr("problem"), Not(HasSubstr(Red)), Not(HasSubstr(Grey))));
    EXPECT_THAT(RunDoctorThere(L"--json").output, AllOf(HasSubstr("problem"), Not(HasSubstr(Red))));
}

TEST_F(OnATerminal, TheDoctorShowsWhatItExaminesUntilItHasFinished)
{
    const std::string output = RunDoctorThere().output;
    const std::regex shownAndErased("examining [^\r\n]*notes\\.dll([\r ]|\x1b\\[\\?25[hl])*\x1b\\[K");
    EXPECT_TRUE(std::regex_search(output, shownAndErased)) << output;
    EXPECT_THAT(RunDoctorThere(L"--json").output, Not(HasSubstr("examining")));
    EXPECT_THAT(Run({L"doctor", L"--plugins", Project().wstring()}).output, Not(HasSubstr("examining")));
}

TEST_F(OnATerminal, APipeGetsNeitherColoursNorProgressAndEverythingWhole)
{
    const auto result = Run({L"status", L"."});
    EXPECT_EQ(result.output,
              "State           File\n"
              "not controlled  a folder with a very long name\\another one below it\\the file itself.txt\n"
              "1 file\n");
}
