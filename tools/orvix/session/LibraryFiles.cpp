#include "LibraryFiles.h"

#include "ExceptionBarrier.h"
#include "GuardedCall.h"
#include "IOrvixClientAccess.h"
#include "NarrowPaths.h"
#include "OrvixMSSCC.h"
#include "OrvixProviderConfig.h"
#include "Text.h"
#include "WStr.h"

namespace
{

/// Where texts of the library go while it lists its files. A library hands its text to the function alone.
class TextReceiver
{
public:
    explicit TextReceiver(IOrvixClientAccess* access) { s_access = access; }
    TextReceiver(const TextReceiver&) = delete;
    TextReceiver& operator=(const TextReceiver&) = delete;
    ~TextReceiver() { s_access = nullptr; }

    static LONG Receive(LPCSTR text, LONG)
    {
        const WStr wide(text);
        if (wide.Get() != nullptr && s_access != nullptr)
        {
            Completes([&] { s_access->OutputText(wide.Get(), 0); });
        }
        return SCC_MSG_RTN_OK;
    }

private:
    static inline IOrvixClientAccess* s_access = nullptr;
};

struct Listener
{
    OrvixKnownFileCallback callback;
    void* callerData;
};

BOOL AddFile(LPVOID callerData, BOOL add, LONG, LPSTR fileName)
{
    const auto& listener = *static_cast<const Listener*>(callerData);
    const WStr wide(fileName);
    if (add != FALSE && wide.Get() != nullptr)
    {
        listener.callback(listener.callerData, wide.Get());
    }
    return TRUE;
}

} // namespace

void LibraryFiles::Name(const InstalledProviders::Candidate& library, OrvixClientInfo& client, const Place& place,
                        OrvixKnownFileCallback callback, void* callerData)
{
    NarrowPaths project(1);
    NarrowPaths folder(1);
    if (!project.Add(place.project.c_str()) || !folder.Add(place.folder.c_str()))
    {
        return;
    }
    const auto call = [&library](const char* function, auto work) {
        return GuardedCall(function + (" of " + Utf8(library.name)), work);
    };
    const TextReceiver receiver(client.GetIOrvixClientAccess());
    OrvixMSSCC bridge;
    bridge.SetProvider(library.serverPath.c_str(), library.searchPath.c_str(), library.name.c_str(), false);
    bridge.SetParentWindow(client.GetParentWindow());
    if (library.config != nullptr)
    {
        bridge.SetProjectSettingsFile(library.config->m_msSccProjectFile);
    }
    if (call("SccInitialize", [&] { return bridge.Initialize("orvix"); }) != SCC_OK)
    {
        return;
    }
    const auto open = [&] { return bridge.OpenProject(*project.Get(), "", TextReceiver::Receive); };
    if ((bridge.Capabilities() & SCC_CAP_POPULATELIST) != 0 && call("SccOpenProject", open) == SCC_OK)
    {
        Listener listener{callback, callerData};
        LONG status = SCC_STATUS_NOTCONTROLLED;
        call("SccPopulateList", [&] {
            return bridge.PopulateList(SCC_COMMAND_GET, folder.Count(), folder.Get(), AddFile, &listener, &status,
                                       SCC_PL_DIR);
        });
    }
    call("SccUninitialize", [&] { return bridge.Uninitialize(); });
}
