#include "ArchiveProject.h"
#include "ArchiveStore.h"

#include <gtest/gtest.h>

#include <map>
#include <thread>

namespace
{

using Files = std::vector<std::wstring>;

/// Anna's and Ben's stores on one project folder.
class ArchiveStoreTest : public testing::Test
{
protected:
    void SetUp() override
    {
        ASSERT_TRUE(m_anna.Open(m_project.Text(), L"anna").empty());
        ASSERT_TRUE(m_ben.Open(m_project.Text(), L"ben").empty());
    }

    /// Writes and adds a file.
    std::wstring Added(std::wstring_view name, std::string_view bytes)
    {
        std::wstring file = m_project.Write(name, bytes);
        EXPECT_TRUE(m_anna.Add(Files{file}, L"added", false).empty());
        return file;
    }

    /// Adds a file and has Anna check it out.
    std::wstring CheckedOut(std::wstring_view name, std::string_view bytes)
    {
        std::wstring file = Added(name, bytes);
        EXPECT_TRUE(m_anna.CheckOut(Files{file}, L"mine", false).empty());
        return file;
    }

    /// Adds a file with two versions, "one" and "two".
    std::wstring WithTwoVersions(std::wstring_view name)
    {
        std::wstring file = CheckedOut(name, "one");
        m_project.Write(name, "two");
        EXPECT_TRUE(m_anna.CheckIn(Files{file}, L"second", false).empty());
        return file;
    }

    ArchiveStatus StatusOf(const ArchiveStore& store, const std::wstring& file)
    {
        std::vector<ArchiveStatus> statuses;
        EXPECT_TRUE(store.Status(Files{file}, statuses).empty());
        return statuses.empty() ? ArchiveStatus{} : statuses[0];
    }

    ArchiveRecord RecordOf(const std::wstring& file)
    {
        std::vector<ArchiveRecord> records;
        EXPECT_TRUE(m_anna.History(Files{file}, records).empty());
        return records.empty() ? ArchiveRecord{} : records[0];
    }

    std::filesystem::path ContentsPath(const ArchiveVersion& version)
    {
        return m_project.Path(L".archive\\contents") / version.sha256.substr(0, 2) / version.sha256;
    }

    std::string StoredBytes(const std::wstring& file, std::size_t number)
    {
        return ReadBytes(ContentsPath(RecordOf(file).versions.at(number - 1)));
    }

    /// Every file of the archive and its bytes.
    std::map<std::filesystem::path, std::string> Snapshot()
    {
        std::map<std::filesystem::path, std::string> files;
        for (const auto& entry : std::filesystem::recursive_directory_iterator(m_project.Path(L".archive")))
        {
            if (entry.is_regular_file())
            {
                files[entry.path()] = ReadBytes(entry.path());
            }
        }
        return files;
    }

    /// The path of the only record in the archive.
    std::filesystem::path RecordPath()
    {
        for (const auto& [path, bytes] : Snapshot())
        {
            if (path.parent_path().parent_path() == m_project.Path(L".archive\\files"))
            {
                return path;
            }
        }
        return {};
    }

    ArchiveProject m_project;
    ArchiveStore m_anna{std::chrono::seconds(5)};
    ArchiveStore m_ben{std::chrono::seconds(5)};
};

void ExpectFailure(const ArchiveFailures& failures, ArchiveError error, const std::wstring& file)
{
    ASSERT_EQ(failures.size(), 1u);
    EXPECT_EQ(failures[0].error, error) << std::filesystem::path(failures[0].reason).string();
    EXPECT_EQ(failures[0].file, file);
    EXPECT_FALSE(failures[0].reason.empty());
    EXPECT_EQ(failures[0].reason.find_first_of(L"\r\n"), std::wstring::npos);
}

} // namespace

using ArchiveStoreOpen = ArchiveStoreTest;
using ArchiveStoreAdd = ArchiveStoreTest;
using ArchiveStoreCheckOut = ArchiveStoreTest;
using ArchiveStoreCheckIn = ArchiveStoreTest;
using ArchiveStoreUndo = ArchiveStoreTest;
using ArchiveStoreGet = ArchiveStoreTest;
using ArchiveStoreStatus = ArchiveStoreTest;
using ArchiveStoreList = ArchiveStoreTest;
using ArchiveStoreSafety = ArchiveStoreTest;
using ArchiveStoreUsers = ArchiveStoreTest;
using ArchiveStorePaths = ArchiveStoreTest;

// Opening

TEST_F(ArchiveStoreOpen, MakesTheArchiveInTheProjectFolder)
{
    EXPECT_EQ(m_project.Read(L".archive\\archive.txt"), "orvix-archive 1\n");
    EXPECT_TRUE(m_anna.IsOpen());
}

TEST_F(ArchiveStoreOpen, FindsWhatWasStoredBefore)
{
    const std::wstring file = Added(L"a.txt", "one");
    m_anna.Close();

    ASSERT_TRUE(m_anna.Open(m_project.Text() + L"\\", L"anna").empty());

    EXPECT_EQ(RecordOf(file).versions.size(), 1u);
}

TEST_F(ArchiveStoreOpen, RefusesAFolderThatDoesNotExist)
{
    const ArchiveFailures failures = m_anna.Open(m_project.File(L"nowhere"), L"anna");

    ExpectFailure(failures, ArchiveError::Access, L"");
    EXPECT_FALSE(m_anna.IsOpen());
    EXPECT_FALSE(std::filesystem::exists(m_project.Path(L"nowhere")));
}

TEST_F(ArchiveStoreOpen, RefusesAnArchiveOfAnotherFormat)
{
    m_project.Overwrite(m_project.Path(L".archive\\archive.txt"), "orvix-archive 2\n");

    ExpectFailure(m_anna.Open(m_project.Text(), L"anna"), ArchiveError::Damaged, L"");
    EXPECT_EQ(m_project.Read(L".archive\\archive.txt"), "orvix-archive 2\n");
}

TEST_F(ArchiveStoreOpen, CompletesAnArchiveThatIsUnfinished)
{
    std::filesystem::remove(m_project.Path(L".archive\\archive.txt"));
    std::filesystem::remove(m_project.Path(L".archive\\files"));

    ASSERT_TRUE(m_anna.Open(m_project.Text(), L"anna").empty());

    EXPECT_EQ(RecordOf(Added(L"a.txt", "one")).versions.size(), 1u);
}

TEST_F(ArchiveStoreOpen, RefusesAnArchiveAsAProject)
{
    ExpectFailure(m_anna.Open(m_project.File(L".archive\\files"), L"anna"), ArchiveError::InvalidPath, L"");
}

TEST_F(ArchiveStoreOpen, RefusesAUserWithoutAName)
{
    ExpectFailure(m_anna.Open(m_project.Text(), L""), ArchiveError::Access, L"");
    ExpectFailure(m_anna.Open(m_project.Text(), L"\xDC00"), ArchiveError::Access, L"");
}

TEST_F(ArchiveStoreOpen, RefusesALinkThatCannotBeRead)
{
    const ArchiveProject other;
    for (const char* link : {"", "something else", "orvix-archive-link 1\n\xFF\n", "orvix-archive-link 1\nrelative\n",
                             "orvix-archive-link 1\nC:\\no such folder\n"})
    {
        other.Write(L".archive", link);
        EXPECT_EQ(m_anna.Open(other.Text(), L"anna").size(), 1u) << link;
        EXPECT_FALSE(m_anna.IsOpen());
    }
}

TEST_F(ArchiveStoreOpen, FindsAnArchiveWithoutOpeningOrMakingIt)
{
    const ArchiveProject other;
    bool isProject = false;
    ASSERT_TRUE(ArchiveStore::Find(m_project.Text(), isProject).empty());
    EXPECT_TRUE(isProject);
    ASSERT_TRUE(ArchiveStore::Find(other.Text(), isProject).empty());
    EXPECT_FALSE(isProject);
    EXPECT_FALSE(std::filesystem::exists(other.Path(L".archive")));

    other.Write(L".archive", "a link, whatever it says");
    ASSERT_TRUE(ArchiveStore::Find(other.Text(), isProject).empty());
    EXPECT_TRUE(isProject);
    ExpectFailure(ArchiveStore::Find(m_project.File(L"nowhere"), isProject), ArchiveError::Access, L"");
    EXPECT_FALSE(isProject);
}

TEST_F(ArchiveStoreOpen, ShowsThePathOfTheArchiveWithoutAPrefix)
{
    EXPECT_TRUE(std::filesystem::equivalent(m_anna.ArchivePath(), m_project.Path(L".archive")));
    EXPECT_EQ(m_anna.ArchivePath().find(L'?'), std::wstring::npos);
    EXPECT_EQ(ArchiveStore().ArchivePath(), L"");
    EXPECT_EQ(ArchivePaths::ShortForm(L"\\\\?\\UNC\\server\\share"), L"\\\\server\\share");
}

TEST_F(ArchiveStoreOpen, IsRequiredByEveryCommand)
{
    ArchiveStore closed;
    const Files files{m_project.Write(L"a.txt", "one")};
    std::vector<ArchiveStatus> statuses;
    std::vector<ArchiveRecord> records;
    Files listed;

    for (const ArchiveFailures& failures :
         {closed.Add(files, L"", false), closed.CheckOut(files, L"", false), closed.CheckIn(files, L"", false),
          closed.UndoCheckOut(files), closed.GetLatest(files), closed.Status(files, statuses),
          closed.History(files, records), closed.List(m_project.Text(), true, listed)})
    {
        ExpectFailure(failures, ArchiveError::NotOpen, L"");
    }
}

// Adding

TEST_F(ArchiveStoreAdd, StoresTheFirstVersionAndMakesTheFileReadOnly)
{
    const std::wstring file = m_project.Write(L"sub\\a.txt", "one");

    ASSERT_TRUE(m_anna.Add(Files{file}, L"the first", false).empty());

    const ArchiveRecord record = RecordOf(file);
    EXPECT_EQ(record.path, L"sub/a.txt");
    EXPECT_FALSE(record.checkOut);
    ASSERT_EQ(record.versions.size(), 1u);
    EXPECT_EQ(record.versions[0].user, L"anna");
    EXPECT_EQ(record.versions[0].comment, L"the first");
    EXPECT_EQ(record.versions[0].size, 3u);
    EXPECT_EQ(record.versions[0].sha256, "7692c3ad3540bb803c020b3aee66cd8887123234ea0c6e7143c0add73ff431ed");
    EXPECT_EQ(record.versions[0].time.size(), 20u);
    EXPECT_EQ(StoredBytes(file, 1), "one");
    EXPECT_TRUE(IsReadOnly(file));
}

TEST_F(ArchiveStoreAdd, KeepsTheFileCheckedOutWhenAsked)
{
    const std::wstring file = m_project.Write(L"a.txt", "one");

    ASSERT_TRUE(m_anna.Add(Files{file}, L"", true).empty());

    EXPECT_FALSE(IsReadOnly(file));
    EXPECT_TRUE(StatusOf(m_anna, file).checkedOut);
}

TEST_F(ArchiveStoreAdd, RefusesAFileThatIsAlreadyControlled)
{
    const std::wstring file = Added(L"a.txt", "one");

    ExpectFailure(m_ben.Add(Files{file}, L"", false), ArchiveError::AlreadyControlled, file);
    EXPECT_EQ(RecordOf(file).versions.size(), 1u);
}

TEST_F(ArchiveStoreAdd, GoesOnAfterAFileThatFails)
{
    const std::wstring missing = m_project.File(L"missing.txt");
    const std::wstring last = m_project.Write(L"last.txt", "last");

    ExpectFailure(m_anna.Add(Files{missing, last}, L"", false), ArchiveError::NoSuchFile, missing);

    EXPECT_TRUE(StatusOf(m_anna, last).controlled);
    EXPECT_FALSE(StatusOf(m_anna, missing).controlled);
}

TEST_F(ArchiveStoreAdd, HandlesAFileThatIsGivenTwiceOnce)
{
    const std::wstring file = m_project.Write(L"a.txt", "one");

    EXPECT_TRUE(m_anna.Add(Files{file, m_project.File(L"A.TXT")}, L"", false).empty());
}

TEST_F(ArchiveStoreAdd, StoresEmptyAndEqualFiles)
{
    const Files files{m_project.Write(L"a", ""), m_project.Write(L"b", "same"), m_project.Write(L"c", "same")};

    ASSERT_TRUE(m_anna.Add(files, L"", false).empty());

    EXPECT_EQ(StoredBytes(files[0], 1), "");
    EXPECT_EQ(StoredBytes(files[1], 1), "same");
    EXPECT_EQ(StoredBytes(files[2], 1), "same");
}

TEST_F(ArchiveStoreAdd, StoresAFileOfManyBlocks)
{
    std::string bytes;
    for (int i = 0; i < 1'000'000; ++i)
    {
        bytes += static_cast<char>(i * 7 + i / 251);
    }

    const std::wstring file = Added(L"big", bytes);

    EXPECT_EQ(StoredBytes(file, 1), bytes);
}

TEST_F(ArchiveStoreAdd, RefusesAFileThatAnotherProgramIsWriting)
{
    const std::wstring file = m_project.Write(L"a.txt", "one");
    const ArchiveFiles::UniqueHandle writer =
        ArchiveFiles::Open(file, GENERIC_WRITE, FILE_SHARE_READ | FILE_SHARE_WRITE, OPEN_EXISTING);
    ASSERT_TRUE(writer);

    ExpectFailure(m_anna.Add(Files{file}, L"", false), ArchiveError::Access, file);
    EXPECT_FALSE(StatusOf(m_anna, file).controlled);
}

// Checking out

TEST_F(ArchiveStoreCheckOut, MakesTheFileWritableAndRecordsTheUser)
{
    const std::wstring file = Added(L"a.txt", "one");

    ASSERT_TRUE(m_anna.CheckOut(Files{file}, L"to be louder", false).empty());

    EXPECT_FALSE(IsReadOnly(file));
    const ArchiveRecord record = RecordOf(file);
    ASSERT_TRUE(record.checkOut);
    EXPECT_EQ(record.checkOut->user, L"anna");
    EXPECT_EQ(record.checkOut->comment, L"to be louder");
    EXPECT_EQ(record.checkOut->time.size(), 20u);
}

TEST_F(ArchiveStoreCheckOut, IsRefusedWhileAnotherUserHasTheFileCheckedOut)
{
    const std::wstring file = CheckedOut(L"a.txt", "one");

    const ArchiveFailures failures = m_ben.CheckOut(Files{file}, L"", true);

    ExpectFailure(failures, ArchiveError::CheckedOutByOther, file);
    EXPECT_NE(failures[0].reason.find(L"anna"), std::wstring::npos);
    EXPECT_EQ(RecordOf(file).checkOut->user, L"anna");
}

TEST_F(ArchiveStoreCheckOut, IsPossibleForAnotherUserAfterCheckInAndUndo)
{
    const std::wstring file = CheckedOut(L"a.txt", "one");
    ASSERT_TRUE(m_anna.CheckIn(Files{file}, L"", false).empty());
    ASSERT_TRUE(m_ben.CheckOut(Files{file}, L"", false).empty());
    ASSERT_TRUE(m_ben.UndoCheckOut(Files{file}).empty());

    EXPECT_TRUE(m_anna.CheckOut(Files{file}, L"", false).empty());
}

TEST_F(ArchiveStoreCheckOut, OfACheckedOutFileSucceedsAndMakesItWritable)
{
    const std::wstring file = CheckedOut(L"a.txt", "one");
    m_project.Write(L"a.txt", "edited");
    SetReadOnly(file, true);

    EXPECT_TRUE(m_anna.CheckOut(Files{file}, L"again", true).empty());

    EXPECT_FALSE(IsReadOnly(file));
    EXPECT_EQ(m_project.Read(L"a.txt"), "edited");
    EXPECT_EQ(RecordOf(file).checkOut->comment, L"mine");
}

TEST_F(ArchiveStoreCheckOut, RefusesAnOlderVersionUnlessItGetsTheLatestFirst)
{
    const std::wstring file = WithTwoVersions(L"a.txt");
    m_project.Overwrite(file, "one");

    ExpectFailure(m_anna.CheckOut(Files{file}, L"", false), ArchiveError::OutOfDate, file);
    EXPECT_FALSE(RecordOf(file).checkOut);

    EXPECT_TRUE(m_anna.CheckOut(Files{file}, L"", true).empty());
    EXPECT_EQ(m_project.Read(L"a.txt"), "two");
    EXPECT_FALSE(IsReadOnly(file));
}

TEST_F(ArchiveStoreCheckOut, RefusesAMissingFileUnlessItGetsTheLatestFirst)
{
    const std::wstring file = WithTwoVersions(L"a.txt");
    SetReadOnly(file, false);
    std::filesystem::remove(file);

    ExpectFailure(m_anna.CheckOut(Files{file}, L"", false), ArchiveError::OutOfDate, file);

    EXPECT_TRUE(m_anna.CheckOut(Files{file}, L"", true).empty());
    EXPECT_EQ(m_project.Read(L"a.txt"), "two");
    EXPECT_FALSE(IsReadOnly(file));
}

TEST_F(ArchiveStoreCheckOut, KeepsWhatWasChangedOnDisk)
{
    const std::wstring file = Added(L"a.txt", "one");
    m_project.Overwrite(file, "changed before the check-out");

    EXPECT_TRUE(m_anna.CheckOut(Files{file}, L"", true).empty());

    EXPECT_EQ(m_project.Read(L"a.txt"), "changed before the check-out");
    EXPECT_TRUE(StatusOf(m_anna, file).modified);
}

TEST_F(ArchiveStoreCheckOut, WritesTheRecordsOfItsFilesAndNothingElse)
{
    Added(L"a.txt", "a");
    const std::wstring file = Added(L"b.txt", "b");
    Added(L"c.txt", "c");
    const auto before = Snapshot();

    ASSERT_TRUE(m_anna.CheckOut(Files{file}, L"", false).empty());

    const auto after = Snapshot();
    ASSERT_EQ(after.size(), before.size());
    int changed = 0;
    for (const auto& [path, bytes] : before)
    {
        changed += static_cast<int>(after.at(path) != bytes);
    }
    EXPECT_EQ(changed, 1);
}

TEST_F(ArchiveStoreCheckOut, RefusesWhatIsNotControlled)
{
    const std::wstring file = m_project.Write(L"a.txt", "one");

    ExpectFailure(m_anna.CheckOut(Files{file}, L"", false), ArchiveError::NotControlled, file);
    ExpectFailure(m_anna.CheckIn(Files{file}, L"", false), ArchiveError::NotControlled, file);
    ExpectFailure(m_anna.UndoCheckOut(Files{file}), ArchiveError::NotControlled, file);
    ExpectFailure(m_anna.GetLatest(Files{file}), ArchiveError::NotControlled, file);
    std::vector<ArchiveRecord> records;
    ExpectFailure(m_anna.History(Files{file}, records), ArchiveError::NotControlled, file);
    EXPECT_EQ(m_project.Read(L"a.txt"), "one");
}

// Checking in

TEST_F(ArchiveStoreCheckIn, StoresAVersionAndKeepsTheOlderOnes)
{
    const std::wstring file = CheckedOut(L"a.txt", "one");
    m_project.Write(L"a.txt", "two");

    ASSERT_TRUE(m_anna.CheckIn(Files{file}, L"second", false).empty());

    const ArchiveRecord record = RecordOf(file);
    ASSERT_EQ(record.versions.size(), 2u);
    EXPECT_EQ(record.Latest().comment, L"second");
    EXPECT_FALSE(record.checkOut);
    EXPECT_EQ(StoredBytes(file, 1), "one");
    EXPECT_EQ(StoredBytes(file, 2), "two");
    EXPECT_TRUE(IsReadOnly(file));
}

TEST_F(ArchiveStoreCheckIn, KeepsTheFileCheckedOutWhenAsked)
{
    const std::wstring file = CheckedOut(L"a.txt", "one");
    m_project.Write(L"a.txt", "two");

    ASSERT_TRUE(m_anna.CheckIn(Files{file}, L"", true).empty());

    EXPECT_FALSE(IsReadOnly(file));
    EXPECT_TRUE(StatusOf(m_anna, file).checkedOut);
    EXPECT_FALSE(StatusOf(m_anna, file).modified);
    ExpectFailure(m_ben.CheckOut(Files{file}, L"", false), ArchiveError::CheckedOutByOther, file);
}

TEST_F(ArchiveStoreCheckIn, RefusesAFileThatTheUserHasNotCheckedOut)
{
    const std::wstring free = Added(L"free.txt", "one");
    const std::wstring held = CheckedOut(L"held.txt", "one");

    ExpectFailure(m_ben.CheckIn(Files{free}, L"", false), ArchiveError::NotCheckedOut, free);
    ExpectFailure(m_ben.CheckIn(Files{held}, L"", false), ArchiveError::CheckedOutByOther, held);
    EXPECT_EQ(RecordOf(held).versions.size(), 1u);
}

TEST_F(ArchiveStoreCheckIn, RefusesAFileThatNoLongerExists)
{
    const std::wstring file = CheckedOut(L"a.txt", "one");
    std::filesystem::remove(file);

    ExpectFailure(m_anna.CheckIn(Files{file}, L"", false), ArchiveError::NoSuchFile, file);
    EXPECT_TRUE(RecordOf(file).checkOut);
}

TEST_F(ArchiveStoreCheckIn, OfUnchangedContentsStoresAVersionToo)
{
    const std::wstring file = CheckedOut(L"a.txt", "one");

    ASSERT_TRUE(m_anna.CheckIn(Files{file}, L"nothing new", false).empty());

    EXPECT_EQ(RecordOf(file).versions.size(), 2u);
    EXPECT_EQ(StoredBytes(file, 2), "one");
}

// Undoing

TEST_F(ArchiveStoreUndo, RestoresTheVersionThatWasCheckedOut)
{
    const std::wstring file = WithTwoVersions(L"a.txt");
    ASSERT_TRUE(m_anna.CheckOut(Files{file}, L"", false).empty());
    m_project.Write(L"a.txt", "no good");

    ASSERT_TRUE(m_anna.UndoCheckOut(Files{file}).empty());

    EXPECT_EQ(m_project.Read(L"a.txt"), "two");
    EXPECT_TRUE(IsReadOnly(file));
    EXPECT_FALSE(RecordOf(file).checkOut);
    EXPECT_EQ(RecordOf(file).versions.size(), 2u);
    EXPECT_FALSE(StatusOf(m_anna, file).modified);
}

TEST_F(ArchiveStoreUndo, FindsAChangeThatKeepsSizeAndTime)
{
    const std::wstring file = CheckedOut(L"a.txt", "one");
    const WriteTime time(file);
    m_project.Write(L"a.txt", "eno");
    ASSERT_TRUE(time.Restore(file));
    ASSERT_FALSE(StatusOf(m_anna, file).modified) << "size and time say otherwise";

    ASSERT_TRUE(m_anna.UndoCheckOut(Files{file}).empty());

    EXPECT_EQ(m_project.Read(L"a.txt"), "one");
}

TEST_F(ArchiveStoreUndo, RestoresAFileThatWasDeleted)
{
    const std::wstring file = CheckedOut(L"sub\\a.txt", "one");
    std::filesystem::remove_all(m_project.Path(L"sub"));

    ASSERT_TRUE(m_anna.UndoCheckOut(Files{file}).empty());

    EXPECT_EQ(m_project.Read(L"sub\\a.txt"), "one");
    EXPECT_TRUE(IsReadOnly(file));
}

TEST_F(ArchiveStoreUndo, RefusesAFileThatTheUserHasNotCheckedOut)
{
    const std::wstring free = Added(L"free.txt", "one");
    const std::wstring held = CheckedOut(L"held.txt", "one");
    m_project.Write(L"held.txt", "edited");

    ExpectFailure(m_ben.UndoCheckOut(Files{free}), ArchiveError::NotCheckedOut, free);
    ExpectFailure(m_ben.UndoCheckOut(Files{held}), ArchiveError::CheckedOutByOther, held);
    EXPECT_EQ(m_project.Read(L"held.txt"), "edited");
}

// Getting

TEST_F(ArchiveStoreGet, WritesAMissingFileWithItsFoldersReadOnly)
{
    const std::wstring file = Added(L"x\\y\\a.txt", "one");
    SetReadOnly(file, false);
    std::filesystem::remove_all(m_project.Path(L"x"));

    ASSERT_TRUE(m_ben.GetLatest(Files{file}).empty());

    EXPECT_EQ(m_project.Read(L"x\\y\\a.txt"), "one");
    EXPECT_TRUE(IsReadOnly(file));
}

TEST_F(ArchiveStoreGet, ReplacesAnOlderVersion)
{
    const std::wstring file = WithTwoVersions(L"a.txt");
    m_project.Overwrite(file, "one");

    ASSERT_TRUE(m_ben.GetLatest(Files{file}).empty());

    EXPECT_EQ(m_project.Read(L"a.txt"), "two");
    EXPECT_TRUE(IsReadOnly(file));
}

TEST_F(ArchiveStoreGet, LeavesTheLatestVersionAloneAndMakesItReadOnly)
{
    const std::wstring file = Added(L"a.txt", "one");
    SetReadOnly(file, false);
    const auto time = std::filesystem::last_write_time(file);

    ASSERT_TRUE(m_ben.GetLatest(Files{file}).empty());

    EXPECT_TRUE(IsReadOnly(file));
    EXPECT_EQ(std::filesystem::last_write_time(file), time);
}

TEST_F(ArchiveStoreGet, NeverOverwritesAFileThatWasChangedWithoutACheckOut)
{
    const std::wstring file = WithTwoVersions(L"a.txt");
    m_project.Overwrite(file, "my work");

    ExpectFailure(m_anna.GetLatest(Files{file}), ArchiveError::Modified, file);

    EXPECT_EQ(m_project.Read(L"a.txt"), "my work");
    EXPECT_FALSE(IsReadOnly(file));
}

TEST_F(ArchiveStoreGet, NeverOverwritesAChangeThatHasSizeAndTimeOfAnOlderVersion)
{
    const std::wstring file = m_project.Write(L"a.txt", "one");
    ASSERT_TRUE(m_anna.Add(Files{file}, L"", true).empty());
    const WriteTime time(file);
    m_project.Write(L"a.txt", "three");
    ASSERT_TRUE(m_anna.CheckIn(Files{file}, L"", false).empty());
    m_project.Overwrite(file, "eno");
    ASSERT_TRUE(time.Restore(file));
    ASSERT_TRUE(StatusOf(m_anna, file).outOfDate) << "size and time say otherwise";

    ExpectFailure(m_anna.GetLatest(Files{file}), ArchiveError::Modified, file);

    EXPECT_EQ(m_project.Read(L"a.txt"), "eno");
}

TEST_F(ArchiveStoreGet, LeavesACheckedOutFileAlone)
{
    const std::wstring file = CheckedOut(L"a.txt", "one");
    m_project.Write(L"a.txt", "my work");

    EXPECT_TRUE(m_anna.GetLatest(Files{file}).empty());

    EXPECT_EQ(m_project.Read(L"a.txt"), "my work");
    EXPECT_FALSE(IsReadOnly(file));
}

TEST_F(ArchiveStoreGet, WritesAMissingCheckedOutFileWritable)
{
    const std::wstring file = CheckedOut(L"a.txt", "one");
    std::filesystem::remove(file);

    EXPECT_TRUE(m_anna.GetLatest(Files{file}).empty());

    EXPECT_EQ(m_project.Read(L"a.txt"), "one");
    EXPECT_FALSE(IsReadOnly(file));
}

TEST_F(ArchiveStoreGet, LeavesAFileAloneThatAnotherUserOfTheFolderHasCheckedOut)
{
    const std::wstring untouched = CheckedOut(L"untouched.txt", "one");
    const std::wstring edited = CheckedOut(L"edited.txt", "one");
    m_project.Write(L"edited.txt", "anna's work");

    ExpectFailure(m_ben.GetLatest(Files{untouched, edited}), ArchiveError::Modified, edited);

    EXPECT_FALSE(IsReadOnly(untouched));
    EXPECT_FALSE(IsReadOnly(edited));
    EXPECT_EQ(m_project.Read(L"edited.txt"), "anna's work");
}

// Status

TEST_F(ArchiveStoreStatus, TellsEveryStateApart)
{
    const std::wstring unknown = m_project.Write(L"unknown.txt", "x");
    const std::wstring controlled = Added(L"controlled.txt", "one");
    const std::wstring held = CheckedOut(L"held.txt", "one");
    const std::wstring edited = CheckedOut(L"edited.txt", "one");
    m_project.Write(L"edited.txt", "edited");
    const std::wstring older = WithTwoVersions(L"older.txt");
    m_project.Overwrite(older, "one");
    const std::wstring changed = Added(L"changed.txt", "one");
    m_project.Overwrite(changed, "changed without a check-out");
    const std::wstring missing = Added(L"missing.txt", "one");
    SetReadOnly(missing, false);
    std::filesystem::remove(missing);
    const Files files{unknown,         controlled, held, edited, older, changed, missing, L"Q:\\elsewhere.txt",
                      m_project.Text()};

    const auto bits = [&](const ArchiveStore& store) {
        std::vector<ArchiveStatus> statuses;
        EXPECT_TRUE(store.Status(files, statuses).empty());
        std::vector<std::string> words;
        words.reserve(statuses.size());
        for (const ArchiveStatus& status : statuses)
        {
            words.push_back(std::string(status.controlled ? "c" : "") + (status.checkedOut ? "m" : "") +
                            (status.checkedOutByOther ? "o" : "") + (status.outOfDate ? "d" : "") +
                            (status.modified ? "x" : ""));
        }
        return words;
    };
    EXPECT_EQ(bits(m_anna), (std::vector<std::string>{"", "c", "cm", "cmx", "cd", "cx", "cd", "", ""}));
    EXPECT_EQ(bits(m_ben), (std::vector<std::string>{"", "c", "co", "cox", "cd", "cx", "cd", "", ""}));
}

TEST_F(ArchiveStoreStatus, IsModifiedForAnOlderVersionInACheckedOutFile)
{
    const std::wstring file = WithTwoVersions(L"a.txt");
    ASSERT_TRUE(m_anna.CheckOut(Files{file}, L"", false).empty());
    m_project.Write(L"a.txt", "one");

    EXPECT_TRUE(StatusOf(m_anna, file).modified);
    EXPECT_FALSE(StatusOf(m_anna, file).outOfDate);
}

TEST_F(ArchiveStoreStatus, IsUnchangedForAFileWithANewTimeOnly)
{
    const std::wstring file = CheckedOut(L"a.txt", "one");
    std::filesystem::last_write_time(file, std::filesystem::last_write_time(file) + std::chrono::hours(1));

    EXPECT_FALSE(StatusOf(m_anna, file).modified);
}

TEST_F(ArchiveStoreStatus, FailsAsAWholeForADamagedRecord)
{
    const std::wstring file = Added(L"a.txt", "one");
    m_project.Overwrite(RecordPath(), "archive-record 1\n");
    const std::wstring good = m_project.Write(L"good.txt", "x");
    std::vector<ArchiveStatus> statuses(3);

    ExpectFailure(m_anna.Status(Files{good, file}, statuses), ArchiveError::Damaged, file);

    EXPECT_TRUE(statuses.empty());
}

TEST_F(ArchiveStoreStatus, IsMissingForAFileThatIsNotOnDisk)
{
    const std::wstring file = Added(L"a.txt", "one");
    EXPECT_FALSE(StatusOf(m_anna, file).missing);
    m_project.Overwrite(file, "one");
    std::filesystem::remove(file);

    EXPECT_TRUE(StatusOf(m_anna, file).missing);
    EXPECT_TRUE(StatusOf(m_anna, m_project.File(L"unknown.txt")).missing);
}

// Listing

TEST_F(ArchiveStoreList, SortsTheFilesOfAFolderOnDiskOrNot)
{
    const std::wstring b = Added(L"b.txt", "one");
    const std::wstring a = Added(L"a.txt", "one");
    const std::wstring deep = Added(L"Sub\\Deep\\c.txt", "one");
    const std::wstring inSub = Added(L"Sub\\d.txt", "one");
    Added(L"Subway\\e.txt", "one");
    m_project.Write(L"Sub\\unknown.txt", "x");
    m_project.Overwrite(inSub, "one");
    std::filesystem::remove(inSub);
    Files files;

    EXPECT_TRUE(m_anna.List(m_project.Text(), false, files).empty());
    EXPECT_EQ(files, (Files{a, b}));
    EXPECT_TRUE(m_anna.List(m_project.File(L"Sub\\"), true, files).empty());
    EXPECT_EQ(files, (Files{deep, inSub}));
    EXPECT_TRUE(m_anna.List(m_project.Text(), true, files).empty());
    EXPECT_EQ(files.size(), 5u);
    EXPECT_TRUE(m_anna.List(m_project.File(L"nowhere"), true, files).empty());
    EXPECT_TRUE(files.empty());
}

TEST_F(ArchiveStoreList, NamesTheFilesByTheFolderAsItIsGiven)
{
    Added(L"Sub\\a.txt", "one");
    const std::wstring folder = L"\\\\?\\" + m_project.File(L"SUB");
    Files files;

    ASSERT_TRUE(m_anna.List(folder, false, files).empty());

    EXPECT_EQ(files, (Files{folder + L"\\a.txt"}));
    EXPECT_TRUE(StatusOf(m_anna, files[0]).controlled);
}

TEST_F(ArchiveStoreList, RefusesAFolderOutsideTheProject)
{
    Files files{L"left over"};
    ExpectFailure(m_anna.List(L"C:\\", true, files), ArchiveError::InvalidPath, L"C:\\");
    EXPECT_TRUE(files.empty());
}

TEST_F(ArchiveStoreList, ReportsADamagedRecordAndGivesTheOthers)
{
    Added(L"damaged.txt", "one");
    const std::filesystem::path record = RecordPath();
    m_project.Overwrite(record, "damaged");
    const std::wstring good = Added(L"good.txt", "one");
    m_project.Write(L".archive\\files\\note.txt", "no record");
    m_project.Write(L".archive\\files\\" + record.filename().wstring().substr(0, 2) + L"\\note.txt", "no record");
    Files files;

    const ArchiveFailures failures = m_anna.List(m_project.Text(), true, files);

    ASSERT_EQ(failures.size(), 1u);
    EXPECT_EQ(failures[0].error, ArchiveError::Damaged);
    EXPECT_TRUE(std::filesystem::equivalent(failures[0].file, record));
    EXPECT_EQ(files, (Files{good}));
}

TEST_F(ArchiveStoreList, RefusesARecordUnderTheNameOfAnotherFile)
{
    Added(L"a.txt", "one");
    const std::filesystem::path record = RecordPath();
    const std::wstring other = std::wstring(64, L'0');
    m_project.Write(L".archive\\files\\00\\" + other, ReadBytes(record));
    Files files;

    const ArchiveFailures failures = m_anna.List(m_project.Text(), true, files);

    ASSERT_EQ(failures.size(), 1u);
    EXPECT_EQ(failures[0].error, ArchiveError::Damaged);
    EXPECT_EQ(files, (Files{m_project.File(L"a.txt")}));
}

// Safety

TEST_F(ArchiveStoreSafety, AnInterruptedWriteLeavesTheOldVersionIntact)
{
    const std::wstring file = CheckedOut(L"a.txt", "one");
    m_project.Write(L".archive\\new.tmp", "half a record");
    m_project.Write(L".archive.tmp", "half a file");
    EXPECT_EQ(RecordOf(file).versions.size(), 1u);
    EXPECT_EQ(StoredBytes(file, 1), "one");
    m_project.Write(L"a.txt", "two");

    ASSERT_TRUE(m_anna.CheckIn(Files{file}, L"", true).empty());
    m_project.Write(L"a.txt", "three");
    ASSERT_TRUE(m_anna.UndoCheckOut(Files{file}).empty());

    EXPECT_EQ(StoredBytes(file, 1), "one");
    EXPECT_EQ(StoredBytes(file, 2), "two");
    EXPECT_EQ(m_project.Read(L"a.txt"), "two");
    EXPECT_FALSE(std::filesystem::exists(m_project.Path(L".archive\\new.tmp")));
    EXPECT_FALSE(std::filesystem::exists(m_project.Path(L".archive.tmp")));
}

TEST_F(ArchiveStoreSafety, ContentsWithoutARecordFromAnInterruptedCheckInAreIgnored)
{
    const std::wstring file = CheckedOut(L"a.txt", "one");
    const auto record = ReadBytes(RecordPath());
    m_project.Write(L"a.txt", "two");
    ASSERT_TRUE(m_anna.CheckIn(Files{file}, L"", true).empty());
    m_project.Overwrite(RecordPath(), record);

    EXPECT_TRUE(StatusOf(m_anna, file).modified);
    ASSERT_TRUE(m_anna.CheckIn(Files{file}, L"again", false).empty());
    EXPECT_EQ(StoredBytes(file, 2), "two");
}

TEST_F(ArchiveStoreSafety, ADamagedVersionIsFoundAndNeverOverwritesTheUsersFile)
{
    const std::wstring file = CheckedOut(L"a.txt", "one");
    m_project.Overwrite(ContentsPath(RecordOf(file).Latest()), "eno");
    m_project.Write(L"a.txt", "my work");

    ExpectFailure(m_anna.UndoCheckOut(Files{file}), ArchiveError::Damaged, file);

    EXPECT_EQ(m_project.Read(L"a.txt"), "my work");
    EXPECT_FALSE(IsReadOnly(file));
    EXPECT_TRUE(StatusOf(m_anna, file).checkedOut);
    EXPECT_FALSE(std::filesystem::exists(m_project.Path(L".archive.tmp")));
}

TEST_F(ArchiveStoreSafety, ADamagedOrLostVersionIsNotWrittenToTheDisk)
{
    const std::wstring file = WithTwoVersions(L"a.txt");
    const std::filesystem::path contents = ContentsPath(RecordOf(file).Latest());
    m_project.Overwrite(file, "one");
    SetReadOnly(file, true);

    for (const char* damage : {"", "tw", "TWO", "two and more"})
    {
        m_project.Overwrite(contents, damage);
        ExpectFailure(m_anna.GetLatest(Files{file}), ArchiveError::Damaged, file);
        ExpectFailure(m_anna.CheckOut(Files{file}, L"", true), ArchiveError::Damaged, file);
    }
    std::filesystem::remove(contents);
    ExpectFailure(m_anna.GetLatest(Files{file}), ArchiveError::Damaged, file);

    EXPECT_EQ(m_project.Read(L"a.txt"), "one");
    EXPECT_TRUE(IsReadOnly(file));
}

TEST_F(ArchiveStoreSafety, StoringTheSameContentsAgainRepairsADamagedCopy)
{
    const std::wstring file = Added(L"a.txt", "one");
    m_project.Overwrite(ContentsPath(RecordOf(file).Latest()), "damaged");

    Added(L"b.txt", "one");

    EXPECT_EQ(StoredBytes(file, 1), "one");
}

TEST_F(ArchiveStoreSafety, ADamagedRecordIsNeverOverwritten)
{
    const std::wstring file = Added(L"a.txt", "one");
    const std::filesystem::path record = RecordPath();
    const std::string good = ReadBytes(record);
    std::string elsewhere = good;
    elsewhere.replace(elsewhere.find("a.txt"), 5, "b.txt");

    for (const std::string& damage :
         {std::string(), good.substr(0, good.size() - 4), elsewhere, std::string(17 << 20, 'x')})
    {
        m_project.Overwrite(record, damage);
        ExpectFailure(m_anna.Add(Files{file}, L"", false), ArchiveError::Damaged, file);
        ExpectFailure(m_anna.CheckOut(Files{file}, L"", false), ArchiveError::Damaged, file);
        ExpectFailure(m_anna.GetLatest(Files{file}), ArchiveError::Damaged, file);
        EXPECT_EQ(ReadBytes(record), damage);
    }
    EXPECT_EQ(m_project.Read(L"a.txt"), "one");
}

TEST_F(ArchiveStoreSafety, ARecordThatAnotherProgramReadsIsReplacedWhenItIsClosed)
{
    const std::wstring file = Added(L"a.txt", "one");
    ArchiveFiles::UniqueHandle reader = ArchiveFiles::Open(RecordPath(), GENERIC_READ, FILE_SHARE_READ, OPEN_EXISTING);
    ASSERT_TRUE(reader);
    std::thread closer([&] {
        Sleep(50);
        reader.reset();
    });

    EXPECT_TRUE(m_anna.CheckOut(Files{file}, L"", false).empty());

    closer.join();
}

TEST_F(ArchiveStoreSafety, ARecordThatAnotherProgramHoldsIsReadWhenItIsClosed)
{
    const std::wstring file = Added(L"a.txt", "one");
    ArchiveFiles::UniqueHandle holder = ArchiveFiles::Open(RecordPath(), GENERIC_READ, 0, OPEN_EXISTING);
    ASSERT_TRUE(holder);
    std::thread closer([&] {
        Sleep(50);
        holder.reset();
    });

    EXPECT_TRUE(StatusOf(m_anna, file).controlled);

    closer.join();
}

// Several users

TEST_F(ArchiveStoreUsers, AreTheSameWhenTheirNamesDifferInLetterCaseOnly)
{
    const std::wstring file = CheckedOut(L"a.txt", "one");
    ArchiveStore same;
    ASSERT_TRUE(same.Open(m_project.Text(), L"ANNA").empty());

    EXPECT_TRUE(same.CheckIn(Files{file}, L"", false).empty());
}

TEST_F(ArchiveStoreUsers, LoseAForgottenCheckOutWhenItsLineIsDeleted)
{
    const std::wstring file = CheckedOut(L"a.txt", "one");
    std::string record = ReadBytes(RecordPath());
    const std::size_t line = record.find("checkout\t");
    ASSERT_NE(line, std::string::npos);
    record.erase(line, record.find('\n', line) + 1 - line);
    m_project.Overwrite(RecordPath(), record);

    EXPECT_TRUE(m_ben.CheckOut(Files{file}, L"", false).empty());
}

TEST_F(ArchiveStoreUsers, WaitForEachOtherForALimitedTime)
{
    const Files files{m_project.Write(L"a.txt", "one")};
    ArchiveFiles::UniqueHandle lock =
        ArchiveFiles::Open(m_project.File(L".archive\\lock"), GENERIC_WRITE, 0, OPEN_ALWAYS);
    ASSERT_TRUE(lock);
    ArchiveStore impatient(std::chrono::milliseconds(30));
    ASSERT_TRUE(impatient.Open(m_project.Text(), L"anna").empty());

    ExpectFailure(impatient.Add(files, L"", false), ArchiveError::Busy, L"");
    EXPECT_FALSE(StatusOf(impatient, files[0]).controlled);

    std::thread releaser([&] {
        Sleep(50);
        lock.reset();
    });
    EXPECT_TRUE(m_anna.Add(files, L"", false).empty());
    releaser.join();
}

TEST_F(ArchiveStoreUsers, LoseNoVersionWhenTheyWorkAtTheSameTime)
{
    constexpr int Rounds = 10;
    const std::wstring shared = Added(L"shared.txt", "start");
    const auto work = [&](const wchar_t* user) {
        ArchiveStore store;
        ASSERT_TRUE(store.Open(m_project.Text(), user).empty());
        for (int round = 0; round < Rounds;)
        {
            std::vector<ArchiveStatus> statuses;
            ASSERT_TRUE(store.Status(Files{shared}, statuses).empty());
            if (!store.CheckOut(Files{shared}, L"", false).empty())
            {
                continue;
            }
            ASSERT_TRUE(store.CheckIn(Files{shared}, user + std::to_wstring(round), false).empty());
            ++round;
        }
    };

    std::thread anna(work, L"anna");
    std::thread ben(work, L"ben");
    anna.join();
    ben.join();

    std::map<std::wstring, int> comments;
    for (const ArchiveVersion& version : RecordOf(shared).versions)
    {
        ++comments[version.comment];
    }
    EXPECT_EQ(comments.size(), 1u + 2 * Rounds);
}

TEST_F(ArchiveStoreUsers, ShareOneArchiveThroughALink)
{
    const std::wstring file = CheckedOut(L"sub\\a.txt", "one");
    const ArchiveProject bens;
    bens.Write(L".archive", "orvix-archive-link 1\n" + m_project.Path(L".archive").string() + "\r\n");
    ASSERT_TRUE(m_ben.Open(bens.Text(), L"ben").empty());
    const std::wstring copy = bens.File(L"sub\\a.txt");

    EXPECT_TRUE(StatusOf(m_ben, copy).checkedOutByOther);
    EXPECT_TRUE(StatusOf(m_ben, copy).outOfDate);
    ASSERT_TRUE(m_ben.GetLatest(Files{copy}).empty());
    EXPECT_EQ(bens.Read(L"sub\\a.txt"), "one");

    m_project.Write(L"sub\\a.txt", "two");
    ASSERT_TRUE(m_anna.CheckIn(Files{file}, L"", false).empty());
    EXPECT_TRUE(StatusOf(m_ben, copy).outOfDate);
    ExpectFailure(m_ben.CheckOut(Files{copy}, L"", false), ArchiveError::OutOfDate, copy);
    ASSERT_TRUE(m_ben.CheckOut(Files{copy}, L"", true).empty());
    EXPECT_EQ(bens.Read(L"sub\\a.txt"), "two");
    ExpectFailure(m_anna.CheckOut(Files{file}, L"", false), ArchiveError::CheckedOutByOther, file);
}

// Paths

TEST_F(ArchiveStorePaths, OutsideTheProjectOrOfNoFileAreRefused)
{
    const ArchiveProject other;
    std::filesystem::create_directories(m_project.Path(L"folder"));
    const std::wstring file = m_project.Write(L"a.txt", "one");
    const std::wstring neighbour = m_project.Text() + L"-neighbour.txt";
    WriteBytes(neighbour, "x");
    const std::wstring name = m_project.Path(L"").parent_path().filename();

    for (const std::wstring& path : {other.Write(L"a.txt", "x"),
                                     neighbour,
                                     m_project.File(L"folder"),
                                     m_project.Text(),
                                     std::wstring(L"a.txt"),
                                     std::wstring(),
                                     std::wstring(L"C:a.txt"),
                                     std::wstring(L"\\a.txt"),
                                     std::wstring(L"C:\\"),
                                     std::wstring(L"\\\\.\\NUL"),
                                     std::wstring(L"\\\\?\\GLOBALROOT\\a.txt"),
                                     std::wstring(L"\\\\server"),
                                     m_project.File(L"folder\\..\\a.txt"),
                                     m_project.File(L"..\\" + name + L"\\a.txt"),
                                     m_project.File(L"a.txt:stream"),
                                     m_project.File(L"a.txt."),
                                     m_project.File(L"a.txt "),
                                     m_project.File(L"*.txt"),
                                     m_project.File(L"a?txt"),
                                     m_project.File(L"a\n.txt"),
                                     m_project.File(L"\xD800.txt"),
                                     m_project.File(std::wstring(40000, L'x'))})
    {
        ExpectFailure(m_anna.Add(Files{path}, L"", false), ArchiveError::InvalidPath, path);
        EXPECT_FALSE(StatusOf(m_anna, path).controlled);
        EXPECT_FALSE(StatusOf(m_anna, path).ownFile);
    }
    EXPECT_TRUE(m_anna.Add(Files{file}, L"", false).empty());
    EXPECT_FALSE(StatusOf(m_anna, file).ownFile);
    DeleteFileW(neighbour.c_str());
}

TEST_F(ArchiveStorePaths, OfTheArchiveItselfAreRefused)
{
    const auto expectOwn = [](ArchiveStore& store, const std::wstring& path) {
        ExpectFailure(store.Add(Files{path}, L"", false), ArchiveError::OwnFile, path);
        std::vector<ArchiveStatus> statuses;
        EXPECT_TRUE(store.Status(Files{path}, statuses).empty());
        ASSERT_EQ(statuses.size(), 1u);
        EXPECT_TRUE(statuses[0].ownFile) << std::filesystem::path(path).string();
        EXPECT_FALSE(statuses[0].controlled);
    };
    for (const std::wstring& path :
         {m_project.File(L".archive"), m_project.File(L".Archive\\"), m_project.Write(L".archive\\mine.txt", "x"),
          m_project.File(L".ARCHIVE\\archive.txt"), m_project.File(L".archive/missing.txt"),
          m_project.Write(L"folder\\.archive\\x.txt", "x"), m_project.Write(L".archive.tmp", "x"),
          m_project.File(L"folder\\.ARCHIVE.TMP")})
    {
        expectOwn(m_anna, path);
    }

    const ArchiveProject bens;
    const std::wstring link = bens.Write(L".archive", "orvix-archive-link 1\n" + m_project.Path(L".archive").string());
    ASSERT_TRUE(m_ben.Open(bens.Text(), L"ben").empty());
    expectOwn(m_ben, link);
    expectOwn(m_ben, m_project.File(L".archive\\archive.txt"));
}

TEST_F(ArchiveStorePaths, OfOneFileAreEqualInEverySpelling)
{
    const std::wstring file = Added(L"Sub\\Größe.txt", "one");
    std::wstring slashes = file;
    std::replace(slashes.begin(), slashes.end(), L'\\', L'/');

    for (const std::wstring& path : {m_project.File(L"SUB\\GRÖßE.TXT"), slashes, L"\\\\?\\" + file,
                                     m_project.File(L".\\Sub\\\\Größe.txt"), m_project.File(L"sub/größe.TXT")})
    {
        EXPECT_TRUE(StatusOf(m_anna, path).controlled) << std::filesystem::path(path).string();
    }
    EXPECT_EQ(RecordOf(m_project.File(L"SUB\\GRÖßE.TXT")).path, L"Sub/Größe.txt");
}

TEST_F(ArchiveStorePaths, MayHaveAnyCharacters)
{
    const std::wstring file = WithTwoVersions(L"Ünïcode 日本 \xD83C\xDFB5\\señal.txt");
    m_project.Overwrite(file, "one");

    ASSERT_TRUE(m_ben.GetLatest(Files{file}).empty());

    EXPECT_EQ(m_project.Read(L"Ünïcode 日本 \xD83C\xDFB5\\señal.txt"), "two");
}

TEST_F(ArchiveStorePaths, MayBeLongerThanMaxPath)
{
    const std::size_t base = m_project.Text().size() + 1;
    for (const std::size_t length : {259u, 260u, 261u, 1000u})
    {
        std::wstring file = m_project.Text();
        while (file.size() < length - 102)
        {
            file += L'\\' + std::wstring(100, L'd');
        }
        file += L'\\' + std::wstring(length - file.size() - 1, L'f');
        ASSERT_EQ(file.size(), length);
        const std::wstring longForm = L"\\\\?\\" + file;
        for (std::size_t end = base; (end = longForm.find(L'\\', end + 5)) != std::wstring::npos;)
        {
            CreateDirectoryW(longForm.substr(0, end).c_str(), nullptr);
        }
        const auto write = [&](std::string_view bytes) {
            const ArchiveFiles::UniqueHandle handle = ArchiveFiles::Open(longForm, GENERIC_WRITE, 0, CREATE_ALWAYS);
            DWORD written = 0;
            ASSERT_TRUE(WriteFile(handle.get(), bytes.data(), static_cast<DWORD>(bytes.size()), &written, nullptr));
        };
        write("one");

        ASSERT_TRUE(m_anna.Add(Files{file}, L"", true).empty()) << length;
        write("two");
        ASSERT_TRUE(m_anna.UndoCheckOut(Files{file}).empty()) << length;

        EXPECT_FALSE(StatusOf(m_anna, file).modified);
        EXPECT_EQ(ArchiveFiles::ReadText(longForm, 100), "one");
        ArchiveFiles::SetReadOnly(longForm, false);
        EXPECT_TRUE(DeleteFileW(longForm.c_str()));
        for (std::size_t end = longForm.size(); (end = longForm.rfind(L'\\', end - 1)) > base + 4;)
        {
            RemoveDirectoryW(longForm.substr(0, end).c_str());
        }
    }
}

TEST_F(ArchiveStorePaths, OutsideTheProjectThroughALinkAreRefused)
{
    const ArchiveProject other;
    other.Write(L"a.txt", "x");
    std::error_code error;
    std::filesystem::create_directory_symlink(other.Path(L""), m_project.Path(L"link"), error);
    if (error || !std::filesystem::exists(m_project.Path(L"link\\a.txt")))
    {
        GTEST_SKIP() << "links cannot be made here";
    }
    const std::wstring file = m_project.File(L"link\\a.txt");

    ExpectFailure(m_anna.Add(Files{file}, L"", false), ArchiveError::InvalidPath, file);
}
