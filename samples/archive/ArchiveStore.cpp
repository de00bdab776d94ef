#include "ArchiveStore.h"

#include "ArchiveLock.h"
#include "ArchivePaths.h"
#include "ArchiveText.h"

#include <algorithm>
#include <unordered_set>

namespace
{

/// Which version of a record the file on disk has.
enum class Local
{
    Missing,
    Latest,
    Older,
    Other,
};

/// How a file is compared: an equal size and time are enough, or the contents are read.
enum class Comparison
{
    SizeAndTime,
    Contents,
};

ArchiveFailure Failure(ArchiveError error, const std::wstring& reason)
{
    return {error, reason, {}};
}

ArchiveFailure NoProject()
{
    return Failure(ArchiveError::NotOpen, L"No project is open");
}

ArchiveFiles::UniqueHandle OpenToRead(const std::wstring& path, DWORD share)
{
    ArchiveFiles::UniqueHandle file = ArchiveFiles::Open(path, GENERIC_READ, share, OPEN_EXISTING);
    if (!file)
    {
        ArchiveFiles::ThrowLastError(L"The file cannot be opened");
    }
    return file;
}

bool IsSameUser(const std::wstring& one, const std::wstring& other)
{
    return ArchiveText::Fold(one) == ArchiveText::Fold(other);
}

} // namespace

/// One command: the project, and the paths that were resolved so far.
class ArchiveStore::Session
{
public:
    explicit Session(const Project& project) : m_project(project), m_paths(project.folder, project.archive.Path()) {}

    ArchiveTarget Resolve(const std::wstring& file) { return m_paths.Resolve(file); }

    std::optional<ArchiveRecord> Find(const ArchiveTarget& target) const { return m_project.archive.Load(target); }

    ArchiveRecord Load(const ArchiveTarget& target) const
    {
        if (std::optional<ArchiveRecord> record = Find(target))
        {
            return *record;
        }
        throw Failure(ArchiveError::NotControlled, L"Not controlled");
    }

    void Save(const ArchiveTarget& target, const ArchiveRecord& record) const
    {
        m_project.archive.Save(target, record);
    }

    bool IsMine(const ArchiveRecord& record) const
    {
        return record.checkOut && IsSameUser(record.checkOut->user, m_project.user);
    }

    bool IsOthers(const ArchiveRecord& record) const { return record.checkOut && !IsMine(record); }

    void RefuseOthers(const ArchiveRecord& record) const
    {
        if (IsOthers(record))
        {
            throw Failure(ArchiveError::CheckedOutByOther, L"Checked out by " + record.checkOut->user);
        }
    }

    void RequireMine(const ArchiveRecord& record) const
    {
        RefuseOthers(record);
        if (!record.checkOut)
        {
            throw Failure(ArchiveError::NotCheckedOut, L"Not checked out");
        }
    }

    ArchiveCheckOut NewCheckOut(const std::wstring& comment) const
    {
        return {ArchiveText::Now(), m_project.user, comment};
    }

    /// Stores the contents on disk as a new version.
    ArchiveVersion StoreVersion(const ArchiveTarget& target, const std::wstring& comment) const
    {
        if (!target.entry)
        {
            throw Failure(ArchiveError::NoSuchFile, L"No such file");
        }
        const ArchiveFiles::UniqueHandle file = OpenToRead(target.path, FILE_SHARE_READ);
        const ArchiveFiles::Contents contents = m_project.archive.Store(file.get());
        return {ArchiveText::Now(), m_project.user, contents.sha256, contents.size, contents.lastWrite, comment};
    }

    /// Replaces the file on disk by the latest version.
    void WriteLatest(ArchiveTarget& target, const ArchiveRecord& record, bool readOnly) const
    {
        if (!target.entry)
        {
            m_paths.MakeFolders(target);
        }
        const std::size_t separator = target.path.rfind(L'\\');
        const ArchiveFiles::TemporaryFile copy(
            target.path.substr(0, separator + 1).append(ArchivePaths::TemporaryName));
        m_project.archive.Fetch(record.Latest(), copy.Path());
        ArchiveFiles::Replace(copy.Path(), target.path);
        ArchiveFiles::SetReadOnly(target.path, readOnly);
        target.entry = ArchiveFiles::Find(target.path);
    }

    void GetLatest(ArchiveTarget& target, const ArchiveRecord& record) const;

    ArchiveStatus StatusOf(const ArchiveTarget& target) const;

    static Local Compare(const ArchiveTarget& target, const ArchiveRecord& record, Comparison comparison);

private:
    const Project& m_project;
    ArchivePaths m_paths;
};

Local ArchiveStore::Session::Compare(const ArchiveTarget& target, const ArchiveRecord& record, Comparison comparison)
{
    if (!target.entry)
    {
        return Local::Missing;
    }
    const ArchiveFiles::Entry& entry = *target.entry;

    const auto findNewest = [&](auto isEqual) {
        const auto found = std::find_if(record.versions.rbegin(), record.versions.rend(), isEqual);
        if (found == record.versions.rend())
        {
            return Local::Other;
        }
        return found == record.versions.rbegin() ? Local::Latest : Local::Older;
    };
    const auto hasSize = [&](const ArchiveVersion& version) { return version.size == entry.size; };
    const Local byTime = findNewest(
        [&](const ArchiveVersion& version) { return hasSize(version) && version.lastWrite == entry.lastWrite; });
    if (comparison == Comparison::SizeAndTime && byTime != Local::Other)
    {
        return byTime;
    }
    if (findNewest(hasSize) == Local::Other)
    {
        return Local::Other;
    }

    const ArchiveFiles::UniqueHandle file =
        OpenToRead(target.path, FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE);
    const std::string sha256 = ArchiveFiles::Read(file.get()).sha256;
    return findNewest([&](const ArchiveVersion& version) { return version.sha256 == sha256; });
}

void ArchiveStore::Session::GetLatest(ArchiveTarget& target, const ArchiveRecord& record) const
{
    Local local = Compare(target, record, Comparison::SizeAndTime);
    if (local == Local::Missing)
    {
        return WriteLatest(target, record, !IsMine(record));
    }
    if (IsMine(record))
    {
        return;
    }

    const bool mayBeOthersCopy = IsOthers(record) && !target.entry->IsReadOnly();
    if (local == Local::Latest)
    {
        if (!mayBeOthersCopy)
        {
            ArchiveFiles::SetReadOnly(target.path, true);
        }
        return;
    }
    if (local == Local::Older)
    {
        local = Compare(target, record, Comparison::Contents);
    }
    if (local == Local::Other || mayBeOthersCopy)
    {
        throw Failure(ArchiveError::Modified, L"Changed on disk without a check-out, so it is not overwritten");
    }
    WriteLatest(target, record, true);
}

ArchiveStatus ArchiveStore::Session::StatusOf(const ArchiveTarget& target) const
{
    ArchiveStatus status;
    status.missing = !target.entry;
    const std::optional<ArchiveRecord> record = Find(target);
    if (!record)
    {
        return status;
    }
    status.controlled = true;
    status.checkedOut = IsMine(*record);
    status.checkedOutByOther = IsOthers(*record);

    Local local = Local::Other;
    try
    {
        local = Compare(target, *record, Comparison::SizeAndTime);
    }
    catch (const ArchiveFailure&)
    {
        // Another program has the file open, and the file's size or time has changed.
    }
    status.outOfDate = local == Local::Missing || (local == Local::Older && !status.checkedOut);
    status.modified = local == Local::Other || (local == Local::Older && status.checkedOut);
    return status;
}

ArchiveFailures ArchiveStore::Open(const std::wstring& projectFolder, const std::wstring& user)
{
    Close();
    try
    {
        if (user.empty() || !ArchiveText::IsValid(user))
        {
            throw Failure(ArchiveError::Access, L"The name of the user is not valid");
        }
        const std::wstring folder = ArchivePaths::FindFolder(projectFolder);
        if (ArchivePaths::IsReserved(folder))
        {
            throw Failure(ArchiveError::InvalidPath, L"An archive is not a project");
        }
        m_project = Project{folder, ArchiveFolder(folder, m_lockWait), user};
    }
    catch (const ArchiveFailure& failure)
    {
        return {failure};
    }
    return {};
}

ArchiveFailures ArchiveStore::Find(const std::wstring& projectFolder, bool& isProject)
{
    isProject = false;
    try
    {
        isProject = ArchiveFolder::Exists(ArchivePaths::FindFolder(projectFolder));
    }
    catch (const ArchiveFailure& failure)
    {
        return {failure};
    }
    return {};
}

std::wstring ArchiveStore::ArchivePath() const
{
    return m_project ? ArchivePaths::ShortForm(m_project->archive.Path()) : L"";
}

template <typename Work>
ArchiveFailures ArchiveStore::ForEachFile(std::span<const std::wstring> files, bool withLock, Work work) const
{
    ArchiveFailures failures;
    try
    {
        if (!m_project)
        {
            throw NoProject();
        }
        std::optional<ArchiveLock> lock;
        if (withLock)
        {
            lock.emplace(m_project->archive.LockFile(), m_lockWait);
        }

        Session session(*m_project);
        std::unordered_set<std::string> done;
        for (const std::wstring& file : files)
        {
            try
            {
                ArchiveTarget target = session.Resolve(file);
                if (done.insert(target.key).second)
                {
                    work(session, target);
                }
            }
            catch (ArchiveFailure& failure)
            {
                failure.file = file;
                failures.push_back(std::move(failure));
            }
        }
    }
    catch (ArchiveFailure& failure)
    {
        failures.push_back(std::move(failure));
    }
    return failures;
}

ArchiveFailures ArchiveStore::Add(std::span<const std::wstring> files, const std::wstring& comment, bool keepCheckedOut)
{
    return ForEachFile(files, true, [&](Session& session, ArchiveTarget& target) {
        if (session.Find(target))
        {
            throw Failure(ArchiveError::AlreadyControlled, L"Already controlled");
        }
        ArchiveRecord record;
        record.path = target.relative;
        record.versions.push_back(session.StoreVersion(target, comment));
        if (keepCheckedOut)
        {
            record.checkOut = session.NewCheckOut(comment);
        }
        session.Save(target, record);
        ArchiveFiles::SetReadOnly(target.path, !keepCheckedOut);
    });
}

ArchiveFailures ArchiveStore::CheckOut(std::span<const std::wstring> files, const std::wstring& comment, bool getLatest)
{
    return ForEachFile(files, true, [&](Session& session, ArchiveTarget& target) {
        ArchiveRecord record = session.Load(target);
        session.RefuseOthers(record);

        ArchiveFailure outOfDate =
            Failure(ArchiveError::OutOfDate, L"Not the latest version on disk; get the latest version first");
        if (getLatest)
        {
            try
            {
                session.GetLatest(target, record);
            }
            catch (const ArchiveFailure& failure)
            {
                outOfDate = failure;
            }
        }

        const bool isMine = session.IsMine(record);
        const Local local = Session::Compare(target, record, Comparison::SizeAndTime);
        if (local == Local::Missing || (local == Local::Older && !isMine))
        {
            throw outOfDate;
        }
        if (!isMine)
        {
            record.checkOut = session.NewCheckOut(comment);
            session.Save(target, record);
        }
        ArchiveFiles::SetReadOnly(target.path, false);
    });
}

ArchiveFailures ArchiveStore::CheckIn(std::span<const std::wstring> files, const std::wstring& comment,
                                      bool keepCheckedOut)
{
    return ForEachFile(files, true, [&](Session& session, ArchiveTarget& target) {
        ArchiveRecord record = session.Load(target);
        session.RequireMine(record);
        record.versions.push_back(session.StoreVersion(target, comment));
        if (!keepCheckedOut)
        {
            record.checkOut.reset();
        }
        session.Save(target, record);
        ArchiveFiles::SetReadOnly(target.path, !keepCheckedOut);
    });
}

ArchiveFailures ArchiveStore::UndoCheckOut(std::span<const std::wstring> files)
{
    return ForEachFile(files, true, [](Session& session, ArchiveTarget& target) {
        ArchiveRecord record = session.Load(target);
        session.RequireMine(record);

        // Only the user with the check-out can store a version, so the latest is the one that was checked out.
        if (Session::Compare(target, record, Comparison::Contents) == Local::Latest)
        {
            ArchiveFiles::SetReadOnly(target.path, true);
        }
        else
        {
            session.WriteLatest(target, record, true);
        }
        record.checkOut.reset();
        session.Save(target, record);
    });
}

ArchiveFailures ArchiveStore::GetLatest(std::span<const std::wstring> files)
{
    return ForEachFile(
        files, true, [](Session& session, ArchiveTarget& target) { session.GetLatest(target, session.Load(target)); });
}

ArchiveFailures ArchiveStore::History(std::span<const std::wstring> files, std::vector<ArchiveRecord>& records) const
{
    records.clear();
    return ForEachFile(files, false,
                       [&](Session& session, ArchiveTarget& target) { records.push_back(session.Load(target)); });
}

ArchiveFailures ArchiveStore::Status(std::span<const std::wstring> files, std::vector<ArchiveStatus>& statuses) const
{
    statuses.clear();
    if (!m_project)
    {
        return {NoProject()};
    }

    Session session(*m_project);
    ArchiveFailures failures;
    for (const std::wstring& file : files)
    {
        try
        {
            statuses.push_back(session.StatusOf(session.Resolve(file)));
        }
        catch (ArchiveFailure& failure)
        {
            statuses.emplace_back().ownFile = failure.error == ArchiveError::OwnFile;
            if (failure.error == ArchiveError::OwnFile || failure.error == ArchiveError::InvalidPath)
            {
                continue;
            }
            failure.file = file;
            failures.push_back(std::move(failure));
        }
    }
    if (!failures.empty())
    {
        statuses.clear();
    }
    return failures;
}

ArchiveFailures ArchiveStore::List(const std::wstring& folder, bool withSubfolders,
                                   std::vector<std::wstring>& files) const
{
    files.clear();
    if (!m_project)
    {
        return {NoProject()};
    }

    ArchiveFailures failures;
    try
    {
        const std::wstring inside =
            ArchiveText::Fold(ArchivePaths(m_project->folder, m_project->archive.Path()).RelativeFolder(folder));
        const std::wstring above = folder.substr(0, folder.find_last_not_of(L"\\/") + 1) + L'\\';
        for (const std::wstring& path : m_project->archive.List(failures))
        {
            std::wstring rest = path.substr(std::min(path.size(), inside.size()));
            if (!ArchiveText::Fold(path).starts_with(inside) ||
                (!withSubfolders && rest.find(L'/') != std::wstring::npos))
            {
                continue;
            }
            std::replace(rest.begin(), rest.end(), L'/', L'\\');
            files.push_back(above + rest);
        }
        std::sort(files.begin(), files.end());
    }
    catch (ArchiveFailure& failure)
    {
        failure.file = folder;
        failures.push_back(std::move(failure));
    }
    return failures;
}
