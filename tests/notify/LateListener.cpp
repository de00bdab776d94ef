// A host's library that unregisters its listener when the process detaches it, after OrvixCore.dll is detached.

#include "IOrvixNotifyCallback.h"

#include <windows.h>

namespace
{

class Listener final : public IOrvixNotifyCallback
{
public:
    std::uint32_t Notify(OrvixNotifyParams*, std::int64_t) override { return 0; }
} listener;

bool (*unregister)(IOrvixNotifyCallback*) = nullptr;

} // namespace

/// Takes the library's operation and gives the listener to register.
extern "C" __declspec(dllexport) IOrvixNotifyCallback* GetListener(bool (*operation)(IOrvixNotifyCallback*))
{
    unregister = operation;
    return &listener;
}

BOOL WINAPI DllMain(HINSTANCE, DWORD reason, void*)
{
    if (reason == DLL_PROCESS_DETACH && unregister != nullptr && unregister(&listener))
    {
        TerminateProcess(GetCurrentProcess(), 2); // the registry must be gone already, and know no listener
    }
    return TRUE;
}
