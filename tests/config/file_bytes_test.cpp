#include "FileBytes.h"
#include "Files.h"
#include "TempFolder.h"
#include "UniqueHandle.h"

#include <gtest/gtest.h>

#include <atomic>
#include <filesystem>
#include <string>
#include <thread>
#include <vector>

using FileBytes::Found;
using FileBytes::Previous;

namespace
{

class FileBytesReplace : public testing::Test
{
protected:
    bool Replace(const std::string& bytes, Previous previous = Previous::Replaced)
    {
        return FileBytes::Replace(m_path.c_str(), bytes, previous);
    }

    UniqueFile Open(DWORD sharing) const
    {
        return UniqueFile(CreateFileW(m_path.c_str(), GENERIC_READ, sharing, nullptr, OPEN_EXISTING, 0, nullptr));
    }

    /// Every file in the folder but the one that is saved.
    std::vector<std::wstring> Others() const
    {
        std::vector<std::wstring> names;
        for (const auto& entry : std::filesystem::directory_iterator(m_folder.Path()))
        {
            if (entry.path() != m_path)
            {
                names.push_back(entry.path().filename());
            }
        }
        return names;
    }

    TempFolder m_folder;
    std::filesystem::path m_path = m_folder.Path() / L"answers 100%25.xml";
    std::filesystem::path m_kept = FileBytes::KeptName(m_path.wstring());
};

} // namespace

TEST_F(FileBytesReplace, MakesANewFileAndReplacesAnOldOne)
{
    EXPECT_TRUE(Replace("one"));
    EXPECT_EQ(ReadBytes(m_path), "one");
    EXPECT_TRUE(Replace(""));
    EXPECT_EQ(ReadBytes(m_path), "");
    EXPECT_TRUE(Replace(std::string("a\0b", 3)));
    EXPECT_EQ(ReadBytes(m_path), std::string("a\0b", 3));
    EXPECT_EQ(Others(), std::vector<std::wstring>());
}

TEST_F(FileBytesReplace, WorksBelowTheLongPathPrefix)
{
    const std::wstring path = L"\\\\?\\" + m_path.wstring();
    EXPECT_TRUE(FileBytes::Replace(path.c_str(), "one", Previous::Replaced));
    EXPECT_TRUE(FileBytes::Replace(path.c_str(), "two", Previous::Replaced));
    EXPECT_EQ(ReadBytes(m_path), "two");
}

TEST_F(FileBytesReplace, RefusesAReadOnlyFileAndAFolder)
{
    WriteBytes(m_path, "old");
    SetFileAttributesW(m_path.c_str(), FILE_ATTRIBUTE_READONLY);
    EXPECT_FALSE(Replace("new"));
    EXPECT_EQ(ReadBytes(m_path), "old");
    SetFileAttributesW(m_path.c_str(), FILE_ATTRIBUTE_NORMAL);
    EXPECT_EQ(Others(), std::vector<std::wstring>());
    EXPECT_FALSE(FileBytes::Replace(m_folder.Text().c_str(), "new", Previous::Replaced));
}

TEST_F(FileBytesReplace, KeepsTheAttributesOfTheOldFile)
{
    WriteBytes(m_path, "old");
    SetFileAttributesW(m_path.c_str(), FILE_ATTRIBUTE_HIDDEN | FILE_ATTRIBUTE_SYSTEM);
    const DWORD attributes = GetFileAttributesW(m_path.c_str());
    EXPECT_TRUE(Replace("new"));
    EXPECT_EQ(ReadBytes(m_path), "new");
    EXPECT_EQ(GetFileAttributesW(m_path.c_str()), attributes);
}

TEST_F(FileBytesReplace, IsNotStoppedByWhatAnInterruptedSaveHasLeft)
{
    WriteBytes(m_path, "old");
    const std::wstring beside = m_path.wstring() + L".new";
    WriteBytes(beside, "half");
    SetFileAttributesW(beside.c_str(), FILE_ATTRIBUTE_HIDDEN | FILE_ATTRIBUTE_SYSTEM | FILE_ATTRIBUTE_READONLY);
    EXPECT_TRUE(Replace("new"));
    EXPECT_EQ(ReadBytes(m_path), "new");
    EXPECT_EQ(Others(), std::vector<std::wstring>());
}

TEST_F(FileBytesReplace, ReplacesAFileThatAReaderKeepsOpenAndSharesWhole)
{
    WriteBytes(m_path, "old");
    const UniqueFile reader = Open(FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE);
    ASSERT_TRUE(reader);
    EXPECT_TRUE(Replace("new"));
    EXPECT_EQ(ReadBytes(m_path), "new");
}

TEST_F(FileBytesReplace, RefusesAFolderThatIsNotThere)
{
    EXPECT_FALSE(FileBytes::Replace((m_folder.Path() / L"nowhere" / L"a.xml").c_str(), "new", Previous::Replaced));
}

TEST_F(FileBytesReplace, WaitsForAnotherProgramsHandle)
{
    WriteBytes(m_path, "old");
    UniqueFile other = Open(FILE_SHARE_READ);
    ASSERT_TRUE(other);
    std::thread closing([&] {
        Sleep(150);
        other.Reset();
    });
    EXPECT_TRUE(Replace("new"));
    closing.join();
    EXPECT_EQ(ReadBytes(m_path), "new");
}

TEST_F(FileBytesReplace, GivesUpAfterHalfASecondAndLeavesTheOldFile)
{
    WriteBytes(m_path, "old");
    {
        const UniqueFile other = Open(FILE_SHARE_READ);
        ASSERT_TRUE(other);
        const ULONGLONG start = GetTickCount64();
        EXPECT_FALSE(Replace("new"));
        EXPECT_GE(GetTickCount64() - start, 400U) << "milliseconds";
    }
    EXPECT_EQ(ReadBytes(m_path), "old");
    EXPECT_EQ(Others(), std::vector<std::wstring>());
}

TEST_F(FileBytesReplace, WritesInPlaceWhereNothingCanBeMadeBesideIt)
{
    WriteBytes(m_path, "an old and longer text");
    std::filesystem::create_directory(m_path.wstring() + L".new"); // no file can take this name
    EXPECT_TRUE(Replace("new"));
    EXPECT_EQ(ReadBytes(m_path), "new");
}

TEST_F(FileBytesReplace, KeepsThePreviousFileWhenAsked)
{
    EXPECT_TRUE(Replace("first", Previous::Kept)) << "there is nothing to keep";
    EXPECT_FALSE(std::filesystem::exists(m_kept));
    EXPECT_TRUE(Replace("second", Previous::Kept));
    EXPECT_EQ(ReadBytes(m_kept), "first");
    EXPECT_TRUE(Replace("third", Previous::Kept));
    EXPECT_EQ(ReadBytes(m_kept), "second");
    EXPECT_EQ(ReadBytes(m_path), "third");
}

TEST_F(FileBytesReplace, WritesNothingWhenThePreviousFileCannotBeKept)
{
    WriteBytes(m_path, "old");
    std::filesystem::create_directory(m_kept);
    EXPECT_FALSE(Replace("new", Previous::Kept));
    EXPECT_EQ(ReadBytes(m_path), "old");
}

TEST_F(FileBytesReplace, IsSeenAsTheOldOrTheNewFileByAReader)
{
    const std::string old(100000, 'o');
    const std::string fresh(150000, 'n');
    WriteBytes(m_path, old);
    std::atomic<bool> ended = false;
    std::thread writer([&] {
        for (int i = 0; i < 50; ++i)
        {
            EXPECT_TRUE(Replace(i % 2 == 0 ? fresh : old));
        }
        ended = true;
    });
    while (!ended)
    {
        std::string bytes;
        if (FileBytes::Read(m_path.c_str(), 1 << 20, bytes) == Found::Bytes)
        {
            EXPECT_TRUE(bytes == old || bytes == fresh) << bytes.size();
        }
    }
    writer.join();
}

TEST(FileBytesRead, TellsWhatItFound)
{
    const TempFolder folder;
    const std::filesystem::path path = folder.Path() / L"file";
    std::string bytes;
    EXPECT_EQ(FileBytes::Read(path.c_str(), 4, bytes), Found::Missing);
    EXPECT_EQ(FileBytes::Read((path / L"below").c_str(), 4, bytes), Found::Missing);
    EXPECT_EQ(FileBytes::Read(folder.Text().c_str(), 4, bytes), Found::Unreadable);
    WriteBytes(path, "1234");
    EXPECT_EQ(FileBytes::Read(path.c_str(), 4, bytes), Found::Bytes);
    EXPECT_EQ(bytes, "1234");
    WriteBytes(path, "12345");
    EXPECT_EQ(FileBytes::Read(path.c_str(), 4, bytes), Found::TooLarge);
}
