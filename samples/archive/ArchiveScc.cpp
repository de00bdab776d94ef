#include "ArchiveScc.h"

#include "ArchiveText.h"

#include <algorithm>
#include <cstring>
#include <span>
#include <unordered_set>

namespace
{

constexpr SCCRTN BadArgument = SCC_E_NONSPECIFICERROR;

std::wstring Text(LPCSTR text)
{
    return text != nullptr ? ArchiveText::FromAnsi(text) : L"";
}

/// The text in a buffer of the host. The terminator may be missing.
std::wstring TextIn(LPCSTR buffer, std::size_t size)
{
    return ArchiveText::FromAnsi({buffer, strnlen(buffer, size)});
}

/// True when the ANSI code page has all characters of a text.
bool IsAnsi(const std::wstring& text)
{
    return ArchiveText::FromAnsi(ArchiveText::ToAnsi(text)) == text;
}

/// The failure for the name of a file that the ANSI code page does not have.
ArchiveFailure NotAnsi(const std::wstring& file)
{
    return {ArchiveError::InvalidPath, L"The name has a character that is not in the ANSI code page", file};
}

void Put(LPSTR buffer, const std::string& bytes)
{
    std::memcpy(buffer, bytes.c_str(), bytes.size() + 1);
}

/// Writes a text. If it does not fit into the buffer, characters at its end are left out.
void PutCut(LPSTR buffer, std::size_t size, std::wstring_view text)
{
    std::string bytes = ArchiveText::ToAnsi(text);
    while (bytes.size() >= size)
    {
        text.remove_suffix(text.size() > 1 && IS_LOW_SURROGATE(text.back()) ? 2 : 1);
        bytes = ArchiveText::ToAnsi(text);
    }
    Put(buffer, bytes);
}

/// Writes a text that must not change. If it does not fit, or is not in the ANSI code page, an empty one is written.
void PutWhole(LPSTR buffer, std::size_t size, const std::wstring& text)
{
    const std::string bytes = ArchiveText::ToAnsi(text);
    Put(buffer, bytes.size() < size && IsAnsi(text) ? bytes : "");
}

/// The user that the host names. Otherwise the user of the Windows session, whose name is written to the host's
/// buffer.
std::wstring UserOf(LPSTR user)
{
    std::wstring name = TextIn(user, SCC_USER_SIZE);
    if (name.empty())
    {
        name = ArchiveReport::WindowsUser();
        PutWhole(user, SCC_USER_SIZE, name);
    }
    return name;
}

void PutAuxPath(LPSTR auxPath)
{
    PutCut(auxPath, SCC_PRJPATH_SIZE, ArchivePaths::ArchiveName);
}

std::wstring_view LastName(std::wstring_view folder)
{
    folder = folder.substr(0, folder.find_last_not_of(L"\\/") + 1);
    return folder.substr(folder.find_last_of(L"\\/") + 1);
}

SCCRTN ResultOf(ArchiveError error)
{
    switch (error)
    {
    case ArchiveError::NotOpen:
        return SCC_E_PROJNOTOPEN;
    case ArchiveError::InvalidPath:
    case ArchiveError::OwnFile:
        return SCC_E_INVALIDFILEPATH;
    case ArchiveError::NoSuchFile:
        return SCC_E_FILENOTEXIST;
    case ArchiveError::NotControlled:
        return SCC_E_FILENOTCONTROLLED;
    case ArchiveError::AlreadyControlled:
        return SCC_E_FILEALREADYEXISTS;
    case ArchiveError::CheckedOutByOther:
        return SCC_E_FILEOUTEXCLUSIVE;
    case ArchiveError::NotCheckedOut:
        return SCC_E_NOTCHECKEDOUT;
    case ArchiveError::OutOfDate:
    case ArchiveError::Modified:
        return SCC_E_OPNOTPERFORMED;
    case ArchiveError::Access:
    case ArchiveError::Busy:
        return SCC_E_ACCESSFAILURE;
    case ArchiveError::Damaged:
        break;
    }
    return SCC_E_NONSPECIFICERROR;
}

/// A file is checked out by one user at most, and so always exclusively. The interface has no bit for a file that
/// cannot be added: the archive's own files are not controlled, as new files are, and `SccAdd` refuses them.
LONG StatusOf(const ArchiveStatus& status)
{
    if (!status.controlled)
    {
        return SCC_STATUS_NOTCONTROLLED;
    }
    LONG bits = SCC_STATUS_CONTROLLED;
    if (status.checkedOut)
    {
        bits |= SCC_STATUS_CHECKEDOUT | SCC_STATUS_OUTBYUSER | SCC_STATUS_OUTEXCLUSIVE;
    }
    if (status.checkedOutByOther)
    {
        bits |= SCC_STATUS_OUTOTHER | SCC_STATUS_OUTEXCLUSIVE;
    }
    if (status.outOfDate)
    {
        bits |= SCC_STATUS_OUTOFDATE;
    }
    if (status.modified)
    {
        bits |= SCC_STATUS_MODIFIED;
    }
    return bits;
}

/// Whether a command is for files of this status. A command that the archive does not have is for none.
bool IsFor(SCCCOMMAND command, LONG status)
{
    switch (command)
    {
    case SCC_COMMAND_GET:
    case SCC_COMMAND_HISTORY:
    case SCC_COMMAND_PROPERTIES:
        return (status & SCC_STATUS_CONTROLLED) != 0;
    case SCC_COMMAND_CHECKOUT:
        return (status & SCC_STATUS_CONTROLLED) != 0 && (status & SCC_STATUS_OUTEXCLUSIVE) == 0;
    case SCC_COMMAND_CHECKIN:
    case SCC_COMMAND_UNCHECKOUT:
        return (status & SCC_STATUS_CHECKEDOUT) != 0;
    case SCC_COMMAND_ADD:
        return (status & SCC_STATUS_CONTROLLED) == 0;
    case SCC_COMMAND_OPTIONS:
        break;
    }
    return false;
}

void Append(ArchiveFailures& failures, ArchiveFailures more)
{
    std::move(more.begin(), more.end(), std::back_inserter(failures));
}

} // namespace

SCCRTN ArchiveScc::OpenProject(LPSTR user, LPCSTR projectName, LPCSTR localPath, LPSTR auxPath, LPTEXTOUTPROC output,
                               LONG flags)
{
    if (user == nullptr || projectName == nullptr || localPath == nullptr || auxPath == nullptr)
    {
        return BadArgument;
    }
    if (m_store.IsOpen())
    {
        return SCC_E_PROJECTALREADYOPEN;
    }
    m_output = output;
    m_folder = Text(localPath);
    m_user = UserOf(user);

    bool isProject = false;
    if (const ArchiveFailures failures = ArchiveStore::Find(m_folder, isProject); !failures.empty())
    {
        return Report(failures);
    }
    const bool wasChosen = m_folder == m_newFolder;
    if (!isProject && (!wasChosen || (flags & SCC_OP_CREATEIFNEW) == 0))
    {
        m_refusedFolder = m_folder;
        return wasChosen || (flags & SCC_OP_SILENTOPEN) != 0 ? SCC_E_UNKNOWNPROJECT : SCC_E_PROJSYNTAXERR;
    }
    const SCCRTN result = Report(m_store.Open(m_folder, m_user));
    if (result == SCC_OK)
    {
        PutAuxPath(auxPath);
        m_refusedFolder.clear();
        m_newFolder.clear();
    }
    return result;
}

SCCRTN ArchiveScc::CloseProject()
{
    const bool wasOpen = m_store.IsOpen();
    m_store.Close();
    m_output = nullptr;
    return wasOpen ? SCC_OK : SCC_E_PROJNOTOPEN;
}

SCCRTN ArchiveScc::GetProjPath(LPSTR user, LPSTR projectName, LPSTR localPath, LPSTR auxPath, BOOL allowChangePath,
                               LPBOOL isNew)
{
    if (user == nullptr || projectName == nullptr || localPath == nullptr || auxPath == nullptr || isNew == nullptr)
    {
        return BadArgument;
    }
    // The local path of the host may belong to an earlier project.
    const bool wasRefused = allowChangePath != 0 && !m_refusedFolder.empty();
    const std::wstring folder = wasRefused ? m_refusedFolder : TextIn(localPath, MAX_PATH);
    if (folder.empty())
    {
        return SCC_E_OPNOTPERFORMED;
    }

    bool isProject = false;
    if (const ArchiveFailures failures = ArchiveStore::Find(folder, isProject); !failures.empty())
    {
        return Report(failures);
    }
    if (!isProject && !*isNew)
    {
        return SCC_E_UNKNOWNPROJECT;
    }
    *isNew = isProject ? FALSE : TRUE;
    m_newFolder = isProject ? L"" : folder;
    m_refusedFolder.clear();

    UserOf(user);
    PutCut(projectName, SCC_PRJPATH_SIZE, LastName(folder));
    PutAuxPath(auxPath);
    if (wasRefused)
    {
        PutWhole(localPath, MAX_PATH, folder);
    }
    return SCC_OK;
}

/// Calls `work` with the paths of the files. There must be at least one.
template <typename Work>
SCCRTN ArchiveScc::FileOperation(LONG count, LPCSTR* names, Work work)
{
    if (count <= 0 || names == nullptr)
    {
        return BadArgument;
    }
    const std::span all(names, static_cast<std::size_t>(count));
    if (std::find(all.begin(), all.end(), nullptr) != all.end())
    {
        return BadArgument;
    }
    if (!m_store.IsOpen())
    {
        return SCC_E_PROJNOTOPEN;
    }
    Paths paths(all.size());
    std::transform(all.begin(), all.end(), paths.begin(), Text);
    return work(paths);
}

/// When the paths are folders, replaces them by the paths of the controlled files in them.
ArchiveFailures ArchiveScc::Expand(Paths& paths, LONG options) const
{
    ArchiveFailures failures;
    if ((options & SCC_GET_ALL) == 0)
    {
        return failures;
    }
    Paths all;
    Paths files;
    for (const std::wstring& folder : paths)
    {
        Append(failures, m_store.List(folder, (options & SCC_GET_RECURSIVE) != 0, files));
        std::move(files.begin(), files.end(), std::back_inserter(all));
    }
    paths = std::move(all);
    return failures;
}

SCCRTN ArchiveScc::Get(LONG count, LPCSTR* names, LONG options)
{
    return FileOperation(count, names, [&](Paths& paths) {
        ArchiveFailures failures = Expand(paths, options);
        Append(failures, m_store.GetLatest(paths));
        return Report(failures);
    });
}

SCCRTN ArchiveScc::Checkout(LONG count, LPCSTR* names, LPCSTR comment, LONG options)
{
    return FileOperation(count, names, [&](Paths& paths) {
        ArchiveFailures failures = Expand(paths, options);
        Append(failures, m_store.CheckOut(paths, Text(comment), false));
        return Report(failures);
    });
}

SCCRTN ArchiveScc::Uncheckout(LONG count, LPCSTR* names)
{
    return FileOperation(count, names, [&](const Paths& paths) { return Report(m_store.UndoCheckOut(paths)); });
}

SCCRTN ArchiveScc::Checkin(LONG count, LPCSTR* names, LPCSTR comment, LONG options)
{
    return FileOperation(count, names, [&](const Paths& paths) {
        return Report(m_store.CheckIn(paths, Text(comment), (options & SCC_KEEP_CHECKEDOUT) != 0));
    });
}

SCCRTN ArchiveScc::Add(LONG count, LPCSTR* names, LPCSTR comment, const LONG* options)
{
    if (options == nullptr)
    {
        return BadArgument;
    }
    return FileOperation(count, names, [&](const Paths& paths) {
        ArchiveFailures failures;
        for (const LONG kept : {0L, SCC_KEEP_CHECKEDOUT})
        {
            Paths files;
            for (std::size_t i = 0; i < paths.size(); ++i)
            {
                if ((options[i] & SCC_KEEP_CHECKEDOUT) == kept)
                {
                    files.push_back(paths[i]);
                }
            }
            if (!files.empty())
            {
                Append(failures, m_store.Add(files, Text(comment), kept != 0));
            }
        }
        return Report(failures);
    });
}

SCCRTN ArchiveScc::History(LONG count, LPCSTR* names)
{
    return FileOperation(count, names, [&](const Paths& paths) {
        std::vector<ArchiveRecord> records;
        const SCCRTN result = Report(m_store.History(paths, records));
        for (const ArchiveRecord& record : records)
        {
            if (!Output(ArchiveReport::History(record), SCC_MSG_INFO))
            {
                return SCC_I_OPERATIONCANCELED;
            }
        }
        return result;
    });
}

SCCRTN ArchiveScc::Properties(LPCSTR name)
{
    return FileOperation(1, &name, [&](const Paths& paths) {
        std::vector<ArchiveRecord> records;
        const SCCRTN result = Report(m_store.History(paths, records));
        for (const ArchiveRecord& record : records)
        {
            Output(ArchiveReport::Properties(record), SCC_MSG_INFO);
        }
        return result;
    });
}

SCCRTN ArchiveScc::QueryInfo(LONG count, LPCSTR* names, LPLONG status)
{
    if (status == nullptr)
    {
        return BadArgument;
    }
    std::fill_n(status, std::max(count, 0L), SCC_STATUS_INVALID);
    return FileOperation(count, names, [&](const Paths& paths) {
        std::vector<ArchiveStatus> statuses;
        const SCCRTN result = Report(m_store.Status(paths, statuses));
        std::transform(statuses.begin(), statuses.end(), status, StatusOf);
        return result;
    });
}

SCCRTN ArchiveScc::PopulateList(SCCCOMMAND command, LONG count, LPCSTR* names, POPLISTFUNC callback, LPVOID callerData,
                                LPLONG status, LONG options)
{
    if (callback == nullptr || status == nullptr)
    {
        return BadArgument;
    }
    if ((options & SCC_PL_DIR) != 0)
    {
        std::fill_n(status, std::max(count, 0L), SCC_STATUS_INVALID);
        return PopulateFromFolders(command, count, names, callback, callerData);
    }
    const SCCRTN result = QueryInfo(count, names, status);
    if (result != SCC_OK)
    {
        return result;
    }
    for (LONG i = 0; i < count; ++i)
    {
        std::string name = names[i];
        if (!IsFor(command, status[i]) && !callback(callerData, FALSE, status[i], name.data()))
        {
            return SCC_I_OPERATIONCANCELED;
        }
    }
    return SCC_OK;
}

/// Adds the controlled files in and below folders to the list of the host.
SCCRTN ArchiveScc::PopulateFromFolders(SCCCOMMAND command, LONG count, LPCSTR* names, POPLISTFUNC callback,
                                       LPVOID callerData)
{
    return FileOperation(count, names, [&](Paths& paths) {
        ArchiveFailures failures = Expand(paths, SCC_GET_ALL | SCC_GET_RECURSIVE);
        std::vector<ArchiveStatus> statuses;
        Append(failures, m_store.Status(paths, statuses));
        for (std::size_t i = 0; i < statuses.size(); ++i)
        {
            const LONG status = StatusOf(statuses[i]);
            if (!IsFor(command, status))
            {
                continue;
            }
            if (!IsAnsi(paths[i]))
            {
                failures.push_back(NotAnsi(paths[i]));
                continue;
            }
            std::string name = ArchiveText::ToAnsi(paths[i]);
            if (!callback(callerData, TRUE, status, name.data()))
            {
                return SCC_I_OPERATIONCANCELED;
            }
        }
        return Report(failures);
    });
}

SCCRTN ArchiveScc::RunScc()
{
    Output({L"The archive has no program of its own"}, SCC_MSG_ERROR);
    return SCC_E_OPNOTSUPPORTED;
}

SCCRTN ArchiveScc::GetCommandOptions(SCCCOMMAND command, LPCMDOPTS* block)
{
    if (command != SCC_COMMAND_OPTIONS)
    {
        return SCC_E_OPNOTSUPPORTED;
    }
    if (block == nullptr)
    {
        return SCC_I_ADV_SUPPORT;
    }
    if (!m_store.IsOpen())
    {
        return SCC_E_PROJNOTOPEN;
    }
    Output({L"archive  " + m_store.ArchivePath(), L"user     " + m_user}, SCC_MSG_INFO);
    return SCC_OK;
}

SCCRTN ArchiveScc::AddFromScc(LPLONG count, LPCSTR** names)
{
    // The host may name the folder in the array that the last call returned, so the folder is copied first.
    const bool hasFolder =
        count != nullptr && names != nullptr && *count == 1 && *names != nullptr && **names != nullptr;
    const std::wstring folder = hasFolder ? Text(**names) : m_folder;
    m_addedFiles.clear();
    m_addedNames.clear();
    if (count == nullptr)
    {
        return SCC_OK;
    }
    if (names == nullptr)
    {
        return BadArgument;
    }
    *count = 0;
    *names = nullptr;
    if (!m_store.IsOpen())
    {
        return SCC_E_PROJNOTOPEN;
    }

    ArchiveFailures failures;
    const Paths missing = FindMissing(folder, failures);
    Append(failures, GetAndName(missing));
    *count = static_cast<LONG>(m_addedNames.size());
    *names = m_addedNames.empty() ? nullptr : m_addedNames.data();
    return Report(failures);
}

/// The files of a folder that are in the archive and not on disk. A file whose name is not in the ANSI code page is a
/// failure.
ArchiveScc::Paths ArchiveScc::FindMissing(const std::wstring& folder, ArchiveFailures& failures) const
{
    Paths files;
    Append(failures, m_store.List(folder, true, files));
    std::vector<ArchiveStatus> statuses;
    Append(failures, m_store.Status(files, statuses));
    Paths missing;
    for (std::size_t i = 0; i < statuses.size(); ++i)
    {
        if (!statuses[i].missing)
        {
            continue;
        }
        if (IsAnsi(files[i]))
        {
            missing.push_back(files[i]);
        }
        else
        {
            failures.push_back(NotAnsi(files[i]));
        }
    }
    return missing;
}

/// Gets files and stores the names of those that did not fail, for `AddFromScc`.
ArchiveFailures ArchiveScc::GetAndName(const Paths& files)
{
    ArchiveFailures failures = m_store.GetLatest(files);
    std::unordered_set<std::wstring> failed;
    for (const ArchiveFailure& failure : failures)
    {
        failed.insert(failure.file);
    }
    if (failed.contains(L"")) // the whole command
    {
        return failures;
    }
    for (const std::wstring& file : files)
    {
        if (!failed.contains(file))
        {
            m_addedFiles.push_back(ArchiveText::ToAnsi(file));
        }
    }
    std::transform(m_addedFiles.begin(), m_addedFiles.end(), std::back_inserter(m_addedNames),
                   [](const std::string& file) { return file.c_str(); });
    return failures;
}

SCCRTN ArchiveScc::SetOption(LONG option)
{
    return option == SCC_OPT_SHARESUBPROJ ? SCC_I_SHARESUBPROJOK : SCC_E_OPNOTSUPPORTED;
}

/// Shows the failures and returns the result of the operation.
SCCRTN ArchiveScc::Report(const ArchiveFailures& failures) const
{
    for (const ArchiveFailure& failure : failures)
    {
        if (!Output(ArchiveReport::Failure(failure), SCC_MSG_ERROR))
        {
            break;
        }
    }
    return failures.empty() ? SCC_OK : ResultOf(failures.front().error);
}

/// False when the host wants no more lines.
bool ArchiveScc::Output(const ArchiveReport::Lines& lines, LONG kind) const
{
    return std::all_of(lines.begin(), lines.end(), [&](const std::wstring& line) {
        return m_output == nullptr || m_output(ArchiveText::ToAnsi(line).c_str(), kind) != SCC_MSG_RTN_CANCEL;
    });
}
