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

#include <algorithm>
#include <cstring>
#include <limits>
#include <new>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

/// The wrappers, and the one client access that they share: set by every `Initialize` and read by the text output, to
/// which a library hands no wrapper.
class ClientAccessUsers
{
public:
    static IOrvixClientAccess* Access() { return s_access; }

    static void Add(OrvixProviderWrapper& wrapper)
    {
        wrapper.m_nextWrapper = s_wrappers;
        s_wrappers = &wrapper;
    }

    static void Use(OrvixProviderWrapper& wrapper, IOrvixClientAccess* access)
    {
        wrapper.m_clientAccess = access;
        s_access = access;
    }

    /// The last wrapper that was initialised with the access takes it along.
    static void Remove(OrvixProviderWrapper& wrapper)
    {
        bool isUsed = false;
        for (OrvixProviderWrapper** link = &s_wrappers; *link != nullptr;)
        {
            if (*link == &wrapper)
            {
                *link = wrapper.m_nextWrapper;
                continue;
            }
            isUsed |= (*link)->m_clientAccess == s_access;
            link = &(*link)->m_nextWrapper;
        }
        if (!isUsed)
        {
            s_access = nullptr;
        }
    }

private:
    static inline OrvixProviderWrapper* s_wrappers = nullptr;
    static inline IOrvixClientAccess* s_access = nullptr;
};

namespace
{

using OrvixProviderResult::Failure;
using OrvixProviderResult::NotOffered;
using OrvixProviderResult::Success;

int ToResult(SCCRTN result)
{
    return result == SCC_OK ? Success : Failure;
}

LONG KeepOption(unsigned long options)
{
    return (options & OrvixProviderOption::KeepCheckedOut) != 0 ? SCC_KEEP_CHECKEDOUT : 0;
}

/// Sends a line to the host.
void Tell(const wchar_t* text)
{
    if (IOrvixClientAccess* access = ClientAccessUsers::Access())
    {
        Completes([&] { access->OutputText(text, 0); });
    }
}

/// Receives the library's text output, of whatever kind.
LONG OutputText(LPCSTR text, LONG)
{
    if (const WStr wide(text); wide.Get() != nullptr)
    {
        Tell(wide.Get());
    }
    return SCC_MSG_RTN_OK;
}

/// A name in the ANSI code page, never null; characters that it does not have are replaced. Throws std::bad_alloc.
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

/// A comment, with a line to the host when it loses characters or is longer than the library takes. Throws
/// std::bad_alloc.
class NarrowComment : public NarrowText
{
public:
    /// `limit`: in bytes; 0 for none.
    NarrowComment(const wchar_t* comment, LONG limit) : NarrowText(comment)
    {
        if (limit > 0 && std::strlen(Get()) > static_cast<std::size_t>(limit))
        {
            Tell((L"The comment is longer than the " + std::to_wstring(limit) +
                  L" bytes that the provider takes, which may cut or refuse it.")
                     .c_str());
        }
        const std::wstring_view wide = comment != nullptr ? comment : L"";
        const bool isAscii = std::all_of(wide.begin(), wide.end(), [](wchar_t c) { return c < 0x80; });
        if (!isAscii && !IsExact(wide, Get()))
        {
            Tell(L"The comment has characters that the code page of this system does not have. They are replaced.");
        }
    }
};

/// Runs an operation and gives its result: `Failure` when anything is thrown, with a line to the host when memory ran
/// out.
template <typename Operation>
int Run(const Operation& operation)
{
    return WithBarrier(Failure, [&] {
        try
        {
            return operation();
        }
        catch (const std::bad_alloc&)
        {
            Tell(L"There is not enough memory. The operation failed.");
            return Failure;
        }
    });
}

/// Adds a path; false, with a line to the host, when the code page does not carry it.
bool AddOrTell(NarrowPaths& paths, const wchar_t* path)
{
    if (paths.Add(path))
    {
        return true;
    }
    const std::wstring file = path;
    Tell((file +
          L": the name has characters that the code page of this system does not have. The provider was not called.")
             .c_str());
    return false;
}

/// Number of active entries; 0 for a list that no library can be asked about.
unsigned int CountOf(OrvixFileList* list)
{
    const unsigned int count = list != nullptr ? list->NumActiveEntries() : 0;
    return count <= static_cast<unsigned int>(std::numeric_limits<LONG>::max()) ? count : 0;
}

/// Hands the paths of the active entries, of which there must be one, to `work` and gives its result.
template <typename Work>
int FileOperation(OrvixFileList* list, const Work& work)
{
    return Run([&] {
        const unsigned int count = CountOf(list);
        NarrowPaths paths(count);
        for (unsigned int i = 0; i < count; ++i)
        {
            OrvixFileEntry* entry = list->GetActiveFileEntry(i);
            if (entry == nullptr || !AddOrTell(paths, entry->GetFile()))
            {
                return Failure;
            }
        }
        return count > 0 ? work(paths) : Failure;
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

OrvixProviderWrapper::OrvixProviderWrapper()
{
    ClientAccessUsers::Add(*this);
}

OrvixProviderWrapper::~OrvixProviderWrapper()
{
    m_bridge.reset(); // the library may send text until it is gone
    ClientAccessUsers::Remove(*this);
}

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
    return Run([&] {
        if (info == nullptr)
        {
            return Failure;
        }
        m_bridge->SetParentWindow(info->GetParentWindow());
        ClientAccessUsers::Use(*this, info->GetIOrvixClientAccess());
        return ToResult(m_bridge->Initialize(NarrowText(info->GetClientName()).Get()));
    });
}

int OrvixProviderWrapper::Uninitialize()
{
    return ToResult(m_bridge->Uninitialize());
}

int OrvixProviderWrapper::OpenProject(const wchar_t* localPath, const wchar_t* comment)
{
    return Run([&] {
        NarrowPaths folder(1);
        if (!AddOrTell(folder, localPath))
        {
            return Failure;
        }
        return ToResult(m_bridge->OpenProject(*folder.Get(), NarrowComment(comment, 0).Get(), OutputText));
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
        const NarrowComment text(comment, m_bridge->CommentLength());
        return ToResult(m_bridge->Checkin(paths.Count(), paths.Get(), text.Get(), KeepOption(options), nullptr));
    });
}

int OrvixProviderWrapper::CheckOut(OrvixFileList* list, const wchar_t* comment, unsigned long options)
{
    return FileOperation(list, [&](NarrowPaths& paths) {
        const NarrowComment text(comment, m_bridge->CheckoutCommentLength());
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
        const NarrowComment text(comment, m_bridge->CommentLength());
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
    return Run([&] {
        OrvixFileEntry* entry = CountOf(list) > 0 ? list->GetActiveFileEntry(0) : nullptr;
        NarrowPaths first(1);
        if (entry == nullptr || !AddOrTell(first, entry->GetFile()))
        {
            return Failure;
        }
        return ToResult(m_bridge->Properties(*first.Get()));
    });
}

int OrvixProviderWrapper::QueryStatus(OrvixFileList* list, unsigned long)
{
    return Run([&] {
        const unsigned int count = CountOf(list);
        if (count == 0)
        {
            return Failure;
        }
        const bool isOpen = IsProjectOpen();
        NarrowPaths paths(isOpen ? count : 0);
        std::vector<unsigned int> leftOut; // the entries whose names no library can take
        for (unsigned int i = 0; isOpen && i < count; ++i)
        {
            OrvixFileEntry* entry = list->GetActiveFileEntry(i);
            if (entry == nullptr)
            {
                return Failure;
            }
            if (!paths.Add(entry->GetFile()))
            {
                leftOut.push_back(i);
            }
        }
        // Whatever a library does not fill stays "not controlled".
        std::vector<LONG> statuses(static_cast<std::size_t>(paths.Count()), SCC_STATUS_NOTCONTROLLED);
        if (!statuses.empty() && m_bridge->QueryInfo(paths.Count(), paths.Get(), statuses.data()) != SCC_OK)
        {
            return Failure;
        }
        auto nextLeftOut = leftOut.begin();
        auto nextStatus = statuses.begin();
        for (unsigned int i = 0; i < count; ++i)
        {
            const bool isLeftOut = nextLeftOut != leftOut.end() && *nextLeftOut == i;
            nextLeftOut += isLeftOut ? 1 : 0;
            const LONG status = isOpen && !isLeftOut ? *nextStatus++ : SCC_STATUS_NOTCONTROLLED;
            // A library that shows windows may have let the host shorten the list.
            if (OrvixFileEntry* entry = list->GetActiveFileEntry(i))
            {
                entry->SetFlagsOut(isLeftOut ? OrvixFileState::NotControlled : FlagsOf(status, IsProjectOpen()));
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
