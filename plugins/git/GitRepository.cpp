#include "GitRepository.h"

#include "GitFailure.h"
#include "GitText.h"
#include "LockFiles.h"
#include "WindowsPath.h"

#include <windows.h>

#include <algorithm>
#include <charconv>
#include <filesystem>
#include <iterator>

namespace
{

constexpr wchar_t NotControlled[] = L" is not under Git's control";

// From here on "git add" is slow: it compares each path with each file that it finds.
constexpr std::size_t ManyFiles = 1000;

/// Paths as Git reads them from its input, each with a prefix.
std::string PathList(const std::vector<std::string>& paths, std::string_view prefix = {})
{
    std::string list;
    for (const std::string& path : paths)
    {
        list.append(prefix).append(path).push_back('\0');
    }
    return list;
}

/// A command on paths, which it reads from its input.
GitCommand OnPaths(std::vector<std::wstring> arguments, const std::vector<std::string>& paths, std::wstring task)
{
    arguments.insert(arguments.end(), {L"--pathspec-from-file=-", L"--pathspec-file-nul"});
    return {.arguments = std::move(arguments), .input = PathList(paths, LiteralPath), .task = std::move(task)};
}

bool IsTrue(const std::wstring& value)
{
    const std::wstring folded = GitText::Fold(value);
    return folded == L"TRUE" || folded == L"YES" || folded == L"ON" || folded == L"1";
}

/// A text file that exists for the scope.
class CommentFile
{
public:
    CommentFile(const std::wstring& folder, const std::wstring& text)
        : m_name(L"ORVIX_COMMENT_" + std::to_wstring(GetCurrentProcessId())), m_path(LongForm(folder + L'\\' + m_name))
    {
        const std::string bytes = GitText::ToUtf8(text);
        OwnedHandle file = OwnFile(
            CreateFileW(m_path.c_str(), GENERIC_WRITE, 0, nullptr, CREATE_ALWAYS, FILE_ATTRIBUTE_NORMAL, nullptr));
        DWORD written = 0;
        if (!file || !WriteFile(file.get(), bytes.data(), static_cast<DWORD>(bytes.size()), &written, nullptr) ||
            written != bytes.size())
        {
            const DWORD error = GetLastError();
            file.reset();
            DeleteFileW(m_path.c_str());
            throw GitFailure(L"The comment cannot be written to " + folder + L": " + GitText::SystemMessage(error));
        }
    }
    CommentFile(const CommentFile&) = delete;
    CommentFile& operator=(const CommentFile&) = delete;
    ~CommentFile() { DeleteFileW(m_path.c_str()); }

    const std::wstring& Name() const { return m_name; }

private:
    std::wstring m_name;
    std::wstring m_path;
};

/// A loose reference or the file HEAD, without a line end; empty when there is none.
std::string ReadReference(const std::wstring& file)
{
    const OwnedHandle handle = OwnFile(CreateFileW(LongForm(file).c_str(), GENERIC_READ,
                                                   FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE, nullptr,
                                                   OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr));
    char bytes[1024];
    DWORD count = 0;
    if (!handle || !ReadFile(handle.get(), bytes, sizeof bytes, &count, nullptr))
    {
        return {};
    }
    const std::string_view text(bytes, count);
    return std::string(text.substr(0, text.find('\n')));
}

} // namespace

void GitRepository::Open(const std::wstring& folder)
{
    Close();
    const std::wstring start = FullPath(folder);
    if (start.empty())
    {
        throw GitFailure(L"The path of the project is empty or too long");
    }
    m_runner.SetSilence(GitRunner::DefaultSilence);
    m_runner.SetFolder(start + L'\\');
    const ProcessResult found =
        m_runner.Run({.arguments = {L"rev-parse", L"--path-format=relative", L"--is-inside-work-tree", L"--show-cdup",
                                    L"--git-dir", L"--git-common-dir"},
                      .isQuery = true,
                      .task = L"Opening " + start});
    if (!found.Succeeded())
    {
        GitFailure failure(L"There is no repository of Git that can be used in " + start);
        const Lines words = GitRunner::Words(found);
        failure.lines.insert(failure.lines.end(), words.begin(), words.end());
        throw failure;
    }
    const std::vector<std::string_view> answers = GitText::Split(found.output, '\n');
    if (answers.size() < 4 || answers[0] != "true")
    {
        throw GitFailure(start + L" is inside a repository of Git, but not in a folder with its files");
    }
    const auto resolve = [&](std::string_view relative) {
        return FullPath((std::filesystem::path(start + L'\\') / GitText::FromUtf8(relative)).wstring());
    };
    const std::wstring top = resolve(answers[1]);
    m_gitFolder = resolve(answers[2]);
    m_commonFolder = resolve(answers[3]);

    m_runner.SetFolder(top + L'\\');
    const GitCommand commands[] = {
        {.arguments = {L"config", L"-z", L"--get-regexp", L"^orvix\\."}, .isQuery = true, .task = L"Opening " + top},
        {.arguments = {L"ls-files", L"-z", L"--", L":(attr:lockable)"}, .isQuery = true},
        {.arguments = {L"rev-parse", L"--show-cdup"}, .isQuery = true}};
    const std::vector<ProcessResult> results = m_runner.RunAll(commands);
    if (!results[2].Succeeded() || results[2].output.find_first_not_of("\r\n") != std::string::npos)
    {
        throw GitFailure(start + L" is a link into a folder of a repository. Open that folder by its own path");
    }
    if (!results[1].Succeeded())
    {
        throw GitFailure(GitRunner::Words(results[1]));
    }
    ReadConfiguration(results[0].output);
    m_locks.Reset(!results[1].output.empty());
    m_top = top;
    m_locks.Refresh(m_runner);
}

void GitRepository::Close()
{
    m_top.clear();
    m_pushes = false;
    m_client.clear();
    m_locks.Reset(false);
    m_checkedOut.clear();
    m_indexStamp.reset();
    m_tracked.reset();
    m_snapshot.reset();
}

/// Each setting is "key<line end>value", with a zero after it. A key without a value means true.
void GitRepository::ReadConfiguration(const std::string& printed)
{
    for (const std::string_view setting : GitText::Split(printed, '\0'))
    {
        const std::size_t end = setting.find('\n');
        const std::string_view key = setting.substr(0, end);
        const std::wstring value = end != std::string_view::npos ? GitText::FromUtf8(setting.substr(end + 1)) : L"true";
        if (key == "orvix.push")
        {
            m_pushes = IsTrue(value);
        }
        else if (key == "orvix.client")
        {
            m_client = value;
        }
        else if (key == "orvix.silentlimit")
        {
            unsigned seconds = 0;
            const std::string digits = GitText::ToUtf8(value);
            std::from_chars(digits.data(), digits.data() + digits.size(), seconds);
            if (seconds != 0)
            {
                m_runner.SetSilence(std::chrono::seconds(seconds));
            }
        }
    }
}

/// The path below the top folder as Git writes it; nothing for a file outside.
std::optional<std::string> GitRepository::Relative(const std::wstring& path) const
{
    std::wstring full = FullPath(path);
    const std::size_t length = m_top.size();
    if (full.size() <= length + 1 || full[length] != L'\\' ||
        CompareStringOrdinal(full.c_str(), static_cast<int>(length), m_top.c_str(), static_cast<int>(length), TRUE) !=
            CSTR_EQUAL)
    {
        return std::nullopt;
    }
    full.erase(0, length + 1);
    std::replace(full.begin(), full.end(), L'\\', L'/');
    return GitText::ToUtf8(full);
}

/// The path below the top folder in Git's spelling, as far as it was seen.
std::string GitRepository::Spelled(const std::wstring& path) const
{
    const std::optional<std::string> relative = Relative(path);
    if (!relative)
    {
        throw GitFailure(path + L" is not in the folder of the repository, " + m_top);
    }
    const GitSnapshot::Entry* known = m_snapshot ? m_snapshot->Find(*relative) : nullptr;
    return known != nullptr ? std::string(known->first) : *relative;
}

std::vector<std::string> GitRepository::Spelled(const Paths& paths) const
{
    std::vector<std::string> spelled;
    m_runner.Work(L"Looking at the paths", [&] {
        spelled.reserve(paths.size());
        for (const std::wstring& path : paths)
        {
            spelled.push_back(Spelled(path));
        }
    });
    return spelled;
}

/// The same for files that were not seen yet, or may have been renamed since: to a name in another letter case.
std::vector<std::string> GitRepository::SpelledNow(const Paths& paths)
{
    bool isSeen = false;
    if (m_snapshot)
    {
        m_runner.Work(L"Looking at the paths", [&] {
            isSeen = std::all_of(paths.begin(), paths.end(), [&](const std::wstring& path) {
                const std::optional<std::string> relative = Relative(path);
                const GitSnapshot::Entry* known = relative ? m_snapshot->Find(*relative) : nullptr;
                return known != nullptr && known->first == *relative;
            });
        });
    }
    if (!isSeen)
    {
        TakeSnapshot();
    }
    return Spelled(paths);
}

std::wstring GitRepository::Full(const std::string& path) const
{
    std::wstring full = m_top + L'\\' + GitText::FromUtf8(path);
    std::replace(full.begin(), full.end(), L'/', L'\\');
    return full;
}

/// None when there is no index yet.
std::optional<GitRepository::IndexStamp> GitRepository::StampOfIndex() const
{
    const OwnedHandle file = OwnFile(CreateFileW(LongForm(m_gitFolder + L"\\index").c_str(), FILE_READ_ATTRIBUTES,
                                                 FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE, nullptr,
                                                 OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr));
    BY_HANDLE_FILE_INFORMATION found{};
    if (!file || !GetFileInformationByHandle(file.get(), &found))
    {
        return std::nullopt;
    }
    const auto join = [](DWORD high, DWORD low) { return (static_cast<unsigned long long>(high) << 32) | low; };
    return IndexStamp{join(found.nFileIndexHigh, found.nFileIndexLow), join(found.nFileSizeHigh, found.nFileSizeLow),
                      join(found.ftLastWriteTime.dwHighDateTime, found.ftLastWriteTime.dwLowDateTime)};
}

void GitRepository::TakeSnapshot()
{
    const std::optional<IndexStamp> stamp = StampOfIndex(); // before the paths are read
    const bool isKnown = stamp && stamp == m_indexStamp;
    std::vector<GitCommand> commands = {
        {.arguments = {L"status", L"--porcelain=v2", L"-z", L"--branch", L"--untracked-files=all", L"--no-renames",
                       L"--ignore-submodules=dirty"},
         .isQuery = true,
         .task = L"Reading the state of the files"}};
    if (!isKnown)
    {
        commands.push_back({.arguments = {L"ls-files", L"-z"}, .isQuery = true});
    }
    std::vector<ProcessResult> results = m_runner.RunAll(commands);
    for (const ProcessResult& result : results)
    {
        if (!result.Succeeded())
        {
            throw GitFailure(GitRunner::Words(result));
        }
    }
    if (!isKnown)
    {
        m_tracked = std::make_shared<const std::string>(std::move(results[1].output));
        m_indexStamp = stamp;
    }
    m_runner.Work(L"Reading the state of the files",
                  [&] { m_snapshot = std::make_unique<GitSnapshot>(results[0].output, m_tracked); });
    if (m_snapshot->Status().behind > 0)
    {
        ProcessResult changes =
            m_runner.Run({.arguments = {L"diff", L"--name-only", L"-z", L"--no-renames", L"HEAD...@{upstream}"},
                          .isQuery = true,
                          .task = L"Reading the changes of the upstream"});
        m_snapshot->SetOutOfDate(changes.Succeeded() ? std::move(changes.output) : std::string());
    }
}

std::vector<GitFileState> GitRepository::Status(const Paths& paths)
{
    m_locks.RefreshInBackground(m_runner);
    TakeSnapshot();
    std::vector<GitFileState> states;
    m_runner.Work(L"Reading the state of the files", [&] {
        states.reserve(paths.size());
        for (const std::wstring& path : paths)
        {
            const std::optional<std::string> relative = Relative(path);
            const GitSnapshot::Entry* entry = relative ? m_snapshot->Find(*relative) : nullptr;
            states.push_back(entry != nullptr ? StateOf(*entry) : GitFileState());
        }
    });
    return states;
}

GitFileState GitRepository::StateOf(const GitSnapshot::Entry& entry) const
{
    const auto& [path, item] = entry;
    const GitLocks::Lock* lock = m_locks.Find(path);
    GitFileState state;
    state.isControlled = item.isTracked;
    state.canAdd = !item.isTracked;
    if (item.isTracked)
    {
        state.isDeleted = item.changed != nullptr && item.changed->IsDeleted();
        state.isConflicted = item.changed != nullptr && item.changed->kind == GitStatus::File::Kind::Conflicted;
        // What was added has no committed version that it could differ from.
        const bool isAsAdded =
            item.changed != nullptr && !state.isConflicted && item.changed->IsAdded() && item.changed->onDisk != 'M';
        state.isModified = item.changed != nullptr && !state.isDeleted && !isAsAdded;
        state.isLockedByOther = lock != nullptr && !lock->isOurs;
        state.isCheckedOut =
            item.changed != nullptr || (lock != nullptr && lock->isOurs) || m_checkedOut.contains(std::string(path));
        state.isOutOfDate = m_snapshot->IsOutOfDate(path);
    }
    return state;
}

GitRepository::Paths GitRepository::Files(const std::wstring& folder) const
{
    const std::optional<std::string> relative = Relative(folder);
    if (!relative && GitText::Fold(FullPath(folder)) != GitText::Fold(m_top))
    {
        throw GitFailure(folder + L" is not in the folder of the repository, " + m_top);
    }
    const std::wstring inside = relative ? GitText::Fold(GitText::FromUtf8(*relative + '/')) : L"";
    const std::wstring above = folder.substr(0, folder.find_last_not_of(L"\\/") + 1) + L'\\';
    const std::string listed = m_runner.RunOrThrow(
        {.arguments = {L"ls-files", L"-z", L"-t", L"--stage"}, .isQuery = true, .task = L"Listing the files"});
    Paths files;
    m_runner.Work(L"Listing the files", [&] {
        std::string_view last;
        for (const std::string_view entry : GitText::Split(listed, '\0')) // "TAG MODE OBJECT STAGE<tab>PATH"
        {
            constexpr std::string_view LeftOutTag = "S "; // by a sparse checkout
            constexpr std::string_view SubmoduleMode = "160000 ";
            const std::string_view path = entry.substr(entry.find('\t') + 1);
            std::wstring name = GitText::FromUtf8(path);
            const bool isFile =
                !entry.starts_with(LeftOutTag) && !entry.substr(LeftOutTag.size()).starts_with(SubmoduleMode);
            const bool isAgain = path == last; // a conflicted file has several stages
            last = path;
            if (isFile && !isAgain && GitText::Fold(name).starts_with(inside))
            {
                std::replace(name.begin(), name.end(), L'/', L'\\');
                files.push_back(above + name.substr(inside.size()));
            }
        }
    });
    return files;
}

/// Runs a command that changes the repository. When it is ended in the middle, its lock files go.
ProcessResult GitRepository::Change(const GitCommand& command) const
{
    const LockFiles locks(m_gitFolder, m_commonFolder, !command.keepsIndex);
    try
    {
        return m_runner.Run(command);
    }
    catch (const GitFailure&)
    {
        m_runner.Work(command.task, [&] { locks.DeleteNew(); });
        throw;
    }
}

void GitRepository::ChangeOrThrow(const GitCommand& command) const
{
    if (const ProcessResult result = Change(command); !result.Succeeded())
    {
        throw GitFailure(GitRunner::Words(result));
    }
}

void GitRepository::Add(const Paths& paths)
{
    const bool areMany = paths.size() >= ManyFiles;
    if (areMany)
    {
        TakeSnapshot();
    }
    const std::vector<std::string> files = SpelledNow(paths);
    if (areMany && AddMany(files))
    {
        return;
    }
    GitCommand command = OnPaths({L"add", L"--verbose"}, files, L"Adding files");
    command.linesToCome = files.size();
    ChangeOrThrow(command);
}

/// Adds files in a time that grows with their number alone. False when one of them is a special case, such as a file
/// that Git ignores: then nothing has changed.
bool GitRepository::AddMany(const std::vector<std::string>& files) const
{
    const bool areKnown = std::all_of(files.begin(), files.end(),
                                      [&](const std::string& file) { return m_snapshot->Find(file) != nullptr; });
    return areKnown && Change({.arguments = {L"update-index", L"--add", L"--verbose", L"-z", L"--stdin"},
                               .input = PathList(files),
                               .task = L"Adding files",
                               .linesToCome = files.size()})
                           .Succeeded();
}

GitRepository::Lines GitRepository::CheckIn(const Paths& paths, const std::wstring& comment, bool keepCheckedOut)
{
    if (comment.find_first_not_of(L" \t\r\n") == std::wstring::npos)
    {
        throw GitFailure(L"A commit needs a comment");
    }
    const std::vector<std::string> files = SpelledNow(paths);
    Lines report = Commit(files, comment);
    if (report.empty() && m_pushes)
    {
        report = Push();
    }
    if (!report.empty())
    {
        return report; // the locks stay: nobody else has the new version yet
    }
    if (!keepCheckedOut)
    {
        report = GiveLocksBack(files);
        for (const std::string& file : files)
        {
            m_checkedOut.erase(file);
        }
    }
    m_locks.Refresh(m_runner);
    return report;
}

/// Commits the files. Returns why what follows the commit was ended, such as a hook, and nothing when all is done: the
/// commit stays.
GitRepository::Lines GitRepository::Commit(const std::vector<std::string>& files, const std::wstring& comment) const
{
    // Git's folder may be anywhere: the comment is written there. On another drive it has no relative path.
    const CommentFile file(m_gitFolder, comment);
    const std::filesystem::path folder(m_gitFolder);
    const std::filesystem::path relative = folder.lexically_relative(m_top);
    const std::filesystem::path named = (relative.empty() ? folder : relative) / file.Name();
    GitCommand command =
        OnPaths({L"commit", L"--quiet", L"--only", L"-F", named.generic_wstring()}, files, L"Committing files");
    // Maintenance takes long, says nothing, and can wait for a fetch.
    command.settings = {L"maintenance.auto=false"};
    const std::string before = Head();
    try
    {
        const ProcessResult commit = Change(command);
        if (commit.Succeeded())
        {
            return {};
        }
        Lines words = GitRunner::Words(commit);
        if (!GitText::Lines(commit.errors).empty())
        {
            // A hook or a warning may have printed them. Git's own reason is in the output.
            const Lines output = GitText::Lines(commit.output);
            words.insert(words.end(), output.begin(), output.end());
        }
        throw GitFailure(std::move(words));
    }
    catch (const GitFailure& failure)
    {
        if (Head() == before)
        {
            throw;
        }
        Lines words{L"The commit is made, but what follows it was ended:"};
        words.insert(words.end(), failure.lines.begin(), failure.lines.end());
        return words;
    }
}

/// The last commit, read without Git, which does not run after a cancel. A commit writes a loose reference, except in a
/// repository of the reftable format, of which this knows nothing.
std::string GitRepository::Head() const
{
    constexpr std::string_view Branch = "ref: ";
    std::string head = ReadReference(m_gitFolder + L"\\HEAD");
    if (!head.starts_with(Branch))
    {
        return head;
    }
    std::wstring file = m_commonFolder + L'\\' + GitText::FromUtf8(head.substr(Branch.size()));
    std::replace(file.begin(), file.end(), L'/', L'\\');
    return ReadReference(file);
}

/// Pushes what is committed. Returns why it is not pushed, and nothing when it is: the commit stays.
GitRepository::Lines GitRepository::Push() const
{
    Lines words;
    try
    {
        const ProcessResult push =
            Change({.arguments = {L"push", L"--progress"}, .task = L"Pushing", .keepsIndex = true});
        if (push.Succeeded())
        {
            return {};
        }
        words = GitRunner::Words(push);
    }
    catch (const GitFailure& failure)
    {
        words = failure.lines;
    }
    words.insert(words.begin(), L"The commit is made, but it is not pushed:");
    return words;
}

/// The files among these that Git's attributes call lockable.
std::unordered_set<std::string> GitRepository::Lockable(const std::vector<std::string>& paths) const
{
    const std::string printed = m_runner.RunOrThrow({.arguments = {L"check-attr", L"-z", L"--stdin", L"lockable"},
                                                     .input = PathList(paths),
                                                     .isQuery = true,
                                                     .task = L"Reading attributes"});
    const std::vector<std::string_view> fields = GitText::Split(printed, '\0'); // path, attribute, value
    std::unordered_set<std::string> lockable;
    for (std::size_t i = 0; i + 2 < fields.size(); i += 3)
    {
        if (fields[i + 2] != "unspecified" && fields[i + 2] != "unset" && fields[i + 2] != "false")
        {
            lockable.emplace(fields[i]);
        }
    }
    return lockable;
}

void GitRepository::CheckOut(const Paths& paths)
{
    TakeSnapshot();
    const std::vector<std::string> files = Spelled(paths);
    const std::unordered_set<std::string> lockable = Lockable(files);
    if (!lockable.empty())
    {
        if (!m_locks.AreInUse())
        {
            m_locks.Reset(true);
        }
        m_locks.Refresh(m_runner);
    }
    std::vector<DWORD> attributes;
    m_runner.Work(L"Looking at the files", [&] {
        for (const std::string& file : files)
        {
            attributes.push_back(GetFileAttributesW(LongForm(Full(file)).c_str()));
        }
    });
    Lines failures;
    std::vector<std::size_t> ready;
    for (std::size_t i = 0; i < files.size() && !m_runner.IsCancelled(); ++i)
    {
        try
        {
            PrepareCheckOut(files[i], attributes[i], lockable.contains(files[i]));
            ready.push_back(i);
        }
        catch (const GitFailure& failure)
        {
            failures.insert(failures.end(), failure.lines.begin(), failure.lines.end());
        }
    }
    if (failures.empty() && ready.size() < files.size())
    {
        failures.emplace_back(GitRunner::Cancelled);
    }
    m_runner.Work(L"Making the files writable", [&] {
        for (const std::size_t i : ready)
        {
            const std::wstring full = Full(files[i]);
            if (SetFileAttributesW(LongForm(full).c_str(),
                                   attributes[i] & ~static_cast<DWORD>(FILE_ATTRIBUTE_READONLY)) != FALSE)
            {
                m_checkedOut.insert(files[i]);
            }
            else
            {
                failures.push_back(full + L" cannot be made writable: " + GitText::SystemMessage(GetLastError()));
            }
        }
    });
    if (!failures.empty())
    {
        throw GitFailure(std::move(failures));
    }
}

/// Takes the lock of a file when it is lockable. Throws when the file cannot be checked out.
void GitRepository::PrepareCheckOut(const std::string& file, unsigned long attributes, bool isLockable)
{
    const GitSnapshot::Entry* entry = m_snapshot->Find(file);
    if (entry == nullptr || !entry->second.isTracked)
    {
        throw GitFailure(Full(file) + NotControlled);
    }
    if (attributes == INVALID_FILE_ATTRIBUTES)
    {
        throw GitFailure(Full(file) + L" is not on the disk");
    }
    // Git LFS does not give back the lock of a file that has no commit.
    const GitStatus::File* change = entry->second.changed;
    if (isLockable && (change == nullptr || !change->IsAdded()))
    {
        m_locks.Take(m_runner, file);
    }
}

GitRepository::Lines GitRepository::GiveLocksBack(const std::vector<std::string>& paths)
{
    Lines failures;
    for (const std::string& path : paths)
    {
        try
        {
            m_locks.GiveBack(m_runner, path);
        }
        catch (const GitFailure& failure)
        {
            failures.insert(failures.end(), failure.lines.begin(), failure.lines.end());
            if (m_runner.IsCancelled())
            {
                break;
            }
        }
    }
    return failures;
}

void GitRepository::UndoCheckOut(const Paths& paths)
{
    TakeSnapshot();
    std::vector<std::string> files;
    std::vector<std::string> changed;
    std::vector<std::string> added;
    Lines failures;
    m_runner.Work(L"Looking at the paths", [&] {
        for (const std::wstring& path : paths)
        {
            const std::string file = Spelled(path);
            const GitSnapshot::Entry* entry = m_snapshot->Find(file);
            if (entry == nullptr || !entry->second.isTracked)
            {
                failures.push_back(path + NotControlled);
                continue;
            }
            files.push_back(file);
            const GitStatus::File* change = entry->second.changed;
            if (change != nullptr)
            {
                const bool isNew = change->kind == GitStatus::File::Kind::Changed && change->IsAdded();
                (isNew ? added : changed).push_back(file);
            }
        }
    });
    if (!changed.empty())
    {
        ChangeOrThrow(OnPaths({L"restore", L"--progress", L"--source=HEAD", L"--staged", L"--worktree"}, changed,
                              L"Bringing back the committed versions"));
    }
    if (!added.empty())
    {
        ChangeOrThrow(OnPaths({L"reset", L"--quiet"}, added, L"Taking added files out of the index"));
    }
    for (const std::string& file : files)
    {
        m_checkedOut.erase(file);
    }
    const Lines locked = GiveLocksBack(files);
    failures.insert(failures.end(), locked.begin(), locked.end());
    if (!failures.empty())
    {
        throw GitFailure(std::move(failures));
    }
}

/// Whether the upstream has a commit, as it was last fetched: that of an empty repository has none.
bool GitRepository::HasUpstreamCommit() const
{
    return m_runner
        .Run({.arguments = {L"rev-parse", L"--verify", L"--quiet", L"@{upstream}"},
              .isQuery = true,
              .task = L"Looking for the upstream"})
        .Succeeded();
}

void GitRepository::GetLatest(const Paths& paths)
{
    TakeSnapshot();
    const std::vector<std::string> files = Spelled(paths);
    if (!m_snapshot->Status().upstream.empty())
    {
        ChangeOrThrow({.arguments = {L"fetch", L"--progress"}, .task = L"Fetching", .keepsIndex = true});
        if (HasUpstreamCommit())
        {
            // A stash of the user's changes could end in a conflict: they stay as they are, and Git refuses.
            ChangeOrThrow(
                {.arguments = {L"merge", L"--progress", L"--no-stat", L"--no-autostash", L"--ff-only", L"@{upstream}"},
                 .task = L"Moving the branch forward"});
        }
    }
    const std::string deleted = m_runner.RunOrThrow(
        {.arguments = {L"ls-files", L"-z", L"--deleted"}, .isQuery = true, .task = L"Looking for missing files"});
    const std::vector<std::string_view> missing = GitText::Split(deleted, '\0');
    const std::unordered_set<std::string_view> isMissing(missing.begin(), missing.end());
    std::vector<std::string> restored;
    std::copy_if(files.begin(), files.end(), std::back_inserter(restored),
                 [&](const std::string& file) { return isMissing.contains(file); });
    if (!restored.empty())
    {
        ChangeOrThrow(OnPaths({L"restore", L"--progress", L"--worktree"}, restored, L"Bringing back missing files"));
    }
    m_locks.Refresh(m_runner);
}

GitRepository::Lines GitRepository::History(const Paths& paths)
{
    const std::vector<std::string> files = SpelledNow(paths);
    Lines lines;
    for (std::size_t i = 0; i < paths.size(); ++i)
    {
        const std::wstring& path = paths[i];
        const std::string printed =
            m_runner.RunOrThrow({.arguments = {L"log", L"--follow", L"--stdin", L"--no-show-signature", L"--date=iso",
                                               L"--format=%h  %ad  %an  %s"},
                                 .input = "--\n" + std::string(LiteralPath) + files[i] + '\n',
                                 .isQuery = true,
                                 .task = L"Reading the history of " + path});
        const Lines versions = GitText::Lines(printed);
        lines.push_back(versions.empty() ? path + NotControlled : path);
        for (const std::wstring& version : versions)
        {
            lines.push_back(L"  " + version);
        }
    }
    return lines;
}

GitRepository::Lines GitRepository::Properties(const std::wstring& path)
{
    TakeSnapshot();
    const std::string file = Spelled(path);
    const GitSnapshot::Entry* entry = m_snapshot->Find(file);
    if (entry == nullptr || !entry->second.isTracked)
    {
        throw GitFailure(path + NotControlled);
    }
    const GitStatus& status = m_snapshot->Status();
    const GitCommand commands[] = {
        {.arguments = {L"check-attr", L"-z", L"--stdin", L"--all"}, .input = file + '\0', .isQuery = true},
        {.arguments = {L"log", L"-1", L"--stdin", L"--no-show-signature", L"--date=iso", L"--format=%h  %ad  %an  %s"},
         .input = "--\n" + std::string(LiteralPath) + file + '\n',
         .isQuery = true,
         .task = L"Reading the properties of " + path}};
    const std::vector<ProcessResult> results = m_runner.RunAll(commands);

    const GitStatus::File* change = entry->second.changed;
    Lines lines{path, L"  state        " + (change != nullptr ? GitStatus::Word(*change) : L"as committed")};
    const Lines commit = GitText::Lines(results[1].Succeeded() ? results[1].output : "");
    lines.push_back(L"  last commit  " + (commit.empty() ? L"none" : commit.front()));
    lines.push_back(L"  branch       " + status.branch);
    lines.push_back(L"  upstream     " + (status.upstream.empty()
                                              ? L"none"
                                              : status.upstream + L", " + std::to_wstring(status.ahead) + L" ahead, " +
                                                    std::to_wstring(status.behind) + L" behind"));
    const std::vector<std::string_view> fields = GitText::Split(results[0].output, '\0');
    for (std::size_t i = 0; i + 2 < fields.size(); i += 3)
    {
        lines.push_back(L"  attribute    " + GitText::FromUtf8(fields[i + 1]) + L": " +
                        GitText::FromUtf8(fields[i + 2]));
    }
    if (const GitLocks::Lock* lock = m_locks.Find(file))
    {
        lines.push_back(L"  locked by    " + (lock->isOurs ? L"you" : lock->owner));
    }
    return lines;
}

void GitRepository::RunClient() const
{
    const bool isGui = m_client.empty();
    const std::wstring& program = isGui ? m_runner.Program() : m_client;
    if (!std::filesystem::path(program).is_absolute())
    {
        throw GitFailure(L"The setting orvix.client of Git does not name a program by its full path: " + program);
    }
    m_runner.Work(L"Starting " + program, [&] {
        Process::StartAlone(program, isGui ? std::vector<std::wstring>{L"gui"} : std::vector<std::wstring>{},
                            m_top + L'\\', GitRunner::NoRepository());
    });
}
