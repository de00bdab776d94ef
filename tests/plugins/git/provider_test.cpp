// One user, one repository: what each operation does, checked by plain commands of Git.

#include "GitTest.h"

#include <windows.h>

#include <algorithm>
#include <cstdlib>
#include <filesystem>

namespace
{

constexpr unsigned long Tracked = State::Controlled | Permission::GetLatest | Permission::ShowHistory;
constexpr unsigned long Clean = Tracked | Permission::CheckOut;
constexpr unsigned long Edited =
    Tracked | State::CheckedOut | Permission::CheckIn | Permission::UndoCheckOut | Permission::Compare;
constexpr unsigned long Modified = Edited | State::Modified;
constexpr unsigned long Deleted = Edited | State::Deleted;
constexpr unsigned long CanAdd = State::NotControlled | Permission::Add;

/// Names that some program treats in a special way.
const Texts NastyNames{
    L"with space.txt", L"-dash.txt",
    L"--all",          L"[brackets].txt",
    L"{a,b}.txt",      L"'single'.txt",
    L"#hash ~.txt",    L"Gr\u00FC\u00DFe \u65E5\u672C.txt",
    L"dollar $HOME",   L"percent%PATH%",
    L"a&b^c.txt",      L"!bang.txt",
    L"@{upstream}",    L"deep/er/f\u00FCr.txt",
};

class GitProvider : public GitTest
{
protected:
    void SetUp() override { ASSERT_EQ(m_user.Open(m_git.Folder()), Success); }

    /// The names that a command of Git prints.
    Texts Names(Texts arguments) const
    {
        const std::string printed = m_git(arguments);
        Texts names;
        for (std::size_t begin = 0; begin < printed.size();)
        {
            const std::size_t end = std::min(printed.find('\0', begin), printed.size());
            wchar_t name[1024];
            const int length = MultiByteToWideChar(CP_UTF8, 0, printed.data() + begin, static_cast<int>(end - begin),
                                                   name, static_cast<int>(std::size(name)));
            names.emplace_back(name, static_cast<std::size_t>(length));
            begin = end + 1;
        }
        return names;
    }

    /// The last commit: its files, and its message.
    Texts Committed() const
    {
        return Names({L"diff-tree", L"-r", L"-z", L"--root", L"--no-commit-id", L"--name-only", L"HEAD"});
    }
    std::string Message() const { return m_git({L"log", L"-1", L"--format=%B"}); }
    std::string Porcelain() const { return m_git({L"status", L"--porcelain"}); }

    PlainGit m_git = MakeRepository(L"my town");
    GitUser m_user;
};

TEST_F(GitProvider, SaysTheStateOfEveryKindOfFile)
{
    const std::wstring clean = m_git.Commit(L"clean.txt", "1\n");
    const std::wstring modified = m_git.Commit(L"sub/modified.txt", "1\n");
    const std::wstring staged = m_git.Commit(L"staged.txt", "1\n");
    const std::wstring deleted = m_git.Commit(L"deleted.txt", "1\n");
    const std::wstring removed = m_git.Commit(L"removed.txt", "1\n");
    m_git.Commit(L".gitignore", "*.tmp\n");
    m_git.Write(L"sub/modified.txt", "2\n");
    m_git.Write(L"staged.txt", "2\n");
    m_git({L"add", L"staged.txt"});
    std::filesystem::remove(deleted);
    m_git({L"rm", L"--quiet", L"removed.txt"});
    const std::wstring added = m_git.Write(L"added.txt", "1\n");
    m_git({L"add", L"added.txt"});
    const std::wstring other = m_git.Write(L"new folder/other.txt", "1\n");
    const std::wstring ignored = m_git.Write(L"ignored.tmp", "1\n");

    EXPECT_EQ(
        m_user.Query({clean, modified, staged, deleted, removed, added, other, ignored, m_git.File(L"none.txt"),
                      L"C:\\elsewhere.txt", m_git.Folder()}),
        (std::vector<unsigned long>{Clean, Modified, Modified, Deleted, Deleted, Edited, CanAdd, State::NotControlled,
                                    State::NotControlled, State::NotControlled, State::NotControlled}));
    EXPECT_EQ(m_user.client.lines, Texts());
}

TEST_F(GitProvider, NamesTheFilesThatItKnowsOnTheDiskOrNot)
{
    const std::wstring a = m_git.Commit(L"a.txt", "1\n");
    const std::wstring gone = m_git.Commit(L"Sub f\u00FCr/gone.txt", "1\n");
    m_git.Commit(L"removed.txt", "1\n");
    m_git({L"rm", L"--quiet", L"removed.txt"});
    const std::wstring added = m_git.Write(L"Sub f\u00FCr/added.txt", "1\n");
    m_git({L"add", L"."});
    m_git.Write(L"new.txt", "1\n");
    std::filesystem::remove(gone);

    const auto names = [&](const std::wstring& folder) {
        Texts files;
        EXPECT_EQ(m_user.Names(folder, files), Success);
        std::sort(files.begin(), files.end());
        return files;
    };
    EXPECT_EQ(names(m_git.Folder()), (Texts{added, gone, a}));
    EXPECT_EQ(names(m_git.File(L"Sub f\u00FCr")), (Texts{added, gone}));
    EXPECT_EQ(names(m_git.File(L"SUB F\u00DCR") + L'\\'),
              (Texts{m_git.File(L"SUB F\u00DCR\\added.txt"), m_git.File(L"SUB F\u00DCR\\gone.txt")}));
    EXPECT_EQ(names(m_git.File(L"Sub")), Texts());
    EXPECT_EQ(m_user.client.lines, Texts());

    Texts files;
    EXPECT_EQ(m_user.Names(L"C:\\elsewhere", files), Failure);
    EXPECT_TRUE(m_user.client.Shows(L"is not in the folder of the repository"));
    ASSERT_EQ(m_user.Provider().CloseProject(), Success);
    EXPECT_EQ(m_user.Names(m_git.Folder(), files), Failure);
    EXPECT_EQ(files, Texts());
}

TEST_F(GitProvider, NamesNoSubmodulesAndNoFilesOfASparseCheckoutAndAConflictedOneOnce)
{
    m_git.Commit(L"both.txt", "1\n");
    const std::wstring kept = m_git.Commit(L"kept/a.txt", "1\n");
    m_git.Commit(L"left out/b.txt", "1\n");
    m_git({L"update-index", L"--add", L"--cacheinfo", L"160000,0123456789012345678901234567890123456789,module"});
    m_git({L"commit", L"--quiet", L"-m", L"module"});
    m_git({L"checkout", L"--quiet", L"-b", L"other"});
    m_git.Commit(L"both.txt", "2\n");
    m_git({L"checkout", L"--quiet", L"-"});
    const std::wstring both = m_git.Commit(L"both.txt", "3\n");
    m_git({L"sparse-checkout", L"set", L"kept"});
    m_git({L"-c", L"alias.m=!git merge --quiet other || true", L"m"});

    Texts files;
    EXPECT_EQ(m_user.Names(m_git.Folder(), files), Success);
    EXPECT_EQ(files, (Texts{both, kept}));
}

TEST_F(GitProvider, TakesPathsInEveryFormOfWindows)
{
    m_git.Commit(L"sub/File.txt", "1\n");
    const std::wstring folder = m_git.Folder();
    std::wstring forward = folder + L"/sub/File.txt";
    std::replace(forward.begin(), forward.end(), L'\\', L'/');
    for (const std::wstring& path : {folder + L"\\sub\\FILE.TXT", folder + L"\\.\\other\\..\\sub\\File.txt",
                                     L"\\\\?\\" + folder + L"\\sub\\File.txt", forward})
    {
        EXPECT_EQ(m_user.Query(path), Clean) << std::string(path.begin(), path.end());
    }
}

TEST_F(GitProvider, WithoutAProjectControlsNothing)
{
    const std::wstring file = m_git.Commit(L"a.txt", "1\n");
    EXPECT_EQ(m_user.Provider().CloseProject(), Success);
    EXPECT_FALSE(m_user.Provider().IsProjectOpen());
    EXPECT_EQ(m_user.Query(file), State::NotControlled);
    EXPECT_EQ(m_user.CheckIn({file}, L"x"), Failure);
    EXPECT_EQ(m_user.Provider().CloseProject(), Failure);
}

TEST_F(GitProvider, OpensAnyFolderOfARepository)
{
    const std::wstring file = m_git.Commit(L"deep/er/a.txt", "1\n");
    ASSERT_EQ(m_user.Open(m_git.Folder() + L"\\deep\\er\\"), Success);
    EXPECT_EQ(m_user.Query(file), Clean);
}

TEST_F(GitProvider, SaysWhyAFolderCannotBeOpened)
{
    std::filesystem::create_directory(m_folder.Text() + L"\\plain");
    m_user.client.lines.clear();
    EXPECT_EQ(m_user.Open(m_folder.Text() + L"\\plain"), Failure);
    EXPECT_FALSE(m_user.Provider().IsProjectOpen());
    EXPECT_TRUE(m_user.client.Shows(L"There is no repository of Git that can be used in"));
    EXPECT_TRUE(m_user.client.Shows(L"fatal: not a git repository"));

    EXPECT_EQ(m_user.Open(m_folder.Text() + L"\\none"), Failure);
    EXPECT_TRUE(m_user.client.Shows(L"cannot be started in"));

    m_user.client.lines.clear();
    EXPECT_EQ(m_user.Open(m_git.Folder() + L"\\.git"), Failure);
    EXPECT_TRUE(m_user.client.Shows(L"not in a folder with its files"));

    EXPECT_EQ(m_user.Open(L""), Failure);
    EXPECT_TRUE(m_user.client.Shows(L"empty or too long"));
}

TEST_F(GitProvider, RefusesALinkIntoAFolderOfARepository)
{
    m_git.Commit(L"sub/a.txt", "1\n");
    std::filesystem::create_directory(m_git.Folder() + L"\\other");
    std::filesystem::create_directory(m_folder.Text() + L"\\plain");
    m_git({L"-c",
           L"alias.link=!export MSYS=winsymlinks:nativestrict; ln -s ../sub other/link && "
           L"ln -s '../my town/sub' ../plain/link",
           L"link"});
    for (const std::wstring& folder : {m_git.Folder() + L"\\other\\link", m_folder.Text() + L"\\plain\\link"})
    {
        m_user.client.lines.clear();
        EXPECT_EQ(m_user.Open(folder), Failure);
        EXPECT_FALSE(m_user.Provider().IsProjectOpen());
        EXPECT_TRUE(m_user.client.Shows(L"is a link into a folder of a repository"))
            << testing::PrintToString(m_user.client.lines);
    }
}

TEST_F(GitProvider, PassesOnWhatGitSaysOfAForeignOwner)
{
    SetEnvironmentVariableW(L"GIT_TEST_ASSUME_DIFFERENT_OWNER", L"1");
    m_user.client.lines.clear();
    EXPECT_EQ(m_user.Open(m_git.Folder()), Failure);
    SetEnvironmentVariableW(L"GIT_TEST_ASSUME_DIFFERENT_OWNER", nullptr);
    EXPECT_TRUE(m_user.client.Shows(L"dubious ownership"));
    EXPECT_TRUE(m_user.client.Shows(L"safe.directory"));
}

TEST_F(GitProvider, AddsAndCommitsFilesWithNamesOfAllKinds)
{
    Texts files;
    for (const std::wstring& name : NastyNames)
    {
        files.push_back(m_git.Write(name, "1\n"));
    }
    ASSERT_EQ(m_user.Add(files), Success);
    EXPECT_EQ(m_user.Query(files), std::vector<unsigned long>(files.size(), Edited));
    Texts sorted = NastyNames;
    Texts staged = Names({L"ls-files", L"-z"});
    std::sort(sorted.begin(), sorted.end());
    std::sort(staged.begin(), staged.end());
    EXPECT_EQ(staged, sorted);

    ASSERT_EQ(m_user.CheckIn(files, L"Gr\u00FC\u00DFe\n\nTwo \"lines\"."), Success);
    EXPECT_EQ(Message(), "Gr\xC3\xBC\xC3\x9F"
                         "e\n\nTwo \"lines\".\n\n");
    Texts committed = Committed();
    std::sort(committed.begin(), committed.end());
    EXPECT_EQ(committed, sorted);
    EXPECT_EQ(m_user.Query(files), std::vector<unsigned long>(files.size(), Clean));
    EXPECT_EQ(m_git({L"fsck", L"--strict"}), "");
    EXPECT_EQ(Porcelain(), "");
}

TEST_F(GitProvider, WorksOnPathsLongerThan260Characters)
{
    const std::wstring name = std::wstring(100, L'a') + L"/" + std::wstring(100, L'b') + L"/" + std::wstring(100, L'c');
    const std::wstring file = m_git.Write(name, "1\n");
    ASSERT_GT(file.size(), 300u);
    ASSERT_EQ(m_user.Add({file}), Success);
    ASSERT_EQ(m_user.CheckIn({file}, L"Long"), Success);
    EXPECT_EQ(Committed(), Texts{name});
    ASSERT_EQ(m_user.CheckOut({file}), Success);
    EXPECT_EQ(m_user.Query(file), Edited);
    m_git.Write(name, "2\n");
    ASSERT_EQ(m_user.Undo({file}), Success);
    EXPECT_EQ(m_git.Read(name), "1\n");
}

TEST_F(GitProvider, CommitsExactlyTheActiveFiles)
{
    const std::wstring first = m_git.Commit(L"first.txt", "1\n");
    m_git.Commit(L"second.txt", "1\n");
    m_git.Commit(L"third.txt", "1\n");
    for (const wchar_t* name : {L"first.txt", L"second.txt", L"third.txt"})
    {
        m_git.Write(name, "2\n");
    }
    m_git({L"add", L"second.txt"});
    ASSERT_EQ(m_user.CheckIn({first}, L"One"), Success);
    EXPECT_EQ(Committed(), Texts{L"first.txt"});
    EXPECT_EQ(Porcelain(), "M  second.txt\n M third.txt\n");
    EXPECT_FALSE(m_git.Has(L".git/ORVIX_COMMENT_" + std::to_wstring(GetCurrentProcessId())));
}

TEST_F(GitProvider, CommitsADeletedAndARenamedFile)
{
    const std::wstring gone = m_git.Commit(L"gone.txt", "1\n");
    const std::wstring old = m_git.Commit(L"old.txt", "a long enough line to be found again\n");
    std::filesystem::remove(gone);
    const std::wstring renamed = m_git.File(L"renamed.txt");
    std::filesystem::rename(old, renamed);
    ASSERT_EQ(m_user.Add({renamed}), Success);
    ASSERT_EQ(m_user.CheckIn({gone, old, renamed}, L"Tidied up"), Success);
    EXPECT_EQ(m_git({L"diff-tree", L"-r", L"-M", L"--name-status", L"--no-commit-id", L"HEAD"}),
              "D\tgone.txt\nR100\told.txt\trenamed.txt\n");

    ASSERT_EQ(m_user.History({renamed}), Success);
    ASSERT_EQ(m_user.client.lines.size(), 3u);
    EXPECT_EQ(m_user.client.lines[0], renamed);
    EXPECT_TRUE(m_user.client.lines[1].ends_with(L"Ada  Tidied up"));
    EXPECT_TRUE(m_user.client.lines[2].ends_with(L"Ada  By hand"));
}

TEST_F(GitProvider, RefusesACommitWithItsReason)
{
    const std::wstring file = m_git.Commit(L"a.txt", "1\n");
    const std::string head = m_git({L"rev-parse", L"HEAD"});
    const auto expectRefused = [&](const wchar_t* comment, const wchar_t* reason) {
        EXPECT_EQ(m_user.CheckIn({file}, comment), Failure);
        EXPECT_TRUE(m_user.client.Shows(reason)) << testing::PrintToString(m_user.client.lines);
        EXPECT_EQ(m_git({L"rev-parse", L"HEAD"}), head);
        EXPECT_FALSE(m_git.Has(L".git/index.lock"));
    };
    expectRefused(L"Nothing changed", L"nothing to commit");
    m_git.Write(L"a.txt", "2\n");
    expectRefused(L"", L"A commit needs a comment");
    expectRefused(nullptr, L"A commit needs a comment");
    expectRefused(L" \r\n", L"A commit needs a comment");

    m_git({L"config", L"user.useConfigOnly", L"true"});
    m_git({L"config", L"--unset", L"user.email"});
    expectRefused(L"Who am I", L"Please tell me who you are");
    m_git({L"config", L"user.email", L"ada@example.org"});

    AddHook(m_git, L"pre-commit", "echo 'the hook says no' >&2\nexit 1\n");
    expectRefused(L"Hooked", L"the hook says no");

    m_git.Write(L"a.txt", "1\n");
    AddHook(m_git, L"pre-commit", "echo 'lint ok' >&2\n");
    expectRefused(L"Nothing changed", L"lint ok");
    EXPECT_TRUE(m_user.client.Shows(L"nothing to commit"));
}

TEST_F(GitProvider, LeavesHooksTheirOwnPatterns)
{
    const std::wstring file = m_git.Commit(L"a.txt", "1\n");
    m_git.Write(L"a.txt", "2\n");
    AddHook(m_git, L"pre-commit", "git ls-files --error-unmatch '*.txt'\n");
    EXPECT_EQ(m_user.CheckIn({file}, L"Seen by the hook"), Success) << testing::PrintToString(m_user.client.lines);
}

TEST_F(GitProvider, RefusesAnUntrackedFileAndALockFileOfAnother)
{
    const std::wstring file = m_git.Commit(L"a.txt", "1\n");
    const std::wstring other = m_git.Write(L"other.txt", "1\n");
    m_git.Write(L"a.txt", "2\n");
    EXPECT_EQ(m_user.CheckIn({file, other}, L"Both"), Failure);
    EXPECT_TRUE(m_user.client.Shows(L"pathspec 'other.txt' did not match any file"));
    EXPECT_EQ(Porcelain(), " M a.txt\n?? other.txt\n");

    m_git.Write(L".git/index.lock", "");
    EXPECT_EQ(m_user.CheckIn({file}, L"Locked"), Failure);
    EXPECT_TRUE(m_user.client.Shows(L"index.lock': File exists"));
    EXPECT_TRUE(m_git.Has(L".git/index.lock")) << "it may belong to a program that runs";
    EXPECT_EQ(m_user.Query(file), Modified) << "a query needs no lock";
}

TEST_F(GitProvider, RefusesFilesThatGitIgnores)
{
    m_git.Commit(L".gitignore", "*.tmp\n");
    const std::wstring ignored = m_git.Write(L"a.tmp", "1\n");
    EXPECT_EQ(m_user.Add({ignored}), Failure);
    EXPECT_TRUE(m_user.client.Shows(L"ignored by one of your .gitignore files"));
    EXPECT_EQ(Porcelain(), "");
}

TEST_F(GitProvider, AddsManyFilesAndSaysWhichOneItCannotAdd)
{
    m_git.Commit(L".gitignore", "*.tmp\n");
    m_git({L"-c", L"alias.fill=!mkdir many && for i in $(seq 1500); do echo $i > \"many/[$i].txt\"; done", L"fill"});
    Texts files;
    for (int i = 1; i <= 1500; ++i)
    {
        files.push_back(m_git.File(L"many/[" + std::to_wstring(i) + L"].txt"));
    }
    files.push_back(m_git.Write(L"ignored.tmp", "1\n"));
    EXPECT_EQ(m_user.Add(files), Failure);
    EXPECT_TRUE(m_user.client.Shows(L"ignored by one of your .gitignore files"));
    files.pop_back();
    ASSERT_EQ(m_user.Add(files), Success) << testing::PrintToString(m_user.client.lines);
    EXPECT_EQ(Names({L"ls-files", L"-z"}).size(), 1501u);
    EXPECT_EQ(m_git({L"diff"}), "") << "the index has what is on the disk";
}

TEST_F(GitProvider, ConvertsLineEndingsAndRunsFiltersAsGitDoes)
{
    m_git({L"config", L"filter.shout.clean", L"tr a-z A-Z"});
    m_git({L"config", L"filter.shout.smudge", L"tr A-Z a-z"});
    m_git.Commit(L".gitattributes", "*.txt text eol=crlf\n*.shout filter=shout\n");
    const std::wstring text = m_git.Write(L"a.txt", "one\r\ntwo\r\n");
    const std::wstring shout = m_git.Write(L"a.shout", "quiet\n");
    ASSERT_EQ(m_user.Add({text, shout}), Success);
    ASSERT_EQ(m_user.CheckIn({text, shout}, L"Converted"), Success);
    EXPECT_EQ(m_git({L"cat-file", L"blob", L"HEAD:a.txt"}), "one\ntwo\n");
    EXPECT_EQ(m_git({L"cat-file", L"blob", L"HEAD:a.shout"}), "QUIET\n");
    EXPECT_EQ(m_user.Query({text, shout}), (std::vector<unsigned long>{Clean, Clean}));

    m_git.Write(L"a.txt", "damaged");
    m_git.Write(L"a.shout", "damaged");
    ASSERT_EQ(m_user.Undo({text, shout}), Success);
    EXPECT_EQ(m_git.Read(L"a.txt"), "one\r\ntwo\r\n");
    EXPECT_EQ(m_git.Read(L"a.shout"), "quiet\n");
}

TEST_F(GitProvider, CommitsANameThatChangesOnlyItsLetterCase)
{
    m_git({L"config", L"core.ignoreCase", L"false"});
    const std::wstring old = m_git.Commit(L"Readme.txt", "a long enough line to be found again\n");
    EXPECT_EQ(m_user.Query(old), Clean) << "the name is known";
    m_git({L"-c", L"alias.rename=!mv Readme.txt README.TXT", L"rename"});
    const std::wstring renamed = m_git.File(L"README.TXT");
    ASSERT_EQ(m_user.Add({renamed}), Success);
    ASSERT_EQ(m_user.CheckIn({old, renamed}, L"Louder"), Success) << testing::PrintToString(m_user.client.lines);
    EXPECT_EQ(m_git({L"diff-tree", L"-r", L"-M", L"--name-status", L"--no-commit-id", L"HEAD"}),
              "R100\tReadme.txt\tREADME.TXT\n");
}

TEST_F(GitProvider, AddsAFileInAnotherLetterCaseAtFirst)
{
    m_git.Write(L"sub/Readme.txt", "1\n");
    ASSERT_EQ(m_user.Add({m_git.File(L"SUB/README.TXT")}), Success) << testing::PrintToString(m_user.client.lines);
    EXPECT_EQ(m_git({L"ls-files"}), "sub/Readme.txt\n");
    m_git.Write(L"sub/Later.txt", "1\n");
    ASSERT_EQ(m_user.Add({m_git.File(L"sub/LATER.txt")}), Success) << testing::PrintToString(m_user.client.lines);
    EXPECT_EQ(m_git({L"ls-files"}), "sub/Later.txt\nsub/Readme.txt\n");
}

TEST_F(GitProvider, ShowsTheHistoryOfAFileInAnotherLetterCaseAtFirst)
{
    m_git.Commit(L"Readme.txt", "1\n");
    ASSERT_EQ(m_user.History({m_git.File(L"README.TXT")}), Success);
    ASSERT_EQ(m_user.client.lines.size(), 2u);
    EXPECT_TRUE(m_user.client.lines[1].ends_with(L"Ada  By hand"));
}

TEST_F(GitProvider, ChecksOutForThisSession)
{
    const std::wstring file = m_git.Commit(L"a.txt", "1\n");
    SetFileAttributesW(file.c_str(), FILE_ATTRIBUTE_READONLY);
    ASSERT_EQ(m_user.CheckOut({file}), Success);
    EXPECT_EQ(GetFileAttributesW(file.c_str()) & FILE_ATTRIBUTE_READONLY, 0u);
    EXPECT_EQ(m_user.Query(file), Edited);
    ASSERT_EQ(m_user.Undo({file}), Success);
    EXPECT_EQ(m_user.Query(file), Clean);

    const std::wstring other = m_git.Write(L"other.txt", "1\n");
    EXPECT_EQ(m_user.CheckOut({other, m_git.File(L"none.txt"), file}), Failure);
    EXPECT_TRUE(m_user.client.Shows(L"other.txt is not under Git's control"));
    EXPECT_TRUE(m_user.client.Shows(L"none.txt is not under Git's control"));
    EXPECT_EQ(m_user.Query(file), Edited) << "the others are checked out";

    m_git.Write(L"a.txt", "2\n");
    ASSERT_EQ(m_user.CheckIn({file}, L"Kept", Option::KeepCheckedOut | Option::NoDialog), Success);
    EXPECT_EQ(m_user.Query(file), Edited);
    m_git.Write(L"a.txt", "3\n");
    ASSERT_EQ(m_user.CheckIn({file}, L"Given back"), Success);
    EXPECT_EQ(m_user.Query(file), Clean);
}

TEST_F(GitProvider, UndoesEveryKindOfChange)
{
    const std::wstring modified = m_git.Commit(L"modified.txt", "1\n");
    const std::wstring staged = m_git.Commit(L"staged.txt", "1\n");
    const std::wstring deleted = m_git.Commit(L"deleted.txt", "1\n");
    const std::wstring removed = m_git.Commit(L"removed.txt", "1\n");
    m_git.Commit(L"other.txt", "1\n");
    m_git.Write(L"modified.txt", "2\n");
    m_git.Write(L"other.txt", "2\n");
    m_git.Write(L"staged.txt", "2\n");
    m_git({L"add", L"staged.txt"});
    std::filesystem::remove(deleted);
    m_git({L"rm", L"--quiet", L"removed.txt"});
    const std::wstring added = m_git.Write(L"added.txt", "new\n");
    m_git({L"add", L"added.txt"});

    ASSERT_EQ(m_user.Undo({modified, staged, deleted, removed, added}), Success);
    EXPECT_EQ(Porcelain(), " M other.txt\n?? added.txt\n");
    EXPECT_EQ(m_git.Read(L"added.txt"), "new\n");
    EXPECT_EQ(m_git.Read(L"removed.txt"), "1\n");

    EXPECT_EQ(m_user.Undo({added, modified}), Failure);
    EXPECT_TRUE(m_user.client.Shows(L"added.txt is not under Git's control"));
}

TEST_F(GitProvider, WorksBeforeTheFirstCommit)
{
    const std::wstring file = m_git.Write(L"a.txt", "1\n");
    EXPECT_EQ(m_user.Query(file), CanAdd);
    ASSERT_EQ(m_user.Add({file}), Success);
    EXPECT_EQ(m_user.Query(file), Edited);
    m_git.Write(L"a.txt", "changed since\n");
    EXPECT_EQ(m_user.Query(file), Modified);
    ASSERT_EQ(m_user.Undo({file}), Success);
    EXPECT_EQ(m_user.Query(file), CanAdd);
    ASSERT_EQ(m_user.Add({file}), Success);
    EXPECT_EQ(m_user.History({file}), Failure);
    EXPECT_TRUE(m_user.client.Shows(L"does not have any commits yet"));
    ASSERT_EQ(m_user.CheckIn({file}, L"First"), Success);
    EXPECT_EQ(m_user.Query(file), Clean);
}

TEST_F(GitProvider, GetsMissingFilesWithoutAnUpstream)
{
    const std::wstring missing = m_git.Commit(L"missing.txt", "1\n");
    const std::wstring modified = m_git.Commit(L"modified.txt", "1\n");
    const std::wstring elsewhere = m_git.Commit(L"elsewhere.txt", "1\n");
    std::filesystem::remove(missing);
    std::filesystem::remove(elsewhere);
    m_git.Write(L"modified.txt", "2\n");
    ASSERT_EQ(m_user.Get({missing, modified}), Success);
    EXPECT_EQ(m_git.Read(L"missing.txt"), "1\n");
    EXPECT_EQ(m_git.Read(L"modified.txt"), "2\n");
    EXPECT_FALSE(m_git.Has(L"elsewhere.txt"));
}

TEST_F(GitProvider, ShowsPropertiesOfTheFirstFile)
{
    m_git.Commit(L".gitattributes", "*.psd -text\n");
    const std::wstring file = m_git.Commit(L"a.psd", "1\n", L"A picture");
    ASSERT_EQ(m_user.Properties({file, m_git.File(L".gitattributes")}), Success);
    EXPECT_EQ(m_user.client.lines.front(), file);
    EXPECT_TRUE(m_user.client.Shows(L"as committed"));
    EXPECT_TRUE(m_user.client.Shows(L"Ada  A picture"));
    EXPECT_TRUE(m_user.client.Shows(L"branch       main"));
    EXPECT_TRUE(m_user.client.Shows(L"upstream     none"));
    EXPECT_TRUE(m_user.client.Shows(L"text: unset"));
    m_git.Write(L"a.psd", "2\n");
    m_user.Properties({file});
    EXPECT_TRUE(m_user.client.Shows(L"state        modified"));
}

TEST_F(GitProvider, KeepsFilesOfASubmoduleApartUntilItIsOpened)
{
    MakeRepository(L"part").Commit(L"inner.txt", "1\n");
    m_git({L"submodule", L"--quiet", L"add", Address(L"part"), L"part"});
    m_git({L"commit", L"--quiet", L"-m", L"Part"});
    const std::wstring inner = m_git.File(L"part/inner.txt");
    m_git.Write(L"part/inner.txt", "2\n");
    EXPECT_EQ(m_user.Query(inner), State::NotControlled);

    ASSERT_EQ(m_user.Open(m_git.Folder() + L"\\part"), Success);
    EXPECT_EQ(m_user.Query(inner), Modified);
    PlainGit part(m_git.Folder() + L"\\part");
    part({L"config", L"user.name", L"Ada"});
    part({L"config", L"user.email", L"ada@example.org"});
    ASSERT_EQ(m_user.CheckIn({inner}, L"Inside"), Success);
    EXPECT_EQ(part({L"log", L"-1", L"--format=%s"}), "Inside\n");
}

TEST_F(GitProvider, WorksInASecondWorkingFolder)
{
    m_git.Commit(L"a.txt", "1\n");
    m_git({L"worktree", L"add", L"--quiet", L"../second", L"-b", L"side"});
    const PlainGit second(m_folder.Text() + L"\\second");
    ASSERT_EQ(m_user.Open(second.Folder()), Success);
    const std::wstring file = second.Write(L"a.txt", "2\n");
    EXPECT_EQ(m_user.Query(file), Modified);
    ASSERT_EQ(m_user.CheckIn({file}, L"On the side"), Success);
    EXPECT_EQ(second({L"log", L"-1", L"--format=%s"}), "On the side\n");
    EXPECT_EQ(m_git({L"log", L"-1", L"--format=%s"}), "By hand\n");
    EXPECT_EQ(Porcelain(), "");
}

TEST_F(GitProvider, OffersNoOptionsAndStartsTheUsersClient)
{
    EXPECT_EQ(m_user.Provider().ShowOptions(), NotOffered);
    m_git({L"config", L"orvix.client", L"client.exe"});
    ASSERT_EQ(m_user.Open(m_git.Folder()), Success);
    m_user.client.lines.clear();
    EXPECT_EQ(m_user.Provider().RunProviderClient(), Failure);
    EXPECT_TRUE(m_user.client.Shows(L"orvix.client"));
    m_git({L"config", L"orvix.client", GIT_PROBE});
    ASSERT_EQ(m_user.Open(m_git.Folder()), Success);
    EXPECT_EQ(m_user.Provider().RunProviderClient(), Success);
}

TEST_F(GitProvider, SaysTheStateOf100000Files)
{
    constexpr int Count = 100000;
    const std::string blob = m_git({L"hash-object", L"-w", L"--stdin"}, "1\n").substr(0, 40);
    std::string index;
    Texts files;
    for (int i = 0; i < Count; ++i)
    {
        const std::string name = std::to_string(i / 1000) + "/[" + std::to_string(i) + "].txt";
        index.append("100644 ").append(blob).append("\t").append(name).append("\n");
        files.push_back(m_git.File(std::wstring(name.begin(), name.end())));
    }
    m_git({L"update-index", L"--index-info"}, index);
    files.push_back(m_git.Write(L"other.txt", "1\n"));
    std::vector<unsigned long> expected(Count, Deleted);
    expected.push_back(CanAdd);
    EXPECT_EQ(m_user.Query(files), expected);
}

TEST_F(GitProvider, LeavesNoCommentOnAFullDrive)
{
    const wchar_t* drive = _wgetenv(L"ORVIX_SMALL_DRIVE");
    if (drive == nullptr)
    {
        GTEST_SKIP() << "no small drive";
    }
    const std::filesystem::path folder = std::filesystem::path(drive) / L"town";
    const PlainGit parent(drive);
    parent({L"init", L"--quiet", L"--template=", L"town"});
    const PlainGit town(folder.wstring());
    const std::wstring file = town.Write(L"a.txt", "1\n");
    EXPECT_EQ(m_user.Open(town.Folder()), Success);
    EXPECT_EQ(m_user.Add({file}), Success);
    EXPECT_EQ(m_user.CheckIn({file}, std::wstring(200000, L'x').c_str()), Failure);
    EXPECT_TRUE(m_user.client.Shows(L"The comment cannot be written to"))
        << testing::PrintToString(m_user.client.lines);
    EXPECT_FALSE(town.Has(L".git/ORVIX_COMMENT_" + std::to_wstring(GetCurrentProcessId())));
    parent({L"-c", L"alias.clear=!rm -rf town", L"clear"}); // read-only files, too
}

TEST_F(GitProvider, SeesWhatAnotherProgramHasAddedOrRemoved)
{
    const std::wstring one = m_git.Commit(L"one.txt", "1\n");
    const std::wstring two = m_git.Write(L"two.txt", "2\n");
    ASSERT_EQ(m_user.Open(m_git.Folder()), Success);
    EXPECT_EQ(m_user.Query(two) & OrvixFileState::Controlled, 0u);
    m_git({L"add", L"two.txt"});
    EXPECT_NE(m_user.Query(two) & OrvixFileState::Controlled, 0u);
    m_git({L"commit", L"--quiet", L"-m", L"Two"});
    EXPECT_NE(m_user.Query(two) & OrvixFileState::Controlled, 0u);
    m_git({L"rm", L"--quiet", L"--cached", L"one.txt"});
    m_git({L"commit", L"--quiet", L"-m", L"One less"});
    EXPECT_EQ(m_user.Query(one) & OrvixFileState::Controlled, 0u);
    EXPECT_NE(m_user.Query(two) & OrvixFileState::Controlled, 0u);
}

TEST_F(GitProvider, EndsACommandThatIsSilentForTooLong)
{
    const std::wstring file = m_git.Commit(L"a.txt", "1\n");
    m_git.Write(L"a.txt", "2\n");
    m_git({L"config", L"orvix.silentLimit", L"8"});
    AddHook(m_git, L"pre-commit", "sleep 60\n");
    ASSERT_EQ(m_user.Open(m_git.Folder()), Success);
    EXPECT_EQ(m_user.CheckIn({file}, L"Slow"), Failure);
    EXPECT_TRUE(m_user.client.Shows(L"git commit printed nothing for 8 seconds and was ended"))
        << testing::PrintToString(m_user.client.lines);
    EXPECT_FALSE(m_git.Has(L".git/index.lock"));
    m_git({L"config", L"--unset", L"core.hooksPath"});
    EXPECT_EQ(m_user.CheckIn({file}, L"Now"), Success);
}

TEST_F(GitProvider, SaysThatACommitIsMadeWhenWhatFollowsItIsEnded)
{
    const std::wstring file = m_git.Commit(L"a.txt", "1\n");
    m_git.Write(L"a.txt", "2\n");
    m_git({L"config", L"orvix.silentLimit", L"8"});
    AddHook(m_git, L"post-commit", "git config maintenance.auto > .git/seen\nsleep 60\n");
    ASSERT_EQ(m_user.Open(m_git.Folder()), Success);
    EXPECT_EQ(m_user.CheckIn({file}, L"Made"), Success);
    EXPECT_TRUE(m_user.client.Shows(L"The commit is made, but what follows it was ended:"))
        << testing::PrintToString(m_user.client.lines);
    EXPECT_TRUE(m_user.client.Shows(L"git commit printed nothing for 8 seconds and was ended"));
    EXPECT_EQ(m_git.Read(L".git/seen"), "false\n") << "maintenance could take long";
    EXPECT_EQ(Message(), "Made\n\n");
    EXPECT_EQ(Porcelain(), "");
    EXPECT_FALSE(m_git.Has(L".git/index.lock"));
}

} // namespace
