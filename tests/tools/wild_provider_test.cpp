// orvix.exe with a provider that does what libraries in the wild do.

#include "Defect.h"
#include "Display.h"
#include "Environment.h"
#include "ToolTest.h"
#include "UniqueHandle.h"

#include <gmock/gmock.h>

#include <sstream>

namespace
{

using testing::AllOf;
using testing::HasSubstr;
using testing::Not;

class WildProvider : public ToolTest
{
protected:
    // Exit codes.
    static constexpr unsigned long BrokenSettings = 4;
    static constexpr unsigned long ProviderEnded = 5;
    static constexpr unsigned long TimedOut = 6;

    OrvixTool::Result RunWild(Arguments arguments)
    {
        arguments.insert(arguments.end(), {L"--plugins", ORVIX_WILD_PLUGINS});
        return Run(std::move(arguments));
    }

    OrvixTool::Result RunWith(const std::wstring& defect, Arguments arguments)
    {
        const Environment environment(Defect::Variable, defect);
        return RunWild(std::move(arguments));
    }

    void Control(const std::wstring& name)
    {
        Write(name, "one\n");
        ASSERT_EQ(RunWild({L"add", name}).code, Success);
    }

    void WriteSettings(std::string_view text)
    {
        std::filesystem::create_directories(Config());
        WriteBytes(Config() / L"OrvixProviders.xml", text);
    }
};

} // namespace

TEST_F(WildProvider, ThatChangesTheProcessGetsTheFilesThatWereNamed)
{
    Control(L"one.txt");
    const Environment environment(Defect::Variable, L"changes-process");
    std::filesystem::create_directories(Scratch() / L"plugins");
    std::filesystem::copy_file(std::filesystem::path(ORVIX_WILD_PLUGINS) / L"wild.dll",
                               Scratch() / L"plugins" / L"wild.dll");
    const auto result = RunExactly({L"checkout", L"ONE.txt", L"--unattended", L"--plugins", L"..\\plugins", L"--config",
                                    L"..\\settings", L"--project", L"."});
    EXPECT_EQ(result.code, Success) << result.errors;
    EXPECT_THAT(result.output, HasSubstr("done    checked out  one.txt\n"));
    EXPECT_TRUE(std::filesystem::exists(Scratch() / L"settings" / L"OrvixPrompts.xml"));
    const auto walked = RunWild({L"status", L"."});
    EXPECT_THAT(walked.output, HasSubstr("checked out  one.txt\n1 file"));
}

TEST_F(WildProvider, DoesNotGetWhatWouldDiscardChanges)
{
    Control(L"edited.txt");
    Control(L"plain.txt");
    Control(L"gone.txt");
    ASSERT_EQ(RunWild({L"checkout", L"edited.txt"}).code, Success);
    Write(L"edited.txt", "hours of work");
    SetFileAttributesW(File(L"gone.txt").c_str(), FILE_ATTRIBUTE_NORMAL);
    std::filesystem::remove(File(L"gone.txt"));

    const auto walked = RunWild({L"get", L".", L"gone.txt"});
    EXPECT_EQ(walked.code, Success) << walked.errors;
    EXPECT_THAT(walked.output, AllOf(HasSubstr("done    checked in  gone.txt\n"), Not(HasSubstr("edited.txt")),
                                     HasSubstr("2 files, 2 done, 1 left out for your changes (--force gets them)")));
    const auto named = RunWild({L"get", L"edited.txt"});
    EXPECT_EQ(named.code, Failed);
    EXPECT_THAT(named.output, HasSubstr("refused  checked out, modified  edited.txt\n"));
    EXPECT_THAT(named.errors, HasSubstr("edited.txt has your changes, which get would replace: use undo, or get "
                                        "--force\n"));
    EXPECT_EQ(ReadBytes(File(L"edited.txt")), "hours of work");

    EXPECT_EQ(RunWild({L"get", L"edited.txt", L"--force"}).code, Success);
    EXPECT_EQ(ReadBytes(File(L"edited.txt")), "one\n");
}

TEST_F(WildProvider, ThatKeepsNothingCheckedOutHasCheckedIn)
{
    Control(L"a.txt");
    ASSERT_EQ(RunWild({L"checkout", L"a.txt"}).code, Success);
    Write(L"a.txt", "two\n");
    const auto result = RunWith(L"keeps-nothing", {L"checkin", L"a.txt", L"--keep"});
    EXPECT_EQ(result.code, Success);
    EXPECT_THAT(result.output, HasSubstr("done    checked in  a.txt\n"));
    EXPECT_THAT(result.errors, HasSubstr("orvix: 1 file was not kept checked out by the provider\n"));
}

TEST_F(WildProvider, BringsBackANamedFileThatIsMissingOnTheDisk)
{
    Control(L"gone.txt");
    for (const wchar_t* command : {L"undo", L"get"})
    {
        SetFileAttributesW(File(L"gone.txt").c_str(), FILE_ATTRIBUTE_NORMAL);
        std::filesystem::remove(File(L"gone.txt"));
        EXPECT_THAT(RunWild({L"status", L"gone.txt"}).output, HasSubstr("missing on disk  gone.txt\n"));
        EXPECT_EQ(RunWild({command, L"gone.txt"}).code, Success);
        EXPECT_EQ(ReadBytes(File(L"gone.txt")), "one\n");
    }
}

TEST_F(WildProvider, ThatKnowsNoStateHasNone)
{
    Write(L"a.txt", "x");
    EXPECT_THAT(RunWith(L"every-state", {L"status", L"a.txt"}).output, HasSubstr("unknown  a.txt\n"));
}

TEST_F(WildProvider, SaysThingsOnTheErrorOutput)
{
    Write(L"a.txt", "x");
    const auto text = RunWith(L"talks", {L"status", L"a.txt"});
    EXPECT_THAT(text.errors, HasSubstr("looking\n"));
    EXPECT_THAT(text.output, Not(HasSubstr("looking")));
    const auto document = RunWith(L"talks", {L"status", L"a.txt", L"--json"});
    EXPECT_THAT(document.output, HasSubstr("\"lines\": [],\n  \"messages\": [\n    \"looking\"\n  ]"));
}

TEST_F(WildProvider, IsAskedAfterAnOperationOnlyAboutItsFiles)
{
    for (const wchar_t* name : {L"a.txt", L"b.txt", L"c.txt"})
    {
        Control(name);
    }
    ASSERT_EQ(RunWild({L"checkout", L"b.txt"}).code, Success);
    const std::filesystem::path journal = Scratch() / L"queries.txt";
    const Environment file(L"ORVIX_DEFECT_FILE", journal.wstring());
    EXPECT_EQ(RunWith(L"report-options", {L"checkin", L"."}).code, Success);
    std::istringstream queries(ReadBytes(journal));
    std::vector<std::string> lines;
    for (std::string line; std::getline(queries, line);)
    {
        line.erase(line.find_last_not_of('\r') + 1);
        lines.push_back(line);
    }
    EXPECT_THAT(lines, testing::ElementsAre("QueryStatus 3", "QueryStatus 1", "QueryStatus 1"))
        << "the last one is about a hidden folder";
}

TEST_F(WildProvider, ThatIsSwitchedOffIsNamedWithTheSetting)
{
    WriteSettings("<?xml version=\"1.0\"?>\n<OrvixProviders><P><Name>wild</Name><Enabled>false</Enabled></P>"
                  "</OrvixProviders>");
    const auto result = RunWild({L"providers"});
    EXPECT_EQ(result.code, NotFound);
    EXPECT_THAT(result.errors, HasSubstr("; provider element 1 of OrvixProviders.xml switches off each provider whose "
                                         "name contains \"wild\"\n"));
}

TEST_F(WildProvider, IsNotUsedWhileTheAdministratorsRulesCannotBeRead)
{
    Write(L"secret.key", "x");
    WriteSettings("<?xml version=\"1.0\"?>\n<OrvixProviders><P><Name>Wild</P></OrvixProviders>");
    const auto broken = RunWild({L"add", L"."});
    EXPECT_EQ(broken.code, BrokenSettings);
    EXPECT_THAT(broken.errors,
                AllOf(HasSubstr("OrvixProviders.xml: "), HasSubstr("line 2, column "), HasSubstr("orvix doctor")));
    EXPECT_EQ(RunWild({L"status", L"."}).code, Success);

    WriteSettings("<?xml version=\"1.0\"?>\n<OrvixProviders/>");
    {
        const UniqueFile lock(CreateFileW((Config() / L"OrvixProviders.xml").c_str(), GENERIC_READ, 0, nullptr,
                                          OPEN_EXISTING, 0, nullptr));
        const auto locked = RunWild({L"checkout", L"."});
        EXPECT_EQ(locked.code, BrokenSettings);
        EXPECT_THAT(locked.errors, HasSubstr("the file cannot be opened"));
    }
    WriteSettings("<?xml version=\"1.0\"?>\n<OrvixProviders/>" + std::string(17 << 20, ' '));
    const auto large = RunWild({L"add", L"."});
    EXPECT_EQ(large.code, BrokenSettings);
    EXPECT_THAT(large.errors, HasSubstr("OrvixProviders.xml: "));

    WriteSettings("<?xml version=\"1.0\"?>\n<OrvixProviders/>");
    EXPECT_THAT(RunWild({L"status", L"."}).output, HasSubstr("not controlled  secret.key"));
    EXPECT_EQ(RunWild({L"add", L"."}).code, Success);
}

TEST_F(WildProvider, ThatEndsTheProcessIsNamed)
{
    Write(L"a.txt", "x");
    const auto ended = RunWith(L"exit-in-status", {L"status", L".", L"--json"});
    EXPECT_EQ(ended.code, ProviderEnded);
    EXPECT_EQ(ended.output, "");
    EXPECT_THAT(ended.errors, HasSubstr("orvix: QueryStatus of Wild ends the process with exit code 0"));

    const auto crashed = RunWith(L"crash-in-status", {L"add", L"."});
    EXPECT_EQ(crashed.code, ProviderEnded);
    EXPECT_THAT(crashed.errors, testing::ContainsRegex(
                                    "orvix: QueryStatus of Wild crashes in .* at offset 0x.*, exception 0xC0000005"));

    const auto atLoad = RunWith(L"exit-at-load", {L"providers"});
    EXPECT_EQ(atLoad.code, ProviderEnded);
    EXPECT_THAT(atLoad.errors, HasSubstr("orvix: the search for providers ends the process with exit code 0"));
}

TEST_F(WildProvider, ThatHangsIsEndedAfterTheTime)
{
    Write(L"a.txt", "x");
    const auto result = RunWith(L"hang-in-status", {L"status", L".", L"--timeout", L"10"});
    EXPECT_EQ(result.code, TimedOut);
    EXPECT_THAT(result.errors,
                HasSubstr("orvix: QueryStatus of Wild has given no sign of life for 10 s and was ended"));
}

TEST_F(WildProvider, ThatHangsWhileItIsUnloadedIsEndedAndHasDoneItsWork)
{
    Write(L"a.txt", "x");
    const auto result = RunWith(L"hang-at-unload", {L"add", L".", L"--timeout", L"10"});
    EXPECT_EQ(result.code, TimedOut);
    EXPECT_THAT(result.output, HasSubstr("done    checked in  a.txt\n"));
    EXPECT_THAT(result.errors, HasSubstr("orvix: the unloading of the providers has given no sign of life for 10 s"));
    EXPECT_THAT(RunWild({L"status", L"."}).output, HasSubstr("checked in  a.txt"));
}

TEST_F(WildProvider, ThatShowsAWindowIsNamedToSomebodyWhoAsksForIt)
{
    if (!HasDisplay())
    {
        GTEST_SKIP() << "no display";
    }
    Write(L"a.txt", "x");
    const Environment environment(Defect::Variable, L"window-in-status");
    for (const wchar_t* action : {L"report", L"cancel"})
    {
        const auto result = RunExactly({L"status", L".", L"--plugins", ORVIX_WILD_PLUGINS, L"--config",
                                        Config().wstring(), L"--on-window", action, L"--timeout", L"10"});
        const bool isCancelled = action == std::wstring_view(L"cancel");
        EXPECT_EQ(result.code, isCancelled ? Failed : TimedOut);
        EXPECT_THAT(result.errors, HasSubstr("QueryStatus of Wild shows the window \"Wild Provider\""));
    }
}

TEST_F(WildProvider, ThatShowsAWindowIsNamed)
{
    if (!HasDisplay())
    {
        GTEST_SKIP() << "no display";
    }
    Write(L"a.txt", "x");
    const auto waiting = RunWith(L"window-in-status", {L"status", L".", L"--timeout", L"10"});
    EXPECT_EQ(waiting.code, TimedOut);
    EXPECT_THAT(waiting.errors,
                AllOf(HasSubstr("QueryStatus of Wild shows the window \"Wild Provider\": There is no repository. "
                                "Create one? (--on-window cancel presses Cancel)"),
                      HasSubstr("for 10 s since it showed the window \"Wild Provider\"")));
    const auto cancelled = RunWith(L"window-in-status", {L"status", L".", L"--on-window", L"cancel"});
    EXPECT_EQ(cancelled.code, Failed);
    EXPECT_THAT(cancelled.errors, AllOf(HasSubstr("(Cancel is pressed)"),
                                        HasSubstr("the provider does not tell the state of the files")));
}
