// The 21 functions of MSSCCI; archive_msscci.def exports them under their plain names. Each calls one operation of the
// session that its context identifies, inside the exception barrier.

#include "ArchiveBarrier.h"
#include "ArchiveScc.h"

#include <cstring>
#include <memory>
#include <unordered_map>
#include <utility>

namespace
{

/// The sessions by their contexts. A call shares the ownership of its session, since a callback may end it.
std::unordered_map<LPVOID, std::shared_ptr<ArchiveScc>> sessions;

/// Whether a batch is open. It belongs to no session and changes nothing here, but batches do not nest.
bool batchOpen = false;

/// Calls `work` with the session of a context. SCC_E_INITIALIZEFAILED when no session has this context.
template <typename Work>
SCCRTN WithSession(LPVOID context, Work work) noexcept
{
    return Guarded(SCC_E_NONSPECIFICERROR, [&] {
        const auto found = sessions.find(context);
        if (found == sessions.end())
        {
            return SCC_E_INITIALIZEFAILED;
        }
        const std::shared_ptr<ArchiveScc> session = found->second;
        return work(*session);
    });
}

} // namespace

LONG SccGetVersion()
{
    return 0x00010003;
}

SCCRTN SccInitialize(LPVOID* context, HWND, LPCSTR, LPSTR sccName, LPLONG capabilities, LPSTR auxPathLabel,
                     LPLONG checkoutCommentLength, LPLONG commentLength)
{
    return Guarded(SCC_E_NONSPECIFICERROR, [&] {
        if (context == nullptr || sccName == nullptr || capabilities == nullptr || auxPathLabel == nullptr ||
            checkoutCommentLength == nullptr || commentLength == nullptr)
        {
            return SCC_E_INITIALIZEFAILED;
        }
        const auto session = std::make_shared<ArchiveScc>();
        sessions.emplace(session.get(), session);
        *context = session.get();
        static_assert(sizeof ArchiveScc::Name <= SCC_NAME_SIZE && sizeof ArchiveScc::AuxPathLabel <= SCC_AUXLABEL_SIZE);
        std::memcpy(sccName, ArchiveScc::Name, sizeof ArchiveScc::Name);
        std::memcpy(auxPathLabel, ArchiveScc::AuxPathLabel, sizeof ArchiveScc::AuxPathLabel);
        *capabilities = ArchiveScc::Capabilities;
        *checkoutCommentLength = ArchiveScc::CommentLength;
        *commentLength = ArchiveScc::CommentLength;
        return SCC_OK;
    });
}

SCCRTN SccUninitialize(LPVOID context)
{
    return Guarded(SCC_E_NONSPECIFICERROR,
                   [&] { return sessions.erase(context) != 0 ? SCC_OK : SCC_E_INITIALIZEFAILED; });
}

SCCRTN SccOpenProject(LPVOID context, HWND, LPSTR user, LPCSTR projectName, LPCSTR localPath, LPSTR auxPath, LPCSTR,
                      LPTEXTOUTPROC output, LONG flags)
{
    return WithSession(context, [&](ArchiveScc& session) {
        return session.OpenProject(user, projectName, localPath, auxPath, output, flags);
    });
}

SCCRTN SccCloseProject(LPVOID context)
{
    return WithSession(context, [](ArchiveScc& session) { return session.CloseProject(); });
}

SCCRTN SccGetProjPath(LPVOID context, HWND, LPSTR user, LPSTR projectName, LPSTR localPath, LPSTR auxPath,
                      BOOL allowChangePath, LPBOOL isNew)
{
    return WithSession(context, [&](ArchiveScc& session) {
        return session.GetProjPath(user, projectName, localPath, auxPath, allowChangePath, isNew);
    });
}

SCCRTN SccGet(LPVOID context, HWND, LONG count, LPCSTR* names, LONG options, LPCMDOPTS)
{
    return WithSession(context, [&](ArchiveScc& session) { return session.Get(count, names, options); });
}

SCCRTN SccCheckout(LPVOID context, HWND, LONG count, LPCSTR* names, LPCSTR comment, LONG options, LPCMDOPTS)
{
    return WithSession(context, [&](ArchiveScc& session) { return session.Checkout(count, names, comment, options); });
}

SCCRTN SccUncheckout(LPVOID context, HWND, LONG count, LPCSTR* names, LONG, LPCMDOPTS)
{
    return WithSession(context, [&](ArchiveScc& session) { return session.Uncheckout(count, names); });
}

SCCRTN SccCheckin(LPVOID context, HWND, LONG count, LPCSTR* names, LPCSTR comment, LONG options, LPCMDOPTS)
{
    return WithSession(context, [&](ArchiveScc& session) { return session.Checkin(count, names, comment, options); });
}

SCCRTN SccAdd(LPVOID context, HWND, LONG count, LPCSTR* names, LPCSTR comment, LONG* options, LPCMDOPTS)
{
    return WithSession(context, [&](ArchiveScc& session) { return session.Add(count, names, comment, options); });
}

SCCRTN SccBeginBatch()
{
    return std::exchange(batchOpen, true) ? SCC_E_OPNOTPERFORMED : SCC_OK;
}

SCCRTN SccEndBatch()
{
    return std::exchange(batchOpen, false) ? SCC_OK : SCC_E_OPNOTPERFORMED;
}

SCCRTN SccHistory(LPVOID context, HWND, LONG count, LPCSTR* names, LONG, LPCMDOPTS)
{
    return WithSession(context, [&](ArchiveScc& session) { return session.History(count, names); });
}

SCCRTN SccProperties(LPVOID context, HWND, LPCSTR name)
{
    return WithSession(context, [&](ArchiveScc& session) { return session.Properties(name); });
}

SCCRTN SccQueryInfo(LPVOID context, LONG count, LPCSTR* names, LPLONG status)
{
    return WithSession(context, [&](ArchiveScc& session) { return session.QueryInfo(count, names, status); });
}

SCCRTN SccPopulateList(LPVOID context, SCCCOMMAND command, LONG count, LPCSTR* names, POPLISTFUNC callback,
                       LPVOID callerData, LPLONG status, LONG options)
{
    return WithSession(context, [&](ArchiveScc& session) {
        return session.PopulateList(command, count, names, callback, callerData, status, options);
    });
}

SCCRTN SccRunScc(LPVOID context, HWND, LONG, LPCSTR*)
{
    return WithSession(context, [](ArchiveScc& session) { return session.RunScc(); });
}

SCCRTN SccGetCommandOptions(LPVOID context, HWND, SCCCOMMAND command, LPCMDOPTS* block)
{
    return WithSession(context, [&](ArchiveScc& session) { return session.GetCommandOptions(command, block); });
}

SCCRTN SccAddFromScc(LPVOID context, HWND, LPLONG count, LPCSTR** names)
{
    return WithSession(context, [&](ArchiveScc& session) { return session.AddFromScc(count, names); });
}

SCCRTN SccSetOption(LPVOID context, LONG option, LONG)
{
    return WithSession(context, [&](ArchiveScc& session) { return session.SetOption(option); });
}
