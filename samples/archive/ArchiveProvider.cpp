#include "ArchiveProvider.h"

#include "ArchiveBarrier.h"
#include "IOrvixClientAccess.h"
#include "OrvixClientInfo.h"
#include "OrvixFileEntry.h"
#include "OrvixFileFlags.h"
#include "OrvixFileList.h"
#include "OrvixProviderOption.h"

#include <algorithm>
#include <span>

namespace
{

using OrvixProviderResult::Failure;
using OrvixProviderResult::Success;

std::wstring Text(const wchar_t* text)
{
    return text != nullptr ? text : L"";
}

bool KeepsCheckedOut(unsigned long options)
{
    return (options & OrvixProviderOption::KeepCheckedOut) != 0;
}

bool GetsLatest(unsigned long options)
{
    return (options & OrvixProviderOption::GetLatest) != 0;
}

/// The flags of `QueryStatus` for a file of an open project.
unsigned long FlagsOf(const ArchiveStatus& status)
{
    if (!status.controlled)
    {
        return OrvixFileState::NotControlled | (status.ownFile ? 0 : OrvixFilePermission::Add);
    }
    unsigned long flags =
        OrvixFileState::Controlled | OrvixFilePermission::GetLatest | OrvixFilePermission::ShowHistory;
    const auto setWhen = [&flags](bool condition, unsigned long bits) { flags |= condition ? bits : 0; };
    setWhen(status.checkedOut,
            OrvixFileState::CheckedOut | OrvixFilePermission::CheckIn | OrvixFilePermission::UndoCheckOut);
    setWhen(status.checkedOutByOther, OrvixFileState::CheckedOutByOther);
    setWhen(status.outOfDate, OrvixFileState::OutOfDate);
    setWhen(status.modified, OrvixFileState::Modified);
    setWhen(!status.checkedOut && !status.checkedOutByOther && !status.outOfDate, OrvixFilePermission::CheckOut);
    setWhen(status.checkedOut || status.modified, OrvixFilePermission::Compare);
    return flags;
}

} // namespace

int ArchiveProvider::Initialize(OrvixClientInfo* info)
{
    return Guarded(Failure, [&] {
        Uninitialize();
        if (info == nullptr)
        {
            return Failure;
        }
        m_user = Text(info->GetUserNameW());
        if (m_user.empty())
        {
            m_user = ArchiveReport::WindowsUser();
        }
        m_clientAccess = info->GetIOrvixClientAccess();
        m_initialized = true;
        return Success;
    });
}

int ArchiveProvider::Uninitialize()
{
    const bool wasInitialized = m_initialized;
    m_store.Close();
    m_clientAccess = nullptr;
    m_initialized = false;
    return wasInitialized ? Success : Failure;
}

int ArchiveProvider::OpenProject(const wchar_t* localPath, const wchar_t*)
{
    return Guarded(Failure, [&] {
        m_store.Close();
        return m_initialized && localPath != nullptr ? Report(m_store.Open(localPath, m_user)) : Failure;
    });
}

int ArchiveProvider::CloseProject()
{
    const bool wasOpen = m_store.IsOpen();
    m_store.Close();
    return wasOpen ? Success : Failure;
}

/// Calls `work` with the paths of the active entries. Without an active entry the operation fails.
template <typename Work>
int ArchiveProvider::FileOperation(OrvixFileList* list, Work work)
{
    return Guarded(Failure, [&] {
        const unsigned int count = list != nullptr ? list->NumActiveEntries() : 0;
        Paths paths;
        paths.reserve(count);
        for (unsigned int i = 0; i < count; ++i)
        {
            OrvixFileEntry* entry = list->GetActiveFileEntry(i);
            const wchar_t* path = entry != nullptr ? entry->GetFile() : nullptr;
            if (path == nullptr)
            {
                return Failure;
            }
            paths.emplace_back(path);
        }
        return paths.empty() ? Failure : work(paths);
    });
}

int ArchiveProvider::CheckIn(OrvixFileList* list, const wchar_t* comment, unsigned long options)
{
    return FileOperation(list, [&](const Paths& paths) {
        return Report(m_store.CheckIn(paths, Text(comment), KeepsCheckedOut(options)));
    });
}

int ArchiveProvider::CheckOut(OrvixFileList* list, const wchar_t* comment, unsigned long options)
{
    return FileOperation(
        list, [&](const Paths& paths) { return Report(m_store.CheckOut(paths, Text(comment), GetsLatest(options))); });
}

int ArchiveProvider::UndoCheckOut(OrvixFileList* list, unsigned long options)
{
    return FileOperation(list, [&](const Paths& paths) {
        const int undone = Report(m_store.UndoCheckOut(paths));
        const int got = GetsLatest(options) ? Report(m_store.GetLatest(paths)) : Success;
        return undone == Success ? got : undone;
    });
}

int ArchiveProvider::GetLatest(OrvixFileList* list, unsigned long)
{
    return FileOperation(list, [&](const Paths& paths) { return Report(m_store.GetLatest(paths)); });
}

int ArchiveProvider::Add(OrvixFileList* list, const wchar_t* comment, unsigned long options)
{
    return FileOperation(
        list, [&](const Paths& paths) { return Report(m_store.Add(paths, Text(comment), KeepsCheckedOut(options))); });
}

int ArchiveProvider::ShowHistory(OrvixFileList* list)
{
    return FileOperation(list, [&](const Paths& paths) {
        std::vector<ArchiveRecord> records;
        const int result = Report(m_store.History(paths, records));
        for (const ArchiveRecord& record : records)
        {
            Output(ArchiveReport::History(record));
        }
        return result;
    });
}

int ArchiveProvider::ShowProperties(OrvixFileList* list)
{
    return FileOperation(list, [&](const Paths& paths) {
        std::vector<ArchiveRecord> records;
        const int result = Report(m_store.History(std::span(paths).first(1), records));
        for (const ArchiveRecord& record : records)
        {
            Output(ArchiveReport::Properties(record));
        }
        return result;
    });
}

int ArchiveProvider::QueryStatus(OrvixFileList* list, unsigned long)
{
    return FileOperation(list, [&](const Paths& paths) {
        std::vector<unsigned long> flags(paths.size(), OrvixFileState::NotControlled);
        if (IsProjectOpen())
        {
            std::vector<ArchiveStatus> statuses;
            if (Report(m_store.Status(paths, statuses)) != Success)
            {
                return Failure;
            }
            std::transform(statuses.begin(), statuses.end(), flags.begin(), FlagsOf);
        }
        for (unsigned int i = 0; i < flags.size(); ++i)
        {
            list->GetActiveFileEntry(i)->SetFlagsOut(flags[i]);
        }
        return Success;
    });
}

int ArchiveProvider::NameKnownFiles(const wchar_t* folder, OrvixKnownFileCallback callback, void* callerData)
{
    return Guarded(Failure, [&] {
        if (folder == nullptr || callback == nullptr)
        {
            return Failure;
        }
        Paths files;
        const int result = Report(m_store.List(folder, true, files));
        for (const std::wstring& file : files)
        {
            callback(callerData, file.c_str());
        }
        return result;
    });
}

/// Shows the failures and returns the result of the operation.
int ArchiveProvider::Report(const ArchiveFailures& failures)
{
    for (const ArchiveFailure& failure : failures)
    {
        Output(ArchiveReport::Failure(failure));
    }
    return failures.empty() ? Success : Failure;
}

void ArchiveProvider::Output(const ArchiveReport::Lines& lines)
{
    if (m_clientAccess == nullptr)
    {
        return;
    }
    for (const std::wstring& line : lines)
    {
        m_clientAccess->OutputText(line.c_str(), 0);
    }
}
