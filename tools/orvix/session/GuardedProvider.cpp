#include "GuardedProvider.h"

#include "ExceptionBarrier.h"
#include "FileMark.h"
#include "FilePath.h"
#include "OrvixFileFlags.h"
#include "OrvixFileList.h"
#include "OrvixProviderOption.h"
#include "OrvixProviderResult.h"

int GuardedProvider::NameKnownFiles(const wchar_t* folder, OrvixKnownFileCallback callback, void* callerData)
{
    // The export has no other way to be found: the services object tells nobody which module a provider is from.
    const void* const virtualTable = *reinterpret_cast<void**>(&m_provider);
    HMODULE module = nullptr;
    GetModuleHandleExW(GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS | GET_MODULE_HANDLE_EX_FLAG_UNCHANGED_REFCOUNT,
                       static_cast<const wchar_t*>(virtualTable), &module);
    const auto function =
        reinterpret_cast<void (*)()>(module != nullptr ? GetProcAddress(module, "GetOrvixKnownFiles") : nullptr);
    if (function == nullptr)
    {
        return OrvixProviderResult::NotOffered;
    }
    return Guarded("GetOrvixKnownFiles", [&] {
        return WithBarrier(OrvixProviderResult::Failure, [&] {
            return reinterpret_cast<OrvixKnownFilesFunction*>(function)(&m_provider, folder, callback, callerData);
        });
    });
}

const wchar_t* GuardedProvider::GetName()
{
    return m_provider.GetName();
}

int GuardedProvider::ReservedA()
{
    return Guarded("ReservedA", [&] { return m_provider.ReservedA(); });
}

bool GuardedProvider::IsInitialized()
{
    return Guarded("IsInitialized", [&] { return m_provider.IsInitialized(); });
}

bool GuardedProvider::IsProjectOpen()
{
    return Guarded("IsProjectOpen", [&] { return m_provider.IsProjectOpen(); });
}

int GuardedProvider::Initialize(OrvixClientInfo* info)
{
    return Guarded("Initialize", [&] { return m_provider.Initialize(info); });
}

int GuardedProvider::Uninitialize()
{
    return Guarded("Uninitialize", [&] { return m_provider.Uninitialize(); });
}

int GuardedProvider::OpenProject(const wchar_t* localPath, const wchar_t* comment)
{
    return Guarded("OpenProject", [&] { return m_provider.OpenProject(localPath, comment); });
}

int GuardedProvider::CloseProject()
{
    return Guarded("CloseProject", [&] { return m_provider.CloseProject(); });
}

int GuardedProvider::ReservedB()
{
    return Guarded("ReservedB", [&] { return m_provider.ReservedB(); });
}

int GuardedProvider::ReservedC()
{
    return Guarded("ReservedC", [&] { return m_provider.ReservedC(); });
}

int GuardedProvider::CheckIn(OrvixFileList* list, const wchar_t* comment, unsigned long options)
{
    m_keepsCheckedOut = (options & OrvixProviderOption::KeepCheckedOut) != 0;
    return Guarded("CheckIn", [&] { return m_provider.CheckIn(list, comment, options); });
}

int GuardedProvider::CheckOut(OrvixFileList* list, const wchar_t* comment, unsigned long options)
{
    return Guarded("CheckOut", [&] { return m_provider.CheckOut(list, comment, options); });
}

int GuardedProvider::UndoCheckOut(OrvixFileList* list, unsigned long options)
{
    OrvixFileList toUndo;
    OrvixFileList toGet;
    for (unsigned int i = 0; i < list->NumActiveEntries(); ++i)
    {
        OrvixFileEntry& entry = *list->GetActiveFileEntry(i);
        const bool isCheckedOut = (entry.GetFlagsOut() & OrvixFileState::CheckedOut) != 0;
        OrvixFileList& target = isCheckedOut || !IsMissing(entry.GetFile()) ? toUndo : toGet;
        if (target.CreateEntry(entry) == nullptr)
        {
            return OrvixProviderResult::Failure;
        }
    }
    if (toGet.BuildActiveList(FileMark::Chosen, false) == 0)
    {
        return Guarded("UndoCheckOut", [&] { return m_provider.UndoCheckOut(list, options); });
    }
    int result = OrvixProviderResult::Success;
    if (toUndo.BuildActiveList(FileMark::Chosen, false) > 0)
    {
        result = Guarded("UndoCheckOut", [&] { return m_provider.UndoCheckOut(&toUndo, options); });
    }
    const int got = Guarded("GetLatest", [&] { return m_provider.GetLatest(&toGet, options); });
    return result == OrvixProviderResult::Success ? got : result;
}

int GuardedProvider::GetLatest(OrvixFileList* list, unsigned long options)
{
    return Guarded("GetLatest", [&] { return m_provider.GetLatest(list, options); });
}

int GuardedProvider::ReservedD(void* argument, unsigned long* first, unsigned long* second)
{
    return Guarded("ReservedD", [&] { return m_provider.ReservedD(argument, first, second); });
}

int GuardedProvider::ReservedE()
{
    return Guarded("ReservedE", [&] { return m_provider.ReservedE(); });
}

int GuardedProvider::Add(OrvixFileList* list, const wchar_t* comment, unsigned long options)
{
    m_keepsCheckedOut = (options & OrvixProviderOption::KeepCheckedOut) != 0;
    return Guarded("Add", [&] { return m_provider.Add(list, comment, options); });
}

int GuardedProvider::ShowHistory(OrvixFileList* list)
{
    return Guarded("ShowHistory", [&] { return m_provider.ShowHistory(list); });
}

int GuardedProvider::ShowProperties(OrvixFileList* list)
{
    return Guarded("ShowProperties", [&] { return m_provider.ShowProperties(list); });
}

int GuardedProvider::QueryStatus(OrvixFileList* list, unsigned long options)
{
    const int result = Guarded("QueryStatus", [&] { return m_provider.QueryStatus(list, options); });
    m_knowsStatus = result == OrvixProviderResult::Success;
    for (unsigned int i = 0; m_knowsStatus && i < list->NumActiveEntries(); ++i)
    {
        OrvixFileEntry* const entry = list->GetActiveFileEntry(i);
        entry->SetFlagsOut(CorrectedFlags(*entry));
        ParentLink::SendAliveAt(i);
    }
    return result;
}

int GuardedProvider::ReservedF()
{
    return Guarded("ReservedF", [&] { return m_provider.ReservedF(); });
}

int GuardedProvider::ReservedG()
{
    return Guarded("ReservedG", [&] { return m_provider.ReservedG(); });
}

int GuardedProvider::ShowOptions()
{
    return Guarded("ShowOptions", [&] { return m_provider.ShowOptions(); });
}

int GuardedProvider::RunProviderClient()
{
    return Guarded("RunProviderClient", [&] { return m_provider.RunProviderClient(); });
}

int GuardedProvider::ReservedH()
{
    return Guarded("ReservedH", [&] { return m_provider.ReservedH(); });
}

bool GuardedProvider::ReservedI()
{
    return Guarded("ReservedI", [&] { return m_provider.ReservedI(); });
}

unsigned long GuardedProvider::CorrectedFlags(OrvixFileEntry& entry) const
{
    constexpr unsigned long EveryState = OrvixFileState::Controlled | OrvixFileState::CheckedOut |
                                         OrvixFileState::CheckedOutByOther | OrvixFileState::OutOfDate |
                                         OrvixFileState::Deleted | OrvixFileState::Modified;

    const unsigned long flags = entry.GetFlagsOut();
    if ((flags & EveryState) == EveryState)
    {
        return 0;
    }
    constexpr unsigned long Known = OrvixFileState::Controlled | OrvixFileState::Deleted;
    const bool exists = PathExists(entry.GetFile());
    if (!exists && (flags & Known) != 0 && (flags & OrvixFileState::NotControlled) == 0)
    {
        // A library says of such a file that it is deleted, or that it is as it was.
        return (flags & ~OrvixFilePermission::Add) | OrvixFileState::Controlled | OrvixFilePermission::GetLatest |
               OrvixFilePermission::UndoCheckOut;
    }
    const bool withheld = exists && (flags & m_withheldFrom) != 0;
    return withheld ? flags & ~m_withheld : flags;
}
