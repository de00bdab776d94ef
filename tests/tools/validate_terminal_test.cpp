// orvix validate on a terminal.

#include "BuiltFile.h"
#include "PseudoConsole.h"
#include "ToolTest.h"

#include <gmock/gmock.h>

namespace
{

using testing::AllOf;
using testing::HasSubstr;
using testing::Not;

constexpr const char* Green = "\x1b[32m";
constexpr const char* Red = "\x1b[31m";
constexpr const char* Grey = "\x1b[90m";

class ValidateOnATerminal : public ToolTest
{
protected:
    /// A file that is no library: one rule fails, and the others are skipped.
    PseudoConsole::Result ValidateText(const std::wstring& arguments)
    {
        Write(L"text.dll", "no library");
        return Validate(File(L"text.dll"), arguments);
    }

    static PseudoConsole::Result Validate(const std::filesystem::path& library, const std::wstring& arguments)
    {
        const std::wstring tool = L"\\\"" + BuiltFile(L"orvix.exe").wstring() + L"\\\" validate \\\"" +
                                  library.wstring() + L"\\\" " + arguments;
        return PseudoConsole::Run(L"\"" ORVIX_IN_CONSOLE L"\" \"" + tool + L"\"");
    }
};

} // namespace

TEST_F(ValidateOnATerminal, HasColours)
{
    const std::filesystem::path plugins = ORVIX_DEFECTIVE_PLUGINS;
    EXPECT_THAT(Validate(plugins / L"defective_without_GetOrvixVersion.dll", L"").output,
                AllOf(HasSubstr(std::string(Green) + "pass"), HasSubstr(std::string(Red) + "fail"),
                      HasSubstr(std::string(Grey) + "skip")));
}

TEST_F(ValidateOnATerminal, ShowsTheRuleThatIsChecked)
{
    const auto result = ValidateText(L"");
    EXPECT_EQ(result.code, Failed);
    EXPECT_THAT(result.text, AllOf(HasSubstr("checking loads, 1 of 25"), HasSubstr("checking handles, 24 of 25")));
    EXPECT_THAT(result.text, HasSubstr("\n25 rules, 0 passed, 1 failed, 24 skipped\n"));
}

TEST_F(ValidateOnATerminal, HasNoColoursWhereTheUserWantsNone)
{
    EXPECT_THAT(ValidateText(L"--no-color").output,
                AllOf(HasSubstr("fail"), Not(HasSubstr(Red)), Not(HasSubstr(Grey))));
}

TEST_F(ValidateOnATerminal, JsonIsAsInAPipe)
{
    const auto result = ValidateText(L"--json");
    EXPECT_THAT(result.text, AllOf(HasSubstr("\"failed\": 1"), Not(HasSubstr("checking"))));
    EXPECT_THAT(result.output, Not(HasSubstr(Red)));
}

TEST_F(ValidateOnATerminal, APipeGetsNeitherColoursNorProgress)
{
    Write(L"text.dll", "no library");
    EXPECT_THAT(RunExactly({L"validate", L"text.dll"}).output, AllOf(HasSubstr("fail  loads "), Not(HasSubstr("\x1b")),
                                                                     Not(HasSubstr("checking")), Not(HasSubstr("\r"))));
}
