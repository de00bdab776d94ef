// Two users: a repository between them, and a server for locks.

#include "GitLocks.h"
#include "GitRunner.h"
#include "GitTest.h"
#include "GitText.h"
#include "Handles.h"
#include "Process.h"

#include <windows.h>

#include <algorithm>
#include <chrono>
#include <mutex>
#include <stdexcept>
#include <string>
#include <thread>

namespace
{

using namespace std::chrono_literals;

constexpr unsigned long Tracked = State::Controlled | Permission::GetLatest | Permission::ShowHistory;
constexpr unsigned long Clean = Tracked | Permission::CheckOut;
constexpr unsigned long Edited =
    Tracked | State::CheckedOut | Permission::CheckIn | Permission::UndoCheckOut | Permission::Compare;

/// A bare repository with two files.
class BareRepository : public GitTest
{
protected:
    BareRepository()
    {
        const PlainGit first = MakeRepository(L"first");
        first.Commit(L"town.txt", "1\n");
        first.Commit(L"river.psd", "1\n");
        Bare()({L"clone", L"--quiet", L"--bare", L"first", L"bare.git"});
    }
    PlainGit Bare() const { return PlainGit(m_folder.Text()); }
};

/// The working folders of Ada and Bob, and the bare repository between them. Bob works with the provider, Ada with Git
/// alone: a process has one provider.
class GitSharing : public BareRepository
{
protected:
    void SetUp() override { ASSERT_EQ(m_bob.Open(m_bobsGit.Folder()), Success); }

    /// Ada changes a file and pushes it with Git.
    void AdaPushes(const wchar_t* file, const char* bytes) const
    {
        m_adasGit.Commit(file, bytes, L"By Ada");
        m_adasGit({L"push", L"--quiet"});
    }

    static std::string Head(const PlainGit& git) { return git({L"rev-parse", L"HEAD"}); }

    PlainGit m_adasGit = Clone(L"bare.git", L"ada");
    PlainGit m_bobsGit = Clone(L"bare.git", L"bob");
    GitUser m_bob;
    std::wstring m_town = m_bobsGit.File(L"town.txt");
    std::wstring m_river = m_bobsGit.File(L"river.psd");
};

TEST_F(GitSharing, AFileIsOutOfDateAfterAFetchAndGetsTheLatestVersion)
{
    AdaPushes(L"town.txt", "2\n");
    EXPECT_EQ(m_bob.Query(m_town), Clean) << "a query does not ask the server";
    m_bobsGit({L"fetch", L"--quiet"});
    EXPECT_EQ(m_bob.Query({m_town, m_river}), (std::vector<unsigned long>{Tracked | State::OutOfDate, Clean}));

    AdaPushes(L"town.txt", "3\n");
    ASSERT_EQ(m_bob.Get({m_river}), Success);
    EXPECT_EQ(m_bobsGit.Read(L"town.txt"), "3\n") << "the whole branch moves";
    EXPECT_EQ(m_bob.Query(m_town), Clean);
    EXPECT_EQ(Head(m_bobsGit), Head(m_adasGit));
}

TEST_F(GitSharing, ACheckOutWithTheLatestVersionGetsItFirst)
{
    AdaPushes(L"town.txt", "2\n");
    ASSERT_EQ(m_bob.CheckOut({m_town}, Option::GetLatest | Option::NoDialog), Success);
    EXPECT_EQ(m_bobsGit.Read(L"town.txt"), "2\n");
    EXPECT_EQ(m_bob.Query(m_town), Edited);

    AdaPushes(L"town.txt", "3\n");
    m_bobsGit.Write(L"town.txt", "mine\n");
    ASSERT_EQ(m_bob.Undo({m_town}, Option::GetLatest), Success);
    EXPECT_EQ(m_bobsGit.Read(L"town.txt"), "3\n");
}

TEST_F(GitSharing, ChangesInTheWayAreNotOverwritten)
{
    AdaPushes(L"town.txt", "2\n");
    m_bobsGit.Write(L"town.txt", "mine\n");
    std::filesystem::remove(m_river);
    const std::string head = Head(m_bobsGit);
    EXPECT_EQ(m_bob.Get({m_town, m_river}), Failure);
    EXPECT_TRUE(m_bob.client.Shows(L"Your local changes to the following files would be overwritten"));
    EXPECT_TRUE(m_bob.client.Shows(L"town.txt"));
    EXPECT_EQ(Head(m_bobsGit), head);
    EXPECT_EQ(m_bobsGit.Read(L"town.txt"), "mine\n");
    EXPECT_FALSE(m_bobsGit.Has(L"river.psd"));
}

TEST_F(GitSharing, ChangesInTheWayAreNotStashed)
{
    AdaPushes(L"town.txt", "2\n");
    m_bobsGit.Configure("[merge]\n\tautoStash = true\n");
    m_bobsGit.Write(L"town.txt", "mine\n");
    const std::string head = Head(m_bobsGit);
    EXPECT_EQ(m_bob.Get({m_town}), Failure);
    EXPECT_TRUE(m_bob.client.Shows(L"Your local changes to the following files would be overwritten"));
    EXPECT_EQ(Head(m_bobsGit), head);
    EXPECT_EQ(m_bobsGit.Read(L"town.txt"), "mine\n");
    EXPECT_EQ(m_bobsGit({L"stash", L"list"}), "");
}

TEST_F(GitSharing, ACloneOfAnEmptyRepositoryGetsItsFirstVersion)
{
    const PlainGit parent(m_folder.Text());
    parent({L"init", L"--quiet", L"--bare", L"--initial-branch=main", L"empty.git"});
    const PlainGit clone = Clone(L"empty.git", L"carl");
    ASSERT_EQ(m_bob.Open(clone.Folder()), Success);
    const std::wstring file = clone.File(L"town.txt");
    EXPECT_EQ(m_bob.Get({file}), Success) << testing::PrintToString(m_bob.client.lines);
    m_adasGit({L"push", L"--quiet", Address(L"empty.git"), L"main"});
    EXPECT_EQ(m_bob.Get({file}), Success) << testing::PrintToString(m_bob.client.lines);
    EXPECT_EQ(Head(clone), Head(m_adasGit));
    EXPECT_EQ(clone.Read(L"town.txt"), "1\n");
}

TEST_F(GitSharing, ABranchThatHasDivergedIsLeftAsItIs)
{
    AdaPushes(L"town.txt", "2\n");
    m_bobsGit.Commit(L"river.psd", "mine\n");
    const std::string head = Head(m_bobsGit);
    EXPECT_EQ(m_bob.Get({m_town}), Failure);
    EXPECT_TRUE(m_bob.client.Shows(L"Not possible to fast-forward")) << testing::PrintToString(m_bob.client.lines);
    EXPECT_EQ(Head(m_bobsGit), head);
    EXPECT_EQ(m_bobsGit({L"status", L"--porcelain"}), "");
}

TEST_F(GitSharing, AServerThatDoesNotAnswerIsReported)
{
    m_bobsGit({L"remote", L"set-url", L"origin", Address(L"none.git")});
    EXPECT_EQ(m_bob.Get({m_town}), Failure);
    EXPECT_TRUE(m_bob.client.Shows(L"none.git' does not appear to be a git repository"));
}

TEST_F(GitSharing, ACheckInIsPushedWhenTheConfigurationSaysSo)
{
    m_bobsGit({L"config", L"orvix.push", L"true"});
    ASSERT_EQ(m_bob.Open(m_bobsGit.Folder()), Success);
    m_bobsGit.Write(L"town.txt", "2\n");
    ASSERT_EQ(m_bob.CheckIn({m_town}, L"Pushed"), Success);
    EXPECT_EQ(m_bob.client.lines, Texts());
    EXPECT_EQ(Bare()({L"--git-dir=bare.git", L"log", L"-1", L"--format=%an %s"}), "bob Pushed\n");

    m_adasGit({L"pull", L"--quiet"});
    AdaPushes(L"town.txt", "3\n");
    m_bobsGit.Write(L"river.psd", "2\n");
    EXPECT_EQ(m_bob.CheckIn({m_river}, L"Rejected"), Success) << "the commit is made";
    EXPECT_TRUE(m_bob.client.Shows(L"The commit is made, but it is not pushed:"));
    EXPECT_TRUE(m_bob.client.Shows(L"[rejected]"));
    EXPECT_EQ(m_bobsGit({L"log", L"-1", L"--format=%s"}), "Rejected\n");
    EXPECT_EQ(Bare()({L"--git-dir=bare.git", L"log", L"-1", L"--format=%s"}), "By Ada\n");
}

TEST_F(GitSharing, APushThatHangsIsReportedAndTheCommitStays)
{
    m_bobsGit({L"config", L"orvix.push", L"true"});
    m_bobsGit({L"config", L"orvix.silentLimit", L"15"});
    AddHook(m_bobsGit, L"pre-push", "sleep 60\n");
    ASSERT_EQ(m_bob.Open(m_bobsGit.Folder()), Success);
    m_bobsGit.Write(L"town.txt", "2\n");
    EXPECT_EQ(m_bob.CheckIn({m_town}, L"Hangs"), Success) << "the commit is made";
    EXPECT_TRUE(m_bob.client.Shows(L"The commit is made, but it is not pushed:"));
    EXPECT_TRUE(m_bob.client.Shows(L"git push printed nothing for 15 seconds and was ended"));
    EXPECT_EQ(m_bobsGit({L"log", L"-1", L"--format=%s"}), "Hangs\n");
}

TEST_F(GitSharing, WithoutTheSettingNothingIsPushed)
{
    m_bobsGit.Write(L"town.txt", "2\n");
    ASSERT_EQ(m_bob.CheckIn({m_town}, L"Kept here"), Success);
    EXPECT_EQ(Bare()({L"--git-dir=bare.git", L"log", L"-1", L"--format=%s"}), "By hand\n");
}

TEST_F(GitSharing, AConflictCanBeUndoneAndNotCheckedIn)
{
    AdaPushes(L"town.txt", "2\n");
    m_bobsGit.Commit(L"town.txt", "mine\n");
    m_bobsGit({L"fetch", L"--quiet"});
    m_bobsGit({L"-c", L"alias.try=!git merge --quiet origin/main >/dev/null; true", L"try"});
    EXPECT_EQ(m_bob.Query(m_town), Tracked | State::CheckedOut | State::Modified | State::OutOfDate |
                                       Permission::UndoCheckOut | Permission::Compare);
    EXPECT_EQ(m_bob.CheckIn({m_town}, L"Half"), Failure);
    EXPECT_TRUE(m_bob.client.Shows(L"cannot do a partial commit during a merge"));
    m_bob.Properties({m_town});
    EXPECT_TRUE(m_bob.client.Shows(L"in conflict"));
    EXPECT_TRUE(m_bob.client.Shows(L"origin/main, 1 ahead, 1 behind"));
    ASSERT_EQ(m_bob.Undo({m_town}), Success);
    EXPECT_EQ(m_bobsGit.Read(L"town.txt"), "mine\n");
}

/// The server of the locks, in a process of its own.
class LockServer
{
public:
    explicit LockServer(const PlainGit& git) : m_cancel(CreateEventW(nullptr, TRUE, FALSE, nullptr))
    {
        const std::wstring alias = L"alias.serve=!exec python3 -B '" GIT_LOCK_SERVER L"'";
        m_thread = std::jthread([this, alias, process = git.MakeProcess({L"-c", alias, L"serve"})] {
            Process::Run(process, m_cancel.get(), [this](Process::Stream, std::string_view bytes) {
                const std::lock_guard guard(m_mutex);
                m_printed += bytes;
            });
        });
        for (int i = 0; i < 600 && Lines().empty(); ++i)
        {
            std::this_thread::sleep_for(50ms);
        }
    }
    LockServer(const LockServer&) = delete;
    LockServer& operator=(const LockServer&) = delete;
    ~LockServer() { SetEvent(m_cancel.get()); }

    std::wstring Address(const wchar_t* user) const
    {
        const Texts lines = Lines();
        if (lines.empty())
        {
            throw std::runtime_error("the server of the locks has not started");
        }
        return L"http://127.0.0.1:" + lines.front() + L'/' + user;
    }

    /// How many requests a user has made.
    std::ptrdiff_t Requests(const std::wstring& user) const
    {
        const Texts lines = Lines();
        return std::count_if(lines.begin(), lines.end(), [&](const std::wstring& line) {
            return line.find(L" /" + user + L'/') != std::wstring::npos;
        });
    }

private:
    /// What it has printed, in whole lines.
    Texts Lines() const
    {
        const std::lock_guard guard(m_mutex);
        return GitText::Lines(std::string_view(m_printed).substr(0, m_printed.rfind('\n') + 1));
    }

    OwnedHandle m_cancel;
    mutable std::mutex m_mutex;
    std::string m_printed;
    std::jthread m_thread;
};

/// Pictures are lockable, and Git LFS knows the server.
class GitLocking : public GitSharing
{
protected:
    void SetUp() override
    {
        AdaPushes(L".gitattributes", "*.psd lockable\n");
        m_bobsGit({L"pull", L"--quiet"});
        m_adasGit.Configure("[lfs]\n\turl = " + GitText::ToUtf8(m_server.Address(L"ada")) + '\n');
        m_bobsGit.Configure("[lfs]\n\turl = " + GitText::ToUtf8(m_server.Address(L"bob")) + '\n');
        GitSharing::SetUp();
    }

    /// Queries until the answer of the server has come.
    bool Becomes(unsigned long flags)
    {
        for (int i = 0; i < 60; ++i)
        {
            if (m_bob.Query(m_river) == flags)
            {
                return true;
            }
            std::this_thread::sleep_for(100ms);
        }
        return false;
    }

    /// Who has locks, as Bob's Git LFS says: each lock is a line with "O" for his own.
    std::string Locks() const { return m_bobsGit({L"lfs", L"locks", L"--verify"}); }
    void AdaLocks() const { m_adasGit({L"lfs", L"lock", L"river.psd"}); }

    LockServer m_server{m_adasGit};
};

TEST_F(GitLocking, ACheckOutTakesTheLockAndACheckInGivesItBack)
{
    ASSERT_EQ(m_bob.CheckOut({m_river, m_town}), Success) << testing::PrintToString(m_bob.client.lines);
    EXPECT_TRUE(Locks().starts_with("O river.psd")) << Locks();
    EXPECT_EQ(Locks().find("town.txt"), std::string::npos) << "it is not lockable";
    EXPECT_EQ(m_bob.Query(m_river), Edited);
    m_bob.Properties({m_river});
    EXPECT_TRUE(m_bob.client.Shows(L"locked by    you"));

    m_bobsGit.Write(L"river.psd", "2\n");
    ASSERT_EQ(m_bob.CheckIn({m_river}, L"Kept", Option::KeepCheckedOut), Success)
        << testing::PrintToString(m_bob.client.lines);
    EXPECT_TRUE(Locks().starts_with("O river.psd"));
    m_bobsGit.Write(L"river.psd", "3\n");
    ASSERT_EQ(m_bob.CheckIn({m_river}, L"Given back"), Success);
    EXPECT_EQ(Locks(), "");
    EXPECT_EQ(m_bob.Query(m_river), Clean);
}

TEST_F(GitLocking, ACheckOutSaysWhoHasTheLock)
{
    AdaLocks();
    EXPECT_EQ(m_bob.CheckOut({m_river, m_town}), Failure);
    EXPECT_TRUE(m_bob.client.Shows(L"river.psd is locked by ada"));
    EXPECT_EQ(m_bob.Query({m_river, m_town}), (std::vector<unsigned long>{Tracked | State::CheckedOutByOther, Edited}));
    m_bob.Properties({m_river});
    EXPECT_TRUE(m_bob.client.Shows(L"locked by    ada"));
    m_adasGit({L"lfs", L"unlock", L"river.psd"});
    EXPECT_EQ(m_bob.CheckOut({m_river}), Success);
}

TEST_F(GitLocking, ACheckInOfADeletedAndOfARenamedFileGivesTheirLocksBack)
{
    ASSERT_EQ(m_bob.CheckOut({m_river}), Success);
    const std::wstring renamed = m_bobsGit.File(L"stream.psd");
    std::filesystem::rename(m_river, renamed);
    ASSERT_EQ(m_bob.Add({renamed}), Success);
    ASSERT_EQ(m_bob.CheckIn({m_river, renamed}, L"Renamed"), Success);
    EXPECT_EQ(m_bob.client.lines, Texts());
    EXPECT_EQ(Locks(), "");

    ASSERT_EQ(m_bob.CheckOut({renamed}), Success);
    EXPECT_TRUE(Locks().starts_with("O stream.psd"));
    std::filesystem::remove(renamed);
    ASSERT_EQ(m_bob.CheckIn({renamed}, L"Deleted"), Success);
    EXPECT_EQ(m_bob.client.lines, Texts());
    EXPECT_EQ(Locks(), "");
}

TEST_F(GitLocking, AFileWithoutACommitIsNotLocked)
{
    const std::wstring lake = m_bobsGit.Write(L"lake.psd", "1\n");
    ASSERT_EQ(m_bob.Add({lake}), Success);
    ASSERT_EQ(m_bob.CheckOut({lake}), Success) << testing::PrintToString(m_bob.client.lines);
    EXPECT_EQ(Locks(), "");
    EXPECT_EQ(m_bob.Query(lake), Edited);
    ASSERT_EQ(m_bob.Undo({lake}), Success) << testing::PrintToString(m_bob.client.lines);
    ASSERT_EQ(m_bob.Add({lake}), Success);
    ASSERT_EQ(m_bob.CheckIn({lake}, L"A lake"), Success);
    EXPECT_EQ(m_bob.client.lines, Texts());
    ASSERT_EQ(m_bob.CheckOut({lake}), Success);
    EXPECT_TRUE(Locks().starts_with("O lake.psd"));
}

TEST_F(GitLocking, AnUndoGivesTheLockOfAnUnchangedFileBack)
{
    ASSERT_EQ(m_bob.CheckOut({m_river}), Success);
    ASSERT_EQ(m_bob.Undo({m_river}), Success);
    EXPECT_EQ(Locks(), "");
    EXPECT_EQ(m_bob.Query(m_river), Clean);
}

TEST_F(GitLocking, ALockOfAnEarlierSessionIsSeenWhenTheProjectOpens)
{
    m_bobsGit({L"lfs", L"lock", L"river.psd"});
    ASSERT_EQ(m_bob.Open(m_bobsGit.Folder()), Success);
    EXPECT_TRUE(Becomes(Edited));
    ASSERT_EQ(m_bob.Undo({m_river}), Success);
    EXPECT_EQ(Locks(), "");
    AdaLocks();
    ASSERT_EQ(m_bob.Open(m_bobsGit.Folder()), Success);
    EXPECT_TRUE(Becomes(Tracked | State::CheckedOutByOther));
}

TEST_F(GitLocking, ALockOfAnEarlierSessionIsGivenBackAtOnce)
{
    m_bobsGit({L"lfs", L"lock", L"river.psd"});
    ASSERT_EQ(m_bob.Open(m_bobsGit.Folder()), Success);
    ASSERT_EQ(m_bob.Undo({m_river}), Success);
    EXPECT_EQ(Locks(), "");
}

TEST_F(GitLocking, ALockStaysUntilTheNewVersionIsPushed)
{
    m_bobsGit({L"config", L"orvix.push", L"true"});
    m_bobsGit({L"config", L"lfs.locksverify", L"false"});
    ASSERT_EQ(m_bob.Open(m_bobsGit.Folder()), Success);
    ASSERT_EQ(m_bob.CheckOut({m_river}), Success);
    AdaPushes(L"town.txt", "2\n");
    m_bobsGit.Write(L"river.psd", "2\n");
    ASSERT_EQ(m_bob.CheckIn({m_river}, L"Rejected"), Success);
    EXPECT_TRUE(m_bob.client.Shows(L"The commit is made, but it is not pushed:"));
    EXPECT_TRUE(Locks().starts_with("O river.psd"));
}

TEST_F(GitLocking, QueriesDoNotAskTheServer)
{
    AdaLocks();
    ASSERT_EQ(m_bob.Open(m_bobsGit.Folder()), Success);
    ASSERT_TRUE(Becomes(Tracked | State::CheckedOutByOther));
    const auto before = m_server.Requests(L"bob");
    EXPECT_GT(before, 0) << "the project was opened";
    for (int i = 0; i < 5; ++i)
    {
        m_bob.Query(m_river);
    }
    std::this_thread::sleep_for(500ms);
    EXPECT_EQ(m_server.Requests(L"bob"), before);
    ASSERT_EQ(m_bob.Get({m_river}), Success);
    EXPECT_GT(m_server.Requests(L"bob"), before);
}

TEST_F(GitLocking, TheServerIsAskedInTheBackgroundAtMostOnceAMinute)
{
    AdaLocks();
    GitRunner runner;
    runner.SetUp(PlainGit::Program());
    runner.SetFolder(m_bobsGit.Folder() + L'\\');
    GitLocks locks;
    locks.Reset(true);
    const auto before = m_server.Requests(L"bob");
    for (int i = 0; i < 600 && locks.Find("river.psd") == nullptr; ++i)
    {
        locks.RefreshInBackground(runner);
        std::this_thread::sleep_for(50ms);
    }
    ASSERT_NE(locks.Find("river.psd"), nullptr);
    EXPECT_FALSE(locks.Find("river.psd")->isOurs);
    EXPECT_EQ(m_server.Requests(L"bob"), before + 1);
    for (int i = 0; i < 20; ++i)
    {
        locks.RefreshInBackground(runner);
        std::this_thread::sleep_for(50ms);
    }
    EXPECT_EQ(m_server.Requests(L"bob"), before + 1);
}

TEST_F(GitLocking, AServerThatIsGoneIsReportedByACheckOutAndDisturbsNothingElse)
{
    m_bobsGit({L"config", L"lfs.url", L"http://127.0.0.1:1/bob"});
    ASSERT_EQ(m_bob.Open(m_bobsGit.Folder()), Success);
    EXPECT_EQ(m_bob.Query(m_river), Clean);
    EXPECT_EQ(m_bob.CheckOut({m_river}), Failure);
    EXPECT_TRUE(m_bob.client.Shows(L"127.0.0.1:1")) << testing::PrintToString(m_bob.client.lines);
    EXPECT_EQ(m_bob.Query(m_river), Clean);
}

} // namespace
