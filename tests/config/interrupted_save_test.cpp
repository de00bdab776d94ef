// A process is ended while it saves, again and again: the file is always the old or the new one, whole.

#include "FileBytes.h"
#include "Files.h"
#include "ModulePath.h"
#include "OrvixPromptTable.h"
#include "PromptFile.h"
#include "TempFolder.h"
#include "UniqueHandle.h"

#include <gtest/gtest.h>

#include <windows.h>

#include <cstdlib>
#include <random>
#include <string>

namespace
{

constexpr wchar_t PathVariable[] = L"ORVIX_TEST_SAVED_FILE";
constexpr wchar_t KillsVariable[] = L"ORVIX_KILLS"; ///< how often; 50 without it
constexpr int SmallCount = 400;
constexpr int LargeCount = 600;

/// The file with 400 prompts in it, and then with 600.
void Save(const wchar_t* path, int count)
{
    OrvixPromptTable table;
    for (int id = 0; id < count; ++id)
    {
        table.AddPrompt(id, L"Check the file out before it is changed?", 0, 0, false);
    }
    EXPECT_TRUE(WritePromptFile(table, path));
}

} // namespace

/// Runs in a process of its own, see below.
TEST(SavingProcess, DISABLED_SavesUntilItIsEnded)
{
    const wchar_t* path = _wgetenv(PathVariable);
    ASSERT_NE(path, nullptr);
    for (bool large = true;; large = !large)
    {
        Save(path, large ? LargeCount : SmallCount);
    }
}

TEST(InterruptedSave, LeavesTheOldOrTheNewFileWhole)
{
    const TempFolder folder;
    const std::wstring path = (folder.Path() / PromptFileName).wstring();
    Save(path.c_str(), SmallCount);
    SetEnvironmentVariableW(PathVariable, path.c_str());
    const wchar_t* asked = _wgetenv(KillsVariable);
    const int kills = asked == nullptr ? 50 : _wtoi(asked);
    std::mt19937 random(1); // NOLINT(cert-msc51-cpp): the same moments in every run
    for (int i = 0; i < kills; ++i)
    {
        std::wstring commandLine = L"\"" + ModulePath(nullptr) +
                                   L"\" --gtest_also_run_disabled_tests --gtest_filter=SavingProcess.* --gtest_brief=1";
        STARTUPINFOW startup = {};
        startup.cb = sizeof startup;
        PROCESS_INFORMATION started = {};
        ASSERT_TRUE(CreateProcessW(nullptr, commandLine.data(), nullptr, nullptr, FALSE, CREATE_NO_WINDOW, nullptr,
                                   nullptr, &startup, &started) != FALSE);
        const UniqueKernelHandle thread(started.hThread);
        const UniqueKernelHandle process(started.hProcess);
        const std::string before = ReadBytes(path);
        while (ReadBytes(path) == before && WaitForSingleObject(process.Get(), 1) == WAIT_TIMEOUT)
        {
        }
        Sleep(random() % 40);
        TerminateProcess(process.Get(), 1);
        WaitForSingleObject(process.Get(), INFINITE);

        OrvixPromptTable table;
        OrvixFileIO::Content content = {};
        ASSERT_TRUE(ReadPromptFile(table, path.c_str(), nullptr, &content))
            << "after " << i << ": " << static_cast<int>(content) << " " << ReadBytes(path).size();
        ASSERT_TRUE(table.NumPrompts() == SmallCount || table.NumPrompts() == LargeCount) << table.NumPrompts();
    }
    SetEnvironmentVariableW(PathVariable, nullptr);
    Save(path.c_str(), SmallCount); // what an ended process has left behind does no harm
    EXPECT_FALSE(std::filesystem::exists(path + L".new"));
}
