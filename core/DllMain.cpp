#include "BraeSDKUtil.h"
#include "ExceptionReserve.h"
#include "LibraryModule.h"

#include <windows.h>

/// Start and stop of the library. What it holds for the whole process frees itself when it is unloaded.
extern "C" BOOL WINAPI DllMain(HINSTANCE module, DWORD reason, LPVOID processEnds)
{
    if (reason == DLL_PROCESS_ATTACH)
    {
        ReserveForExceptions();
        BraeSDK::Util::UseLanguagePackLocale(module);
        RememberLibraryModule(module);
        DisableThreadLibraryCalls(module);
    }
    else if (reason == DLL_PROCESS_DETACH && processEnds == nullptr)
    {
        FreeExceptionReserve();
    }
    return TRUE;
}
