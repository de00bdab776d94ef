// The MSSCCI library that a host loads in place of the real one. Each function goes to the real library in its own
// process.

#include "Contexts.h"
#include "DllDirectoryScope.h"
#include "ModulePath.h"
#include "SccCalls.h"

#include <algorithm>

namespace
{

HMODULE proxyModule = nullptr;

std::wstring searchFolder; // that the host had searched for DLLs when it loaded this library

std::shared_ptr<IsolatedLibrary> MakeLibrary()
{
    const std::filesystem::path folder = std::filesystem::path(ModulePath(proxyModule)).parent_path();
    return std::make_shared<IsolatedLibrary>(IsolationSettings::Read(folder), searchFolder);
}

Contexts contexts(MakeLibrary);

std::wstring DllDirectory()
{
    std::wstring folder(GetDllDirectoryW(0, nullptr), L'\0');
    folder.resize(
        std::min<std::size_t>(GetDllDirectoryW(static_cast<DWORD>(folder.size()), folder.data()), folder.size()));
    return folder;
}

/// Runs `body`, or returns the failure when memory runs out.
template <typename Body>
SCCRTN Guarded(const Body& body) noexcept
{
    try
    {
        return body();
    }
    catch (...)
    {
        return SCC_E_NONSPECIFICERROR;
    }
}

/// Calls the function of the real library that serves the context.
template <typename Call, typename... Arguments>
SCCRTN Forward(const Call& call, LPVOID context, Arguments... arguments) noexcept
{
    return Guarded([&] {
        const std::shared_ptr<IsolatedLibrary> library = contexts.Find(context);
        return library ? library->Call(call, context, arguments...) : SCC_E_INITIALIZEFAILED;
    });
}

/// Calls a function that has no context for all contexts. The first failure counts.
SCCRTN ForwardToAll(const SccCall<>& call) noexcept
{
    return Guarded([&] {
        SCCRTN result = SCC_OK;
        for (const std::shared_ptr<IsolatedLibrary>& library : contexts.All())
        {
            const SCCRTN one = library->Call(call);
            result = result == SCC_OK ? one : result;
        }
        return result;
    });
}

} // namespace

extern "C" {

LONG SccGetVersion()
{
    const SCCRTN version = Guarded([] { return contexts.Find(nullptr)->Call(SccCalls::GetVersion); });
    return std::max<LONG>(version, 0); // the interface has no failure here
}

SCCRTN SccInitialize(LPVOID* context, HWND window, LPCSTR caller, LPSTR sccName, LPLONG capabilities,
                     LPSTR auxPathLabel, LPLONG checkoutCommentLength, LPLONG commentLength)
{
    return Guarded([&] {
        if (context == nullptr)
        {
            return SCC_E_INITIALIZEFAILED;
        }
        const std::shared_ptr<IsolatedLibrary> library = contexts.Take();
        const SCCRTN result = library->Call(SccCalls::Initialize, context, window, caller, sccName, capabilities,
                                            auxPathLabel, checkoutCommentLength, commentLength);
        if (result != SCC_OK)
        {
            contexts.PutBack(library);
            return result;
        }
        library->Listen();
        *context = contexts.Add(library);
        return result;
    });
}

SCCRTN SccUninitialize(LPVOID context)
{
    return Guarded([&] {
        if (context == nullptr)
        {
            return contexts.Take()->Uninitialize();
        }
        const std::shared_ptr<IsolatedLibrary> library = contexts.Remove(context);
        return library ? library->Uninitialize() : SCC_E_INITIALIZEFAILED;
    });
}

SCCRTN SccOpenProject(LPVOID context, HWND window, LPSTR user, LPCSTR projectName, LPCSTR localPath, LPSTR auxPath,
                      LPCSTR comment, LPTEXTOUTPROC output, LONG flags)
{
    return Forward(SccCalls::OpenProject, context, window, user, projectName, localPath, auxPath, comment, output,
                   flags);
}

SCCRTN SccCloseProject(LPVOID context)
{
    return Forward(SccCalls::CloseProject, context);
}

SCCRTN SccGetProjPath(LPVOID context, HWND window, LPSTR user, LPSTR projectName, LPSTR localPath, LPSTR auxPath,
                      BOOL allowChangePath, LPBOOL isNew)
{
    return Forward(SccCalls::GetProjPath, context, window, user, projectName, localPath, auxPath, allowChangePath,
                   isNew);
}

SCCRTN SccGet(LPVOID context, HWND window, LONG count, LPCSTR* names, LONG options, LPCMDOPTS block)
{
    return Forward(SccCalls::Get, context, window, count, names, options, block);
}

SCCRTN SccCheckout(LPVOID context, HWND window, LONG count, LPCSTR* names, LPCSTR comment, LONG options,
                   LPCMDOPTS block)
{
    return Forward(SccCalls::Checkout, context, window, count, names, comment, options, block);
}

SCCRTN SccUncheckout(LPVOID context, HWND window, LONG count, LPCSTR* names, LONG options, LPCMDOPTS block)
{
    return Forward(SccCalls::Uncheckout, context, window, count, names, options, block);
}

SCCRTN SccCheckin(LPVOID context, HWND window, LONG count, LPCSTR* names, LPCSTR comment, LONG options, LPCMDOPTS block)
{
    return Forward(SccCalls::Checkin, context, window, count, names, comment, options, block);
}

SCCRTN SccAdd(LPVOID context, HWND window, LONG count, LPCSTR* names, LPCSTR comment, LONG* options, LPCMDOPTS block)
{
    return Forward(SccCalls::Add, context, window, count, names, comment, options, block);
}

SCCRTN SccBeginBatch()
{
    return ForwardToAll(SccCalls::BeginBatch);
}

SCCRTN SccEndBatch()
{
    return ForwardToAll(SccCalls::EndBatch);
}

SCCRTN SccHistory(LPVOID context, HWND window, LONG count, LPCSTR* names, LONG options, LPCMDOPTS block)
{
    return Forward(SccCalls::History, context, window, count, names, options, block);
}

SCCRTN SccProperties(LPVOID context, HWND window, LPCSTR name)
{
    return Forward(SccCalls::Properties, context, window, name);
}

SCCRTN SccQueryInfo(LPVOID context, LONG count, LPCSTR* names, LPLONG status)
{
    return Forward(SccCalls::QueryInfo, context, count, names, status);
}

SCCRTN SccPopulateList(LPVOID context, SCCCOMMAND command, LONG count, LPCSTR* names, POPLISTFUNC callback,
                       LPVOID callerData, LPLONG status, LONG options)
{
    return Forward(SccCalls::PopulateList, context, command, count, names, callback, callerData, status, options);
}

SCCRTN SccRunScc(LPVOID context, HWND window, LONG count, LPCSTR* names)
{
    return Forward(SccCalls::RunScc, context, window, count, names);
}

SCCRTN SccGetCommandOptions(LPVOID context, HWND window, SCCCOMMAND command, LPCMDOPTS* block)
{
    return Forward(SccCalls::GetCommandOptions, context, window, command, block);
}

SCCRTN SccAddFromScc(LPVOID context, HWND window, LPLONG count, LPCSTR** names)
{
    return Forward(SccCalls::AddFromScc, context, window, count, names);
}

SCCRTN SccSetOption(LPVOID context, LONG option, LONG value)
{
    return Forward(SccCalls::SetOption, context, option, value);
}

} // extern "C"

extern "C" BOOL WINAPI DllMain(HINSTANCE module, DWORD reason, LPVOID)
{
    if (reason == DLL_PROCESS_ATTACH)
    {
        proxyModule = module;
        searchFolder = DllDirectory();
        DisableThreadLibraryCalls(module);
    }
    return TRUE;
}
