// The parts of the provider that need no repository.

#include "CommandLine.h"
#include "Files.h"
#include "GitFailure.h"
#include "GitProgram.h"
#include "GitRunner.h"
#include "GitSnapshot.h"
#include "GitText.h"
#include "LockFiles.h"
#include "Process.h"
#include "TempFolder.h"
#include "WindowsPath.h"

#include <gtest/gtest.h>

#include <windows.h>

#include <shellapi.h>

#include <algorithm>
#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <iterator>
#include <memory>
#include <optional>
#include <string>
#include <thread>
#include <vector>

namespace
{

using namespace std::chrono_literals;
using namespace std::string_literals;
using Texts = std::vector<std::wstring>;

/// Every character that some program treats in a special way.
const Texts NastyArguments{
    L"",
    L" ",
    L"a b",
    L"\"",
    L"a\"b",
    L"\\",
    L"\\\\server\\share\\",
    L"C:\\my folder\\",
    L"a\\\"b",
    L"a\\\\\"b\\\\",
    L"\\\\\"",
    L"*.txt",
    L"file?",
    L"[a-z]",
    L"%PATH%",
    L"^&|<>()!",
    L"'single'",
    L"$HOME`x`;#~",
    L"-n",
    L"--",
    L"@{upstream}",
    L"tab\there",
    L"line\nend",
    L"Gr\u00FC\u00DFe \u65E5\u672C \U0001F600",
};

ProcessCommand Probe(Texts arguments)
{
    ProcessCommand command;
    command.program = GIT_PROBE;
    command.arguments = std::move(arguments);
    command.folder = std::filesystem::temp_directory_path().wstring();
    command.silence = 20s;
    return command;
}

template <typename Work>
std::wstring FailureOf(Work work)
{
    try
    {
        work();
    }
    catch (const GitFailure& failure)
    {
        return failure.lines.front();
    }
    return {};
}

} // namespace

TEST(CommandLine, IsTakenApartIntoTheSameArguments)
{
    const std::wstring line = MakeCommandLine(L"C:\\Program Files\\Git\\git.exe", NastyArguments);
    int count = 0;
    wchar_t** parts = CommandLineToArgvW(line.c_str(), &count);
    const Texts found(parts, parts + count);
    LocalFree(static_cast<void*>(parts));
    Texts expected{L"C:\\Program Files\\Git\\git.exe"};
    expected.insert(expected.end(), NastyArguments.begin(), NastyArguments.end());
    EXPECT_EQ(found, expected);
}

TEST(CommandLine, BringsEveryArgumentToAProgram)
{
    Texts arguments{L"arguments"};
    arguments.insert(arguments.end(), NastyArguments.begin(), NastyArguments.end());
    const ProcessResult result = Process::Run(Probe(arguments), nullptr);
    std::string expected;
    for (const std::wstring& argument : NastyArguments)
    {
        expected += GitText::ToUtf8(argument) + '\0';
    }
    EXPECT_EQ(result.output, expected);
}

TEST(ChildProcess, ReturnsItsExitCode)
{
    const ProcessResult result = Process::Run(Probe({L"fail"}), nullptr);
    EXPECT_EQ(result.end, ProcessResult::End::Exited);
    EXPECT_EQ(result.exitCode, 7u);
    EXPECT_FALSE(result.Succeeded());
    EXPECT_TRUE(Process::Run(Probe({}), nullptr).Succeeded());
}

TEST(ChildProcess, FillsBothOutputsBeforeItReadsAndNeitherSideWaitsForEver)
{
    ProcessCommand command = Probe({L"flood"});
    for (int i = 0; i < 300000; ++i)
    {
        command.input += std::to_string(i) + '\n';
    }
    const std::string input = command.input;
    const ProcessResult result = Process::Run(command, nullptr);
    constexpr std::size_t Megabyte = 1048576;
    ASSERT_EQ(result.output.size(), Megabyte + input.size());
    EXPECT_EQ(result.output.substr(Megabyte), input);
    EXPECT_EQ(result.errors, std::string(Megabyte, 'x'));
}

TEST(ChildProcess, MayEndWithoutReadingItsInput)
{
    ProcessCommand command = Probe({L"fail"});
    command.input.assign(1000000, 'x');
    EXPECT_EQ(Process::Run(command, nullptr).exitCode, 7u);
}

TEST(ChildProcess, HasTheEnvironmentWithTheChanges)
{
    SetEnvironmentVariableW(L"ORVIX_TEST_KEPT", L"kept");
    SetEnvironmentVariableW(L"ORVIX_TEST_REMOVED", L"there");
    const auto valueOf = [](const wchar_t* name) {
        ProcessCommand command = Probe({L"variable", name});
        command.environment = {{L"orvix_test_removed", std::nullopt}, {L"ORVIX_TEST_SET", L"\u00E9=1"}};
        return Process::Run(command, nullptr).output;
    };
    EXPECT_EQ(valueOf(L"ORVIX_TEST_KEPT"), "kept\0"s);
    EXPECT_EQ(valueOf(L"ORVIX_TEST_REMOVED"), "\0"s);
    EXPECT_EQ(valueOf(L"ORVIX_TEST_SET"), "\xC3\xA9=1\0"s);
}

TEST(ChildProcess, ThatLivesOnHasTheEnvironmentWithTheChanges)
{
    SetEnvironmentVariableW(L"GIT_DIR", L"C:\\elsewhere");
    SetEnvironmentVariableW(L"ORVIX_TEST_KEPT", L"kept");
    const TempFolder folder;
    const auto valueOf = [&](const wchar_t* name) {
        const std::filesystem::path file = folder.Path() / name;
        Process::StartAlone(GIT_PROBE, {L"save", name, file.wstring()}, folder.Text(), GitRunner::NoRepository());
        for (int i = 0; i < 600 && ReadBytes(file).empty(); ++i)
        {
            std::this_thread::sleep_for(50ms);
        }
        return ReadBytes(file);
    };
    EXPECT_EQ(valueOf(L"ORVIX_TEST_KEPT"), "kept\0"s);
    EXPECT_EQ(valueOf(L"GIT_DIR"), "\0"s);
    SetEnvironmentVariableW(L"GIT_DIR", nullptr);
}

TEST(GitRunner, FixesWhatGitReadsFromTheEnvironmentAndTheConfiguration)
{
    using Variable = ProcessCommand::Variable;
    GitRunner runner;
    const auto has = [](const ProcessCommand& process, const Variable& variable) {
        return std::count(process.environment.begin(), process.environment.end(), variable) == 1;
    };
    const auto sets = [](const ProcessCommand& process, const wchar_t* setting) {
        const auto found = std::find(process.arguments.begin(), process.arguments.end(), setting);
        return found != process.arguments.end() && found != process.arguments.begin() && *std::prev(found) == L"-c";
    };
    const Variable always[] = {{L"LC_ALL", L"C"},
                               {L"GIT_TERMINAL_PROMPT", L"0"},
                               {L"GIT_PAGER", L"cat"},
                               {L"GIT_EDITOR", L":"},
                               {L"SSH_ASKPASS_REQUIRE", L"force"},
                               {L"GIT_DIR", std::nullopt},
                               {L"GIT_LITERAL_PATHSPECS", std::nullopt}};
    const Variable alone[] = {
        {L"GIT_ASKPASS", std::nullopt}, {L"SSH_ASKPASS", std::nullopt}, {L"GCM_INTERACTIVE", L"never"}};
    for (const bool unattended : {false, true})
    {
        runner.SetWindow(nullptr, unattended);
        const ProcessCommand process =
            runner.MakeProcess({.arguments = {L"status"}, .isQuery = true, .settings = {L"a.b=c"}});
        for (const Variable& variable : always)
        {
            EXPECT_TRUE(has(process, variable)) << GitText::ToUtf8(variable.first);
        }
        for (const Variable& variable : alone)
        {
            EXPECT_EQ(has(process, variable), unattended) << GitText::ToUtf8(variable.first);
        }
        EXPECT_TRUE(has(process, {L"GIT_OPTIONAL_LOCKS", L"0"}));
        EXPECT_TRUE(has(runner.MakeProcess({.arguments = {L"add"}}), {L"GIT_OPTIONAL_LOCKS", L"1"}));
        EXPECT_TRUE(sets(process, L"color.ui=false"));
        EXPECT_TRUE(sets(process, L"core.longpaths=true"));
        EXPECT_TRUE(sets(process, L"core.quotePath=false"));
        EXPECT_TRUE(sets(process, L"a.b=c"));
        EXPECT_EQ(sets(process, L"core.askPass="), unattended);
        EXPECT_EQ(process.arguments.back(), L"status");
    }
}

TEST(ChildProcess, TellsTheListenerWhatComesWhileItComes)
{
    std::size_t calls = 0;
    Process::Run(Probe({L"talk"}), nullptr, [&](Process::Stream stream, std::string_view bytes) {
        EXPECT_EQ(stream, Process::Stream::Output);
        EXPECT_LT(bytes.size(), 20u);
        ++calls;
    });
    EXPECT_GT(calls, 3u);
}

TEST(ChildProcess, IsEndedWhenItIsSilentForTooLong)
{
    ProcessCommand command = Probe({L"sleep"});
    command.silence = 1s;
    const auto begin = std::chrono::steady_clock::now();
    EXPECT_EQ(Process::Run(command, nullptr).end, ProcessResult::End::Silent);
    EXPECT_LT(std::chrono::steady_clock::now() - begin, 15s);
}

TEST(ChildProcess, MayRunForLongWhileItPrints)
{
    ProcessCommand command = Probe({L"talk"}); // for 5 s
    command.silence = 4s;
    EXPECT_EQ(Process::Run(command, nullptr).end, ProcessResult::End::Exited);
}

TEST(ChildProcess, IsEndedTogetherWithTheProgramsItHasStarted)
{
    const OwnedHandle cancel(CreateEventW(nullptr, TRUE, FALSE, nullptr));
    unsigned long child = 0;
    const ProcessResult result =
        Process::Run(Probe({L"nest"}), cancel.get(), [&](Process::Stream, std::string_view bytes) {
            child = std::strtoul(std::string(bytes).c_str(), nullptr, 10);
            SetEvent(cancel.get());
        });
    EXPECT_EQ(result.end, ProcessResult::End::Cancelled);
    ASSERT_NE(child, 0u);
    const OwnedHandle process(OpenProcess(SYNCHRONIZE, FALSE, child));
    EXPECT_TRUE(!process || WaitForSingleObject(process.get(), 5000) == WAIT_OBJECT_0);
}

TEST(ChildProcess, ThatCannotBeStartedSaysWhy)
{
    ProcessCommand command = Probe({});
    command.program = L"C:\\no such program.exe";
    EXPECT_NE(FailureOf([&] { Process::Run(command, nullptr); }).find(L"no such program.exe cannot be started"),
              std::wstring::npos);
}

TEST(WindowsPath, OfAShareHasALongFormToo)
{
    const std::wstring share = L"\\\\server\\share\\my town\\a.txt";
    const std::wstring longShare = L"\\\\?\\UNC\\server\\share\\my town\\a.txt";
    EXPECT_EQ(FullPath(longShare), share);
    EXPECT_EQ(FullPath(share), share);
    EXPECT_EQ(LongForm(share), longShare);
    EXPECT_EQ(FullPath(L"\\\\?\\C:\\town\\"), L"C:\\town");
    EXPECT_EQ(LongForm(L"C:\\town"), L"\\\\?\\C:\\town");
}

TEST(LockFiles, DeletesThoseOfItsOwnCommand)
{
    const TempFolder folder;
    const std::wstring git = folder.Text();
    std::filesystem::create_directories(folder.Path() / L"refs" / L"heads");
    std::filesystem::create_directories(folder.Path() / L"objects" / L"info");
    const auto write = [&](const wchar_t* file, std::chrono::hours age) {
        WriteBytes(folder.Path() / file, "");
        std::filesystem::last_write_time(folder.Path() / file, std::filesystem::file_time_type::clock::now() - age);
    };
    const auto has = [&](const wchar_t* file) { return std::filesystem::exists(folder.Path() / file); };
    write(L"config.lock", 1h);
    write(L"index.lock", -1h);
    write(L"refs/heads/main.lock", -1h);
    write(L"objects/maintenance.lock", -1h);
    write(L"objects/info/commit-graph.lock", -1h);
    LockFiles(git, git, false).DeleteNew();
    EXPECT_TRUE(has(L"config.lock")) << "it is older";
    EXPECT_TRUE(has(L"index.lock")) << "the command does not write the index";
    EXPECT_FALSE(has(L"refs/heads/main.lock"));
    EXPECT_FALSE(has(L"objects/maintenance.lock"));
    EXPECT_FALSE(has(L"objects/info/commit-graph.lock"));
    LockFiles(git, git, true).DeleteNew();
    EXPECT_FALSE(has(L"index.lock"));
}

TEST(GitProgram, IsFoundInAbsoluteFoldersOnly)
{
    const TempFolder folder;
    std::filesystem::create_directory(folder.Path() / L"my git");
    std::filesystem::create_directory(folder.Path() / L"other");
    WriteBytes(folder.Path() / L"my git" / L"git.exe", "");
    WriteBytes(folder.Path() / L"other" / L"git.exe", "");
    const std::wstring inMine = folder.Text() + L"\\my git";
    const std::wstring inOther = folder.Text() + L"\\other";
    EXPECT_EQ(GitProgram::FindInFolders(L".;;C:;\"" + inMine + L"\";" + inOther), inMine + L"\\git.exe");
    EXPECT_EQ(GitProgram::FindInFolders(folder.Text() + L";" + inOther), inOther + L"\\git.exe");
    EXPECT_EQ(GitProgram::FindInFolders(L""), L"");

    const std::filesystem::path before = std::filesystem::current_path();
    std::filesystem::current_path(inMine);
    EXPECT_EQ(GitProgram::FindInFolders(L".;;..\\other;\\"), L"");
    std::filesystem::current_path(before);
}

TEST(GitProgram, MayBeNamedByTheAdministrator)
{
    const TempFolder folder;
    WriteBytes(folder.Path() / L"my git.exe", "");
    const std::wstring program = folder.Text() + L"\\my git.exe";
    EXPECT_EQ(GitProgram::Find(program), program);
    for (const std::wstring& wrong : {folder.Text(), folder.Text() + L"\\none.exe", std::wstring(L"git.exe")})
    {
        EXPECT_NE(FailureOf([&] { GitProgram::Find(wrong); }).find(L"AltProviderExecutable"), std::wstring::npos);
    }
}

TEST(GitProgram, IsRefusedWhenItIsTooOld)
{
    for (const char* version : {"git version 2.31.0\n", "git version 2.39.5\n", "git version 2.45.1.windows.1\r\n",
                                "git version 3.0\n", "git version 2.100.0\n"})
    {
        EXPECT_EQ(FailureOf([&] { GitProgram::CheckVersion(version); }), L"") << version;
    }
    for (const char* version : {"git version 2.30.9\n", "git version 1.99\n", "svn 2.40\n", "git version two\n", ""})
    {
        EXPECT_TRUE(FailureOf([&] { GitProgram::CheckVersion(version); }).starts_with(L"Git 2.31 or later is needed"))
            << version;
    }
}

TEST(GitText, ShowsLinesWithoutProgressThatWasOverwritten)
{
    EXPECT_EQ(GitText::Lines("Writing:  10%\rWriting: 100%, done.\nerror: no\r\n\n  \nlast"),
              (Texts{L"Writing: 100%, done.", L"error: no", L"last"}));
}

TEST(GitStatus, IsReadFromWhatGitPrints)
{
    const GitStatus status =
        GitStatus::Read("# branch.oid 7898\0# branch.head main\0# branch.upstream origin/main\0# branch.ab +3 -12\0"
                        "1 .M N... 100644 100644 100644 1 2 a b  c.txt\0"
                        "1 A. N... 000000 100644 100644 0 2 new.txt\0"
                        "1 D. N... 100644 000000 000000 1 0 gone.txt\0"
                        "u UU N... 100644 100644 100644 100644 1 2 3 both ways.txt\0"
                        "? other one.txt\0"s);
    EXPECT_EQ(status.branch, L"main");
    EXPECT_EQ(status.upstream, L"origin/main");
    EXPECT_EQ(status.ahead, 3);
    EXPECT_EQ(status.behind, 12);
    ASSERT_EQ(status.files.size(), 5u);
    const char* paths[] = {"a b  c.txt", "new.txt", "gone.txt", "both ways.txt", "other one.txt"};
    const wchar_t* words[] = {L"modified", L"added", L"deleted", L"in conflict", L"not controlled"};
    for (std::size_t i = 0; i < 5; ++i)
    {
        EXPECT_EQ(status.files[i].path, paths[i]);
        EXPECT_EQ(GitStatus::Word(status.files[i]), words[i]);
    }
}

TEST(GitStatus, OfDamagedTextIsReadAsFarAsItGoes)
{
    EXPECT_TRUE(GitStatus::Read("1 \0u\0# branch.ab\0# branch.ab +\0"s).files.empty());
    EXPECT_EQ(GitStatus::Read("1 .M N...\0"s).files.front().path, "");
}

TEST(GitSnapshot, FindsAFileInAnyLetterCase)
{
    const GitSnapshot snapshot("? Readme.TXT\0"s,
                               std::make_shared<const std::string>("src/Main.cpp\0src/\xC3\x84.txt\0"s));
    EXPECT_EQ(snapshot.Find("src/Main.cpp")->first, "src/Main.cpp");
    EXPECT_EQ(snapshot.Find("SRC/MAIN.CPP")->first, "src/Main.cpp");
    EXPECT_TRUE(snapshot.Find("src/\xC3\xA4.TXT")->second.isTracked);
    EXPECT_FALSE(snapshot.Find("readme.txt")->second.isTracked);
    EXPECT_EQ(snapshot.Find("src/main.c"), nullptr);
}
