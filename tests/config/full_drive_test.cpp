// Saving on a full drive. `ORVIX_SMALL_DRIVE` names a folder on a drive of some 128 KB that the test may fill; the test
// script makes one where it is allowed to.

#include "FileBytes.h"
#include "Files.h"
#include "OrvixPromptTable.h"
#include "PromptFile.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <string>

namespace
{

constexpr wchar_t Text[] = L"Check the file out before it is changed?";

void Add(OrvixPromptTable& table, int count)
{
    for (int i = 0; i < count; ++i)
    {
        table.AddPrompt(table.NumPrompts(), Text, 0, 0, false);
    }
}

/// Fills the rest of the drive.
void Fill(const std::filesystem::path& path)
{
    std::ofstream stream(path, std::ios::binary);
    const std::string block(1024, 'x');
    while (stream.write(block.data(), static_cast<std::streamsize>(block.size())).flush())
    {
    }
}

} // namespace

TEST(FullDrive, KeepsTheOldFileWholeAndSavesOnceThereIsRoom)
{
    const wchar_t* drive = _wgetenv(L"ORVIX_SMALL_DRIVE");
    if (drive == nullptr)
    {
        GTEST_SKIP() << "no small drive";
    }
    const std::filesystem::path folder(drive);
    const std::wstring path = (folder / PromptFileName).wstring();
    OrvixPromptTable table;
    Add(table, 10);
    ASSERT_TRUE(WritePromptFile(table, path.c_str()));
    const std::string before = ReadBytes(path);

    Fill(folder / "fill");
    Add(table, 40);
    EXPECT_FALSE(WritePromptFile(table, path.c_str()));
    EXPECT_EQ(ReadBytes(path), before);
    EXPECT_FALSE(std::filesystem::exists(path + L".new"));
    // Nor is a file that could not be read given up, when there is no room for its copy.
    EXPECT_FALSE(WritePromptFile(table, path.c_str(), FileBytes::Previous::Kept));
    EXPECT_EQ(ReadBytes(path), before);

    std::filesystem::remove(folder / "fill");
    EXPECT_TRUE(WritePromptFile(table, path.c_str()));
    OrvixPromptTable read;
    EXPECT_TRUE(ReadPromptFile(read, path.c_str()));
    EXPECT_EQ(read.NumPrompts(), 50);
    std::filesystem::remove(path);
}
