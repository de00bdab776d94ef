#include "OrvixProviderWrapper.h"

#include "CStr.h"
#include "ExceptionBarrier.h"
#include "IOrvixClientAccess.h"
#include "NarrowPaths.h"
#include "OrvixClientInfo.h"
#include "OrvixFileEntry.h"
#include "OrvixFileFlags.h"
#include "OrvixFileList.h"
#include "OrvixMSSCC.h"
#include "OrvixProviderOption.h"
#include "OrvixProviderResult.h"
#include "WStr.h"

#include <new>
#include <utility>

namespace
{

using OrvixProviderResult::Failure;
using OrvixProviderResult::NotOffered;
using OrvixProviderResult::Success;

/// Shared by all wrappers: set by every `Initialize`, read by the text output, to which no wrapper is given.
IOrvixClientAccess* clientAccess = nullptr;

int ToResult(SCCRTN result)
{
    return result == SCC_OK ? Success : Failure;
}

LONG KeepOption(unsigned long options)
{
    return (options & OrvixProviderOption::KeepCheckedOut) != 0 ? SCC_KEEP_CHECKEDOUT : 0;
}

/// A comment or a name in the ANSI code page, never null. Throws std::bad_alloc.
class NarrowText
{
public:
    explicit NarrowText(const wchar_t* text) : m_text(text != nullptr ? text : L"")
    {
        if (m_text.Get() == nullptr)
        {
            throw std::bad_alloc();
        }
    }
    LPCSTR Get() const { return m_text.Get(); }

private:
    CStr m_text;
};

/// Receives the library's text output, of whatever kind.
LONG OutputText(LPCSTR text, LONG)
{
    return WithBarrier(LONG{0}, [text] {
        const WStr wide(text);
        if (clientAccess != nullptr && wide.Get() != nullptr)
        {
            clientAccess->OutputText(wide.Get(), 0);
        }
        return LONG{0};
    });
}

/// Hands the paths of the active entries, of which there must be one, to `work` and gives its result.
template <typename Work>
int FileOperation(OrvixFileList* list, Work work)
{
    return WithBarrier(Failure, [&] {
        const unsigned int count = list != nullptr ? list->NumActiveEntries() : 0;
        if (count == 0)
        {
            return Failure;
        }
        NarrowPaths paths(*list, count);
        return work(paths);
    });
}

/// The flags of `IOrvixProvider::QueryStatus` for a file's status bits.
unsigned long FlagsOf(LONG status, bool projectOpen)
{
    const auto has = [status](LONG bits) { return (status & bits) != 0; };
    const bool controlled = has(SCC_STATUS_CONTROLLED);
    const bool outToMe = has(SCC_STATUS_CHECKEDOUT);
    const bool outToOther = has(SCC_STATUS_OUTOTHER);

    unsigned long flags = 0;
    const auto setWhen = [&flags](bool condition, unsigned long bits) { flags |= condition ? bits : 0; };
    setWhen(status == SCC_STATUS_NOTCONTROLLED, OrvixFileState::NotControlled);
    setWhen(controlled, OrvixFileState::Controlled);
    setWhen(outToMe, OrvixFileState::CheckedOut);
    setWhen(outToOther, OrvixFileState::CheckedOutByOther);
    setWhen(has(SCC_STATUS_OUTOFDATE), OrvixFileState::OutOfDate);
    setWhen(has(SCC_STATUS_DELETED), OrvixFileState::Deleted);
    setWhen(has(SCC_STATUS_MODIFIED), OrvixFileState::Modified);
    setWhen(controlled, OrvixFilePermission::GetLatest | OrvixFilePermission::ShowHistory);
    setWhen(controlled && outToMe && !outToOther, OrvixFilePermission::CheckIn | OrvixFilePermission::UndoCheckOut);
    setWhen(controlled && !outToMe && !outToOther && !has(SCC_STATUS_OUTOFDATE), OrvixFilePermission::CheckOut);
    setWhen(controlled && (outToMe || has(SCC_STATUS_MODIFIED)), OrvixFilePermission::Compare);
    setWhen(!controlled && projectOpen, OrvixFilePermission::Add);
    return flags;
}

} // namespace

OrvixProviderWrapper::OrvixProviderWrapper() = default;
OrvixProviderWrapper::~OrvixProviderWrapper() = default;

void OrvixProviderWrapper::SetMSSCC(std::unique_ptr<OrvixMSSCC> bridge)
{
    m_bridge = std::move(bridge);
}

const wchar_t* OrvixProviderWrapper::GetName()
{
    return m_bridge->GetProviderName();
}

int OrvixProviderWrapper::ReservedA()
{
    return Success;
}

bool OrvixProviderWrapper::IsInitialized()
{
    return m_bridge->IsInitialized();
}

bool OrvixProviderWrapper::IsProjectOpen()
{
    return m_bridge->IsProjectOpen();
}

int OrvixProviderWrapper::Initialize(OrvixClientInfo* info)
{
    return WithBarrier(Failure, [&] {
        if (info == nullptr)
        {
            return Failure;
        }
        m_bridge->SetParentWindow(info->GetParentWindow());
        clientAccess = info->GetIOrvixClientAccess();
        return ToResult(m_bridge->Initialize(NarrowText(info->GetClientName()).Get()));
    });
}

int OrvixProviderWrapper::Uninitialize()
{
    return ToResult(m_bridge->Uninitialize());
}

int OrvixProviderWrapper::OpenProject(const wchar_t* localPath, const wchar_t* comment)
{
    return WithBarrier(Failure, [&] {
        NarrowPaths folder(localPath);
        return ToResult(m_bridge->OpenProject(*folder.Get(), NarrowText(comment).Get(), OutputText));
    });
}

int OrvixProviderWrapper::CloseProject()
{
    return ToResult(m_bridge->CloseProject());
}

int OrvixProviderWrapper::ReservedB()
{
    return Success;
}

int OrvixProviderWrapper::ReservedC()
{
    return NotOffered;
}

int OrvixProviderWrapper::CheckIn(OrvixFileList* list, const wchar_t* comment, unsigned long options)
{
    return FileOperation(list, [&](NarrowPaths& paths) {
        const NarrowText text(comment);
        return ToResult(m_bridge->Checkin(paths.Count(), paths.Get(), text.Get(), KeepOption(options), nullptr));
    });
}

int OrvixProviderWrapper::CheckOut(OrvixFileList* list, const wchar_t* comment, unsigned long options)
{
    return FileOperation(list, [&](NarrowPaths& paths) {
        const NarrowText text(comment);
        if ((options & OrvixProviderOption::GetLatest) != 0)
        {
            m_bridge->Get(paths.Count(), paths.Get(), 0, nullptr); // a failed get does not stop the check-out
        }
        return ToResult(m_bridge->Checkout(paths.Count(), paths.Get(), text.Get(), 0, nullptr));
    });
}

int OrvixProviderWrapper::UndoCheckOut(OrvixFileList* list, unsigned long options)
{
    return FileOperation(list, [&](NarrowPaths& paths) {
        SCCRTN result = m_bridge->Uncheckout(paths.Count(), paths.Get(), 0, nullptr);
        if ((options & OrvixProviderOption::GetLatest) != 0)
        {
            result = m_bridge->Get(paths.Count(), paths.Get(), 0, nullptr);
        }
        return ToResult(result);
    });
}

int OrvixProviderWrapper::GetLatest(OrvixFileList* list, unsigned long)
{
    return FileOperation(
        list, [&](NarrowPaths& paths) { return ToResult(m_bridge->Get(paths.Count(), paths.Get(), 0, nullptr)); });
}

int OrvixProviderWrapper::ReservedD(void*, unsigned long* first, unsigned long* second)
{
    *first = 0;
    *second = 0;
    return NotOffered;
}

int OrvixProviderWrapper::ReservedE()
{
    return NotOffered;
}

int OrvixProviderWrapper::Add(OrvixFileList* list, const wchar_t* comment, unsigned long options)
{
    return FileOperation(list, [&](NarrowPaths& paths) {
        const NarrowText text(comment);
        std::vector<LONG> perFile(static_cast<std::size_t>(paths.Count()), KeepOption(options));
        return ToResult(m_bridge->Add(paths.Count(), paths.Get(), text.Get(), perFile.data(), nullptr));
    });
}

int OrvixProviderWrapper::ShowHistory(OrvixFileList* list)
{
    return FileOperation(list, [&](NarrowPaths& paths) {
        const SCCRTN result = m_bridge->History(paths.Count(), paths.Get(), 0, nullptr);
        if (result < 0)
        {
            return Failure;
        }
        return result == SCC_I_RELOADFILE ? OrvixProviderResult::ReloadFiles : Success;
    });
}

int OrvixProviderWrapper::ShowProperties(OrvixFileList* list)
{
    return WithBarrier(Failure, [&] {
        if (list == nullptr || list->NumActiveEntries() == 0)
        {
            return Failure;
        }
        NarrowPaths first(*list, 1);
        return ToResult(m_bridge->Properties(*first.Get()));
    });
}

int OrvixProviderWrapper::QueryStatus(OrvixFileList* list, unsigned long)
{
    return FileOperation(list, [&](NarrowPaths& paths) {
        // Whatever a library does not fill stays "not controlled".
        std::vector<LONG> statuses(static_cast<std::size_t>(paths.Count()), 0);
        if (IsProjectOpen() && m_bridge->QueryInfo(paths.Count(), paths.Get(), statuses.data()) != SCC_OK)
        {
            return Failure;
        }
        for (unsigned int i = 0; i < statuses.size(); ++i)
        {
            // A library that shows windows may have let the host shorten the list.
            if (OrvixFileEntry* entry = list->GetActiveFileEntry(i))
            {
                entry->SetFlagsOut(FlagsOf(statuses[i], IsProjectOpen()));
            }
        }
        return Success;
    });
}

int OrvixProviderWrapper::ReservedF()
{
    return NotOffered;
}

int OrvixProviderWrapper::ReservedG()
{
    return NotOffered;
}

int OrvixProviderWrapper::ShowOptions()
{
    return ToResult(m_bridge->GetCommandOptions());
}

int OrvixProviderWrapper::RunProviderClient()
{
    return ToResult(m_bridge->RunScc(0, nullptr));
}

int OrvixProviderWrapper::ReservedH()
{
    return NotOffered;
}

bool OrvixProviderWrapper::ReservedI()
{
    return true;
}
