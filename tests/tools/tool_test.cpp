// orvix.exe as a process on a project of its own, with the archive plug-in.

#include "OrvixVersion.h"
#include "ToolTest.h"

#include <gmock/gmock.h>

namespace
{

using testing::AllOf;
using testing::HasSubstr;
using testing::Not;
using testing::StartsWith;

class Tool : public ToolTest
{
protected:
    /// From here on the tool is a copy whose dialogs are answered with these words of WrittenAnswerUI.cpp.
    void AnswerDialogs(const wchar_t* words)
    {
        const std::filesystem::path folder = UseCopy({L"OrvixCore.dll", L"braeutil.dll", L"plugins\\archive.dll"});
        std::filesystem::copy_file(ORVIX_TOOL_USER, folder / L"OrvixCoreUI.dll",
                                   std::filesystem::copy_options::overwrite_existing);
        SetEnvironmentVariableW(L"ORVIX_TEST_ANSWER", words);
    }

    /// Runs the tool with somebody to answer.
    OrvixTool::Result RunAttended(Arguments arguments)
    {
        arguments.insert(arguments.begin(), {L"--config", Config().wstring(), L"--user", L"ada"});
        return RunExactly(arguments);
    }

    /// Puts a file under control.
    void Control(const std::wstring& name, std::string_view text = "one\n")
    {
        Write(name, text);
        ASSERT_EQ(Run({L"add", name}).code, Success);
    }

    /// Puts a file under control and checks it out.
    void Take(const std::wstring& name, std::string_view text = "one\n")
    {
        Control(name, text);
        ASSERT_EQ(Run({L"checkout", name}).code, Success);
    }

    std::string State(const std::wstring& name) { return Run({L"status", name}).output; }

    /// A prompt file with one row.
    void StorePrompt(const std::string& id, const std::string& locked, const std::string& action)
    {
        std::filesystem::create_directories(Config());
        WriteBytes(Config() / L"OrvixPrompts.xml",
                   "<?xml version=\"1.0\"?>\n<OrvixPrompts version=\"1.0\"><Prompt><Text>x</Text><ID>" + id +
                       "</ID><Locked>" + locked + "</Locked><ActionOpts>0</ActionOpts><Action>" + action +
                       "</Action></Prompt></OrvixPrompts>");
    }

    std::string StoredPrompts() const { return ReadBytes(Config() / L"OrvixPrompts.xml"); }
};

bool IsReadOnly(const std::filesystem::path& path)
{
    return (GetFileAttributesW(path.c_str()) & FILE_ATTRIBUTE_READONLY) != 0;
}

// IDs of the tool's prompts, as the prompt file holds them.
constexpr const char* CheckInPrompt = "1330796546";
constexpr const char* KeepPrompt = "1330796547";
constexpr const char* CheckOutPrompt = "1330796548";

} // namespace

TEST_F(Tool, ListsTheProvidersWithTheirIndexes)
{
    const auto result = Run({L"providers"});
    EXPECT_EQ(result.code, Success);
    EXPECT_EQ(result.output, "Index  Provider\n0      Archive\n1      Git\n");
}

TEST_F(Tool, PrintsHelpAndVersionWithSuccess)
{
    const auto help = RunExactly({L"--help"});
    EXPECT_EQ(help.code, Success);
    EXPECT_THAT(help.output, AllOf(HasSubstr("checkin"), HasSubstr("--unattended"), HasSubstr("Exit codes")));

    const auto version = RunExactly({L"--version"});
    EXPECT_EQ(version.code, Success);
    EXPECT_THAT(version.output, StartsWith("orvix " + std::to_string(ORVIX_VERSION_MAJOR) + "."));
}

TEST_F(Tool, AddPutsEveryFileOfAFolderUnderControl)
{
    Write(L"a.txt", "a");
    Write(L"deep\\er\\b.txt", "b");
    const auto result = Run({L"add", L".", L"-m", L"first"});
    EXPECT_EQ(result.code, Success);
    EXPECT_EQ(result.output, "Result  State       File\n"
                             "done    checked in  a.txt\n"
                             "done    checked in  deep\\er\\b.txt\n"
                             "2 files, 2 done\n");
    EXPECT_TRUE(IsReadOnly(File(L"deep\\er\\b.txt")));
}

TEST_F(Tool, AddWithKeepLeavesTheFilesCheckedOut)
{
    Write(L"a.txt", "a");
    const auto result = Run({L"add", L"a.txt", L"--keep"});
    EXPECT_EQ(result.code, Success);
    EXPECT_THAT(result.output, HasSubstr("done    checked out  a.txt\n"));
    EXPECT_FALSE(IsReadOnly(File(L"a.txt")));
}

TEST_F(Tool, AddOfAFolderLeavesOutWhatIsControlledAlready)
{
    Control(L"a.txt");
    Write(L"b.txt", "b");
    const auto result = Run({L"add", L"."});
    EXPECT_EQ(result.code, Success);
    EXPECT_THAT(result.output, HasSubstr("1 file, 1 done, 1 left out for their state\n"));
}

TEST_F(Tool, AddOfANamedFileThatIsControlledIsRefused)
{
    Control(L"a.txt");
    const auto result = Run({L"add", L"a.txt"});
    EXPECT_EQ(result.code, Failed);
    EXPECT_THAT(result.output, HasSubstr("refused  checked in  a.txt\n"));
}

TEST_F(Tool, StatusShowsStatesInWords)
{
    Take(L"taken.txt");
    Control(L"resting.txt");
    Write(L"new.txt", "n");
    Write(L"taken.txt", "changed text");
    const auto result = Run({L"status", L"."});
    EXPECT_EQ(result.code, Success);
    EXPECT_EQ(result.output, "State                  File\n"
                             "not controlled         new.txt\n"
                             "checked in             resting.txt\n"
                             "checked out, modified  taken.txt\n"
                             "3 files\n");
}

TEST_F(Tool, CheckOutMakesAFileWritable)
{
    Control(L"a.txt");
    ASSERT_TRUE(IsReadOnly(File(L"a.txt")));
    const auto result = Run({L"checkout", L"a.txt", L"-m", L"to edit"});
    EXPECT_EQ(result.code, Success);
    EXPECT_THAT(result.output, HasSubstr("done    checked out  a.txt\n"));
    EXPECT_FALSE(IsReadOnly(File(L"a.txt")));
}

TEST_F(Tool, CheckInStoresAVersionWithItsCommentAndMakesTheFileReadOnly)
{
    Take(L"a.txt");
    Write(L"a.txt", "one\ntwo\n");
    const auto result = Run({L"checkin", L"a.txt", L"-m", L"second line"});
    EXPECT_EQ(result.code, Success);
    EXPECT_THAT(result.output, HasSubstr("done    checked in  a.txt\n"));
    EXPECT_TRUE(IsReadOnly(File(L"a.txt")));
    EXPECT_THAT(Run({L"history", L"a.txt"}).output, HasSubstr("second line"));
}

TEST_F(Tool, CheckInWithKeepStoresAVersionAndKeepsTheFileCheckedOut)
{
    Take(L"a.txt");
    Write(L"a.txt", "one\ntwo\n");
    const auto result = Run({L"checkin", L"a.txt", L"--keep", L"-m", L"second line"});
    EXPECT_EQ(result.code, Success);
    EXPECT_THAT(result.output, HasSubstr("done    checked out  a.txt\n"));
    EXPECT_FALSE(IsReadOnly(File(L"a.txt")));
    EXPECT_THAT(Run({L"history", L"a.txt"}).output, HasSubstr("second line"));
}

TEST_F(Tool, CheckInOfAFolderTakesWhatIsCheckedOut)
{
    Take(L"a.txt");
    Control(L"b.txt");
    Write(L"new.txt", "n");
    const auto result = Run({L"checkin", L"."});
    EXPECT_EQ(result.code, Success);
    EXPECT_THAT(result.output, HasSubstr("1 file, 1 done, 2 left out for their state"));
}

TEST_F(Tool, CheckInOfANamedFileThatIsNotCheckedOutIsRefused)
{
    Control(L"a.txt");
    EXPECT_EQ(Run({L"checkin", L"a.txt"}).code, Failed);
}

TEST_F(Tool, UndoRestoresTheFile)
{
    Take(L"a.txt", "one\n");
    Write(L"a.txt", "a change to be thrown away");
    const auto result = Run({L"undo", L"a.txt"});
    EXPECT_EQ(result.code, Success);
    EXPECT_THAT(result.output, HasSubstr("done    checked in  a.txt\n"));
    EXPECT_EQ(ReadBytes(File(L"a.txt")), "one\n");
}

TEST_F(Tool, GetBringsAFileThatIsMissing)
{
    Control(L"a.txt", "one\n");
    SetFileAttributesW(File(L"a.txt").c_str(), FILE_ATTRIBUTE_NORMAL);
    ASSERT_TRUE(std::filesystem::remove(File(L"a.txt")));
    EXPECT_THAT(State(L"a.txt"), HasSubstr("missing on disk"));
    const auto result = Run({L"get", L"a.txt"});
    EXPECT_EQ(result.code, Success);
    EXPECT_THAT(result.output, HasSubstr("done    checked in  a.txt\n"));
    EXPECT_EQ(ReadBytes(File(L"a.txt")), "one\n");
}

TEST_F(Tool, GetNeverOverwritesAChangeMadeWithoutACheckOutAndFails)
{
    Control(L"a.txt", "one\n");
    SetFileAttributesW(File(L"a.txt").c_str(), FILE_ATTRIBUTE_NORMAL);
    Write(L"a.txt", "changed by hand");
    const auto refused = Run({L"get", L"a.txt"});
    EXPECT_EQ(refused.code, Failed);
    EXPECT_THAT(refused.output, HasSubstr("refused  checked in, modified  a.txt\n"));
    const auto forced = Run({L"get", L"a.txt", L"--force"}); // this provider does not overwrite it either
    EXPECT_EQ(forced.code, Failed);
    EXPECT_THAT(forced.output, HasSubstr("failed  checked in, modified  a.txt\n"));
    EXPECT_EQ(ReadBytes(File(L"a.txt")), "changed by hand");
}

TEST_F(Tool, HistoryShowsVersionsWithUserAndComment)
{
    Write(L"a.txt", "one");
    ASSERT_EQ(Run({L"add", L"a.txt", L"-m", L"the beginning"}).code, Success);
    const auto result = RunAs(L"bob", {L"history", L"a.txt"});
    EXPECT_EQ(result.code, Success);
    EXPECT_THAT(result.output, AllOf(HasSubstr("a.txt"), HasSubstr("ada"), HasSubstr("the beginning")));
}

TEST_F(Tool, HistoryOfAFileThatIsNotControlledIsRefused)
{
    Write(L"a.txt", "one");
    const auto result = Run({L"history", L"a.txt"});
    EXPECT_EQ(result.code, Failed);
    EXPECT_THAT(result.output, HasSubstr("refused  not controlled  a.txt\n"));
}

TEST_F(Tool, ASecondUserMeetsTheLock)
{
    Take(L"a.txt");
    const auto result = RunAs(L"bob", {L"checkout", L"a.txt"});
    EXPECT_EQ(result.code, Failed);
    EXPECT_THAT(result.output, HasSubstr("refused  checked out by another user  a.txt\n"));
    EXPECT_EQ(RunAs(L"bob", {L"undo", L"a.txt"}).code, Failed);
    EXPECT_THAT(State(L"a.txt"), HasSubstr("checked out  a.txt"));
}

TEST_F(Tool, CheckOutOfAFolderFailsWhenAnotherUserHoldsAFileAndTakesTheOthers)
{
    Take(L"a.txt");
    Control(L"b.txt");
    const auto result = RunAs(L"bob", {L"checkout", L"."});
    EXPECT_EQ(result.code, Failed);
    EXPECT_THAT(result.output, AllOf(HasSubstr("refused  checked out by another user  a.txt\n"),
                                     HasSubstr("done     checked out                  b.txt\n")));
}

TEST_F(Tool, AVetoCancelsTheWholeOperationBeforeItTouchesAnything)
{
    Take(L"a.txt", "one\n");
    Take(L"b.json", "{}\n");
    Write(L"a.txt", "changed text");
    const auto result = Run({L"checkin", L".", L"--veto", L"*.JSON", L"--verbose"});
    EXPECT_EQ(result.code, Failed);
    EXPECT_THAT(result.output, AllOf(HasSubstr("cancelled  checked out, modified  a.txt\n"),
                                     HasSubstr("cancelled  checked out            b.json\n"),
                                     HasSubstr("notification 13 (before check-in), files: 2\n"),
                                     HasSubstr("notification 13 (before check-in), files: 2, cancelled\n"),
                                     Not(HasSubstr("notification 14"))));
    EXPECT_THAT(result.errors, HasSubstr("orvix: vetoed: b.json matches *.JSON"));
}

TEST_F(Tool, AVetoThatMatchesNoFileOfTheOperationLetsItRun)
{
    Take(L"a.txt");
    Control(L"b.json");
    EXPECT_EQ(Run({L"checkin", L".", L"--veto", L"*.json", L"--veto", L"other\\*"}).code, Success);
}

TEST_F(Tool, AVetoPatternWithASeparatorIsComparedWithThePathInTheProject)
{
    Write(L"secrets\\deep\\a.txt", "a");
    EXPECT_EQ(Run({L"add", L".", L"--veto", L"secrets/*"}).code, Failed);
    EXPECT_EQ(Run({L"add", L".", L"--veto", L"deep/*"}).code, Success);
}

TEST_F(Tool, VerbosePrintsTheNotificationsOfEveryOperation)
{
    Write(L"a.txt", "a");
    EXPECT_THAT(Run({L"add", L"a.txt", L"--verbose"}).output,
                AllOf(HasSubstr("notification 19 (before add), files: 1\n"), HasSubstr("notification 20 (after add)")));
    EXPECT_THAT(Run({L"checkout", L"a.txt", L"--verbose"}).output,
                AllOf(HasSubstr("notification 15 (before check-out)"), HasSubstr("16 (after check-out)")));
    EXPECT_THAT(Run({L"undo", L"a.txt", L"--verbose"}).output,
                AllOf(HasSubstr("notification 17 (before undo check-out)"), HasSubstr("18 (after undo check-out)")));
    EXPECT_THAT(Run({L"get", L"a.txt", L"--verbose"}).output,
                AllOf(HasSubstr("notification 21 (before get latest)"), HasSubstr("22 (after get latest)")));
    EXPECT_THAT(Run({L"add", L"a.txt"}).output, Not(HasSubstr("notification")));
}

TEST_F(Tool, TakesNamesOutsideAsciiAndAnswersInUtf8)
{
    const std::wstring name = L"Entw\u00FCrfe\\\u5009\u5EAB \U0001F4E6.txt";
    Write(name, "x");
    const auto result = Run({L"add", name, L"-m", L"\u00C4nderung"});
    EXPECT_EQ(result.code, Success);
    EXPECT_THAT(result.output, HasSubstr("done    checked in  Entw\xC3\xBCrfe\\\xE5\x80\x89\xE5\xBA\xAB "
                                         "\xF0\x9F\x93\xA6.txt\n"));
    EXPECT_THAT(Run({L"history", name}).output, HasSubstr("\xC3\x84nderung"));
}

TEST_F(Tool, TakesFileNamesThatLookLikeListsOptionsOrCommands)
{
    for (const wchar_t* name : {L"[a,b]", L"--keep", L"status"})
    {
        Write(name, "x");
    }
    const auto result = Run({L"add", L"status", L"[a,b]", L"--", L"--keep"});
    EXPECT_EQ(result.code, Success);
    EXPECT_THAT(result.output, AllOf(HasSubstr("  status\n"), HasSubstr("  [a,b]\n"), HasSubstr("  --keep\n"),
                                     HasSubstr("3 files, 3 done\n")));
}

TEST_F(Tool, AFileThatIsMetTwiceIsTakenOnce)
{
    Write(L"sub\\a.txt", "x");
    const auto result = Run({L"add", L"sub/a.txt", L".", L"SUB\\..\\sub\\A.TXT"});
    EXPECT_EQ(result.code, Success);
    EXPECT_THAT(result.output, HasSubstr("1 file, 1 done"));
}

TEST_F(Tool, HiddenFoldersAreSkippedAndCountedUnlessTheyAreNamed)
{
    Write(L"a.txt", "x");
    Write(L".git\\config", "x");
    EXPECT_THAT(Run({L"add", L"."}).output, HasSubstr("1 file, 1 done, 1 hidden folder skipped\n"));
    EXPECT_THAT(Run({L"add", L".git"}).output, HasSubstr("done    checked in  .git\\config\n"));
}

TEST_F(Tool, AddOfAFolderLeavesOutWhatTheProviderDoesNotAllowToBeAdded)
{
    Write(L"a reserved name", "x");
    const auto found = Run({L"--plugins", ORVIX_STUBBORN_PLUGINS, L"add", L"."});
    EXPECT_EQ(found.code, Success);
    EXPECT_EQ(found.output, "0 files, 1 left out for their state\n");
    const auto named = Run({L"--plugins", ORVIX_STUBBORN_PLUGINS, L"add", L"a reserved name"});
    EXPECT_EQ(named.code, Failed);
    EXPECT_THAT(named.output, HasSubstr("refused  not controlled  a reserved name\n"));
}

TEST_F(Tool, AFileWhoseNameStartsWithADotIsAFileLikeAnyOther)
{
    Write(L".archive", "no archive of this provider");
    Write(L".gitignore", "x");
    const auto result = Run({L"--plugins", ORVIX_STUBBORN_PLUGINS, L"status", L"."});
    EXPECT_EQ(result.code, Success);
    EXPECT_THAT(result.output, AllOf(HasSubstr("  .archive\n"), HasSubstr("  .gitignore\n"), HasSubstr("2 files\n")));
}

TEST_F(Tool, TheProvidersFiltersLeaveFilesOutOfAFolderAndRefuseNamedOnes)
{
    std::filesystem::create_directories(Config());
    WriteBytes(Config() / L"OrvixProviders.xml",
               "<?xml version=\"1.0\"?><OrvixProviders><P><Name>Archive</Name><Filters><F><Name>Scratch</Name>"
               "<FileType>tmp</FileType></F></Filters></P></OrvixProviders>");
    Write(L"a.txt", "x");
    Write(L"b.tmp", "x");
    const auto walked = Run({L"add", L"."});
    EXPECT_EQ(walked.code, Success);
    EXPECT_THAT(walked.output, HasSubstr("1 file, 1 done, 1 left out by filters"));
    const auto named = Run({L"add", L"b.tmp"});
    EXPECT_EQ(named.code, Failed);
    EXPECT_THAT(named.output, HasSubstr("refused  excluded by filter Scratch  b.tmp\n"));
    EXPECT_THAT(State(L"a.txt"), HasSubstr("checked in"));
}

TEST_F(Tool, TheAdministratorsFixedProjectRootIsTheDefaultProject)
{
    const std::filesystem::path root = Config().parent_path() / L"root";
    std::filesystem::create_directories(root);
    std::filesystem::create_directories(Config());
    WriteBytes(root / L"a.txt", "x");
    WriteBytes(Config() / L"OrvixProviders.xml",
               "<?xml version=\"1.0\"?><OrvixProviders><P><Name>Archive</Name><FixedProjectRoot>" + root.string() +
                   "</FixedProjectRoot></P></OrvixProviders>");
    EXPECT_THAT(Run({L"add", (root / L"a.txt").wstring()}).output, HasSubstr("done    checked in  a.txt\n"));
}

TEST_F(Tool, AProviderThatDoesNothingIsFoundOutByItsStates)
{
    Write(L"a.txt", "x");
    const auto result = Run({L"--plugins", ORVIX_STUBBORN_PLUGINS, L"add", L"a.txt"});
    EXPECT_EQ(result.code, Failed);
    EXPECT_THAT(result.output, HasSubstr("failed  not controlled  a.txt\n"));
}

TEST_F(Tool, AProviderThatTellsNoStateFails)
{
    Write(L"riddle.txt", "x");
    for (const wchar_t* command : {L"status", L"add", L"history"})
    {
        const auto result = Run({L"--plugins", ORVIX_STUBBORN_PLUGINS, command, L"riddle.txt"});
        EXPECT_EQ(result.code, Failed);
        EXPECT_THAT(result.errors, HasSubstr("orvix: the provider does not tell the state of the files"));
    }
}

TEST_F(Tool, AnAnswerThatTheUserHasStoredReplacesTheDialogAndStays)
{
    Control(L"a.txt");
    StorePrompt(CheckOutPrompt, "false", "2");
    EXPECT_EQ(RunAttended({L"checkout", L"a.txt"}).code, Success);
    EXPECT_THAT(State(L"a.txt"), HasSubstr("checked out"));
    EXPECT_THAT(StoredPrompts(), HasSubstr("<Action>2</Action>"));
}

TEST_F(Tool, AStoredNoCancelsTheOperation)
{
    Control(L"a.txt");
    StorePrompt(CheckOutPrompt, "false", "4");
    const auto result = RunAttended({L"checkout", L"a.txt"});
    EXPECT_EQ(result.code, Failed);
    EXPECT_THAT(result.output, HasSubstr("cancelled  checked in  a.txt\n"));
    EXPECT_THAT(result.errors, HasSubstr("orvix: the stored answer no cancels it. orvix prompts reset 1330796548 "));
}

TEST_F(Tool, UnattendedAnswersYesAndLeavesTheStoredAnswerAsItWas)
{
    Control(L"a.txt");
    StorePrompt(CheckOutPrompt, "false", "4");
    EXPECT_EQ(Run({L"checkout", L"a.txt"}).code, Success);
    EXPECT_THAT(StoredPrompts(), HasSubstr("<Action>4</Action>"));
}

TEST_F(Tool, ALockedNoIsNotOverridden)
{
    Control(L"a.txt");
    StorePrompt(CheckOutPrompt, "true", "4");
    const auto result = Run({L"checkout", L"a.txt"});
    EXPECT_EQ(result.code, Failed);
    EXPECT_THAT(result.output, HasSubstr("cancelled  checked in  a.txt\n"));
}

TEST_F(Tool, KeepOnTheCommandLineDoesNotBecomeTheStoredAnswer)
{
    Take(L"a.txt");
    StorePrompt(KeepPrompt, "false", "16");
    ASSERT_EQ(Run({L"checkin", L"a.txt", L"--keep"}).code, Success);
    EXPECT_THAT(State(L"a.txt"), HasSubstr("checked out"));
    EXPECT_THAT(StoredPrompts(), HasSubstr("<Action>16</Action>"));
    ASSERT_EQ(Run({L"checkin", L"a.txt"}).code, Success);
    EXPECT_THAT(State(L"a.txt"), HasSubstr("checked in"));
}

TEST_F(Tool, KeepHoldsAlsoWhereAStoredAnswerReplacesTheDialog)
{
    Take(L"a.txt");
    StorePrompt(CheckInPrompt, "false", "2");
    const auto result = RunAttended({L"checkin", L"a.txt", L"--keep"});
    EXPECT_EQ(result.code, Success);
    EXPECT_THAT(result.output, HasSubstr("done    checked out  a.txt\n"));
}

TEST_F(Tool, AKeepThatALockedAnswerForbidsShowsAsFailed)
{
    Take(L"a.txt");
    StorePrompt(KeepPrompt, "true", "16");
    const auto result = Run({L"checkin", L"a.txt", L"--keep"});
    EXPECT_EQ(result.code, Failed);
    EXPECT_THAT(result.output, HasSubstr("failed  checked in  a.txt\n"));
}

TEST_F(Tool, TheDialogConfirmsAnOperation)
{
    Control(L"a.txt");
    AnswerDialogs(L"yes");
    const auto result = RunAttended({L"checkout", L"a.txt"});
    EXPECT_EQ(result.code, Success);
    EXPECT_THAT(result.output, HasSubstr("done    checked out  a.txt\n"));
}

TEST_F(Tool, TheDialogCancelsAnOperation)
{
    Control(L"a.txt");
    AnswerDialogs(L"no");
    const auto result = RunAttended({L"checkout", L"a.txt"});
    EXPECT_EQ(result.code, Failed);
    EXPECT_THAT(result.output, HasSubstr("cancelled  checked in  a.txt\n"));
}

TEST_F(Tool, AFileThatIsClearedInTheDialogIsNotAFailure)
{
    Control(L"a.txt");
    Control(L"b.txt");
    AnswerDialogs(L"yes clear");
    const auto result = RunAttended({L"checkout", L"."});
    EXPECT_EQ(result.code, Success);
    EXPECT_THAT(result.output,
                AllOf(HasSubstr("cleared  checked in   a.txt\n"), HasSubstr("done     checked out  b.txt\n"),
                      HasSubstr("2 files, 1 done, 1 cleared\n")));
}

TEST_F(Tool, TheDialogsOptionKeepsTheFilesCheckedOut)
{
    Take(L"a.txt");
    AnswerDialogs(L"yes keep slowly");
    const auto result = RunAttended({L"checkin", L"a.txt", L"--timeout", L"10"});
    EXPECT_EQ(result.code, Success) << "only providers have a limit: " << result.errors;
    EXPECT_THAT(result.output, HasSubstr("done    checked out  a.txt\n"));
}

TEST_F(Tool, KeepOnTheCommandLineChecksTheDialogsOption)
{
    Take(L"a.txt");
    AnswerDialogs(L"yes");
    const auto result = RunAttended({L"checkin", L"a.txt", L"--keep"});
    EXPECT_EQ(result.code, Success);
    EXPECT_THAT(result.output, HasSubstr("done    checked out  a.txt\n"));
}

TEST_F(Tool, AnAnswerThatIsRememberedInTheDialogIsUsedFromThenOn)
{
    Take(L"a.txt");
    AnswerDialogs(L"yes keep remember");
    ASSERT_EQ(RunAttended({L"checkin", L"a.txt"}).code, Success);
    AnswerDialogs(L"no");
    const auto result = RunAttended({L"checkin", L"a.txt"});
    EXPECT_EQ(result.code, Success);
    EXPECT_THAT(result.output, HasSubstr("done    checked out  a.txt\n"));
}

TEST_F(Tool, MakesTheConfigurationFolderWhenItIsMissing)
{
    ASSERT_FALSE(std::filesystem::exists(Config()));
    EXPECT_EQ(Run({L"providers"}).code, Success);
    EXPECT_TRUE(std::filesystem::is_directory(Config()));
}

TEST_F(Tool, ChoosesAProviderByNameInAnyCaseOrByIndex)
{
    Write(L"a.txt", "x");
    EXPECT_EQ(Run({L"status", L"a.txt", L"--provider", L"ARCHIVE"}).code, Success);
    EXPECT_EQ(Run({L"status", L"a.txt", L"--provider", L"0"}).code, Success);
    for (const wchar_t* unknown : {L"2", L"Arch", L"-1", L"00"})
    {
        const auto result = Run({L"status", L"a.txt", std::wstring(L"--provider=") + unknown});
        EXPECT_EQ(result.code, NotFound);
        EXPECT_THAT(result.errors, HasSubstr("orvix: no such provider: "));
    }
}

TEST_F(Tool, SaysWhatIsMissingWhenThereIsNoProviderProjectOrFolder)
{
    Write(L"a.txt", "x");
    const auto noPlugins = Run({L"providers", L"--plugins", L"nowhere"});
    EXPECT_EQ(noPlugins.code, NotFound);
    EXPECT_THAT(noPlugins.errors, HasSubstr("orvix: no such plug-in folder: "));

    const auto noProvider = Run({L"providers", L"--plugins", L"."});
    EXPECT_EQ(noProvider.code, NotFound);
    EXPECT_THAT(noProvider.errors, HasSubstr("orvix: no provider in "));

    const auto noProject = Run({L"status", L"a.txt", L"--project", L"nowhere"});
    EXPECT_EQ(noProject.code, NotFound);
    EXPECT_THAT(noProject.errors, HasSubstr("orvix: no such project folder: "));

    const auto noConfig = RunExactly({L"providers", L"--config", L"a.txt"});
    EXPECT_EQ(noConfig.code, NotFound);
    EXPECT_THAT(noConfig.errors, HasSubstr("orvix: cannot make the configuration folder: "));
}

TEST_F(Tool, AProviderThatDoesNotStartIsNamed)
{
    const std::filesystem::path folder = Config().parent_path() / L"plugins";
    std::filesystem::create_directories(folder);
    std::filesystem::copy_file(std::filesystem::path(ORVIX_FAKE_PLUGINS) / L"good.dll", folder / L"good.dll");
    const auto result = Run({L"--plugins", folder.wstring(), L"status", L"a.txt"});
    EXPECT_EQ(result.code, NotFound);
    EXPECT_THAT(result.errors, HasSubstr("orvix: the provider does not start: Fake Depot"));
}

TEST_F(Tool, BadUsageIsExplainedAndDoesNothing)
{
    Write(L"a.txt", "x");
    const std::vector<Arguments> bad = {
        {},
        {L"frobnicate", L"a.txt"},
        {L"add"},
        {L"add", L"a.txt", L"--frobnicate"},
        {L"add", L"a.txt", L"-m"},
        {L"add", L"a.txt", L""},
        {L"checkout", L"a.txt", L"--keep"},
        {L"get", L"a.txt", L"-m", L"comment"},
        {L"providers", L"a.txt"},
        {L"add", L"a.txt", L"--", L""},
        {L"--", L"add", L"a.txt"},
        {L"add", L"lone surrogate \xD800"},
        {L"status", L".", L"--project", L""},
        {L"status", L".", L"--config", L""},
        {L"status", L".", L"--plugins", L""},
        {L"status", L".", L"--provider", L""},
    };
    for (const Arguments& arguments : bad)
    {
        const auto result = RunExactly(arguments);
        EXPECT_EQ(result.code, BadUsage) << testing::PrintToString(arguments);
        EXPECT_THAT(result.errors, HasSubstr("orvix: ")) << testing::PrintToString(arguments);
        EXPECT_EQ(result.output, "");
    }
    EXPECT_THAT(State(L"a.txt"), HasSubstr("not controlled"));
}

TEST_F(Tool, AnUnknownCommandIsAnsweredWithTheNearestOne)
{
    EXPECT_THAT(RunExactly({L"chekin", L"a.txt"}).errors,
                HasSubstr("orvix: there is no command chekin; the nearest one is checkin (see --help)\n"));
}

TEST_F(Tool, AFileThatIsNowhereIsRefusedByEveryCommand)
{
    for (const wchar_t* command : {L"status", L"add", L"checkout", L"checkin", L"undo", L"get", L"history"})
    {
        const auto result = Run({command, L"nowhere.txt"});
        EXPECT_EQ(result.code, Failed);
        EXPECT_THAT(result.output, HasSubstr("no such file  nowhere.txt\n"));
    }
}

TEST_F(Tool, TheRestOfTheFilesIsDoneWhenOneIsRefused)
{
    Write(L"a.txt", "x");
    const auto result = Run({L"add", L"nowhere.txt", L"a.txt"});
    EXPECT_EQ(result.code, Failed);
    EXPECT_THAT(State(L"a.txt"), HasSubstr("checked in"));
}

TEST_F(Tool, AnEmptyFolderIsNothingToDo)
{
    std::filesystem::create_directories(File(L"empty"));
    const auto result = Run({L"add", L"empty"});
    EXPECT_EQ(result.code, Success);
    EXPECT_EQ(result.output, "0 files\n");
}
