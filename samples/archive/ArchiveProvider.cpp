#include "ArchiveProvider.h"

#include "IOrvixClientAccess.h"
#include "OrvixClientInfo.h"
#include "OrvixFileEntry.h"
#include "OrvixFileList.h"

#include <algorithm>
#include <span>

namespace
{

constexpr int Success = 0;
constexpr int Failed = -1;
constexpr int NotOffered = -2;

constexpr unsigned long KeepCheckedOut = 0x1;
constexpr unsigned long WithGetLatest = 0x2;

/// The exception barrier: what goes wrong unforeseen, out of memory above all, is a failed operation.
template <typename Work>
int Guarded(Work work) noexcept
{
    try
    {
        return work();
    }
    catch (...)
    {
        return Failed;
    }
}

std::wstring Text(const wchar_t* text)
{
    return text != nullptr ? text : L"";
}

/// The bits of `IOrvixProvider::QueryStatus` for a file of an open project.
unsigned long FlagsOf(const ArchiveStatus& status)
{
    if (!status.controlled)
    {
        return 0x1 | 0x100000;
    }
    unsigned long flags = 0x2 | 0x200000 | 0x400000;
    if (status.checkedOut)
    {
        flags |= 0x4 | 0x10000 | 0x40000;
    }
    if (status.checkedOutByOther)
    {
        flags |= 0x8;
    }
    if (status.outOfDate)
    {
        flags |= 0x10;
    }
    if (status.modified)
    {
        flags |= 0x80;
    }
    if (!status.checkedOut && !status.checkedOutByOther && !status.outOfDate)
    {
        flags |= 0x20000;
    }
    if (status.checkedOut || status.modified)
    {
        flags |= 0x80000;
    }
    return flags;
}

} // namespace

const wchar_t* ArchiveProvider::GetName()
{
    return Name;
}

int ArchiveProvider::ReservedA()
{
    return Success;
}

bool ArchiveProvider::IsInitialized()
{
    return m_initialized;
}

bool ArchiveProvider::IsProjectOpen()
{
    return m_store.IsOpen();
}

int ArchiveProvider::Initialize(OrvixClientInfo* info)
{
    return Guarded([&] {
        Uninitialize();
        if (info == nullptr)
        {
            return Failed;
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
    return wasInitialized ? Success : Failed;
}

int ArchiveProvider::OpenProject(const wchar_t* localPath, const wchar_t*)
{
    return Guarded([&] {
        m_store.Close();
        return m_initialized && localPath != nullptr ? Report(m_store.Open(localPath, m_user)) : Failed;
    });
}

int ArchiveProvider::CloseProject()
{
    const bool wasOpen = m_store.IsOpen();
    m_store.Close();
    return wasOpen ? Success : Failed;
}

int ArchiveProvider::ReservedB()
{
    return Success;
}

int ArchiveProvider::ReservedC()
{
    return NotOffered;
}

/// Hands the paths of the active entries, of which there must be one, to `work`.
template <typename Work>
int ArchiveProvider::FileOperation(OrvixFileList* list, Work work)
{
    return Guarded([&] {
        if (!list)
        {
            return Failed;
        }
        const unsigned int count = list->NumActiveEntries();
        Paths paths;
        paths.reserve(count);
        for (unsigned int i = 0; i < count; ++i)
        {
            OrvixFileEntry* entry = list->GetActiveFileEntry(i);
            const wchar_t* path = entry ? entry->GetFile() : nullptr;
            if (!path)
            {
                return Failed;
            }
            paths.emplace_back(path);
        }
        return paths.empty() ? Failed : work(paths);
    });
}

int ArchiveProvider::CheckIn(OrvixFileList* list, const wchar_t* comment, unsigned long options)
{
    return FileOperation(list, [&](const Paths& paths) {
        return Report(m_store.CheckIn(paths, Text(comment), (options & KeepCheckedOut) != 0));
    });
}

int ArchiveProvider::CheckOut(OrvixFileList* list, const wchar_t* comment, unsigned long options)
{
    return FileOperation(list, [&](const Paths& paths) {
        return Report(m_store.CheckOut(paths, Text(comment), (options & WithGetLatest) != 0));
    });
}

int ArchiveProvider::UndoCheckOut(OrvixFileList* list, unsigned long options)
{
    return FileOperation(list, [&](const Paths& paths) {
        const int undone = Report(m_store.UndoCheckOut(paths));
        const int got = options & WithGetLatest ? Report(m_store.GetLatest(paths)) : Success;
        return undone == Success ? got : undone;
    });
}

int ArchiveProvider::GetLatest(OrvixFileList* list, unsigned long)
{
    return FileOperation(list, [&](const Paths& paths) { return Report(m_store.GetLatest(paths)); });
}

int ArchiveProvider::ReservedD(void*, unsigned long* first, unsigned long* second)
{
    *first = 0;
    *second = 0;
    return NotOffered;
}

int ArchiveProvider::ReservedE()
{
    return NotOffered;
}

int ArchiveProvider::Add(OrvixFileList* list, const wchar_t* comment, unsigned long options)
{
    return FileOperation(list, [&](const Paths& paths) {
        return Report(m_store.Add(paths, Text(comment), (options & KeepCheckedOut) != 0));
    });
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
        std::vector<unsigned long> flags(paths.size(), 0x1);
        if (IsProjectOpen())
        {
            std::vector<ArchiveStatus> statuses;
            if (Report(m_store.Status(paths, statuses)) != Success)
            {
                return Failed;
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

int ArchiveProvider::ReservedF()
{
    return NotOffered;
}

int ArchiveProvider::ReservedG()
{
    return NotOffered;
}

int ArchiveProvider::ShowOptions()
{
    return NotOffered;
}

int ArchiveProvider::RunProviderClient()
{
    return NotOffered;
}

int ArchiveProvider::ReservedH()
{
    return NotOffered;
}

bool ArchiveProvider::ReservedI()
{
    return true;
}

/// Shows what went wrong; the result of the operation.
int ArchiveProvider::Report(const ArchiveFailures& failures)
{
    for (const ArchiveFailure& failure : failures)
    {
        Output(ArchiveReport::Failure(failure));
    }
    return failures.empty() ? Success : Failed;
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
