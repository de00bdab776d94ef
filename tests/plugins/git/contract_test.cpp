// The plug-in as orvix validate sees it, with a repository as template.

#include "GitTest.h"

#include <chrono>

using GitContract = GitTest;

TEST_F(GitContract, IsKeptByTheProvider)
{
    const PlainGit git = MakeRepository(L"template");
    git.Commit(L"a.txt", "1\n");
    ProcessCommand command;
    command.program = ORVIX_TOOL;
    command.arguments = {L"validate", GIT_PLUGIN, L"--project", git.Folder(), L"--timeout", L"300"};
    command.folder = m_folder.Text();
    command.silence = std::chrono::minutes(6);
    const std::wstring bridge = std::filesystem::path(PlainGit::Program()).parent_path().wstring();
    const std::wstring bin = std::filesystem::path(ORVIX_TOOL).parent_path().wstring();
    command.environment = {{L"PATH", bridge + L';' + bin}};
    const ProcessResult result = Process::Run(std::move(command), nullptr);
    EXPECT_TRUE(result.Succeeded()) << result.output << result.errors;
    EXPECT_NE(result.output.find(" 0 failed, 1 skipped"), std::string::npos) << result.output;
}
