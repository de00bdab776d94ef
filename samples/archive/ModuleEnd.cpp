// GCC's run-time is linked into the module. When it starts, it reserves 73 KB for exceptions, which the module would
// leave behind each time that a host unloads it: hosts load plug-ins only to look at them, too.

#include <windows.h>

#if defined(__MINGW32__)

namespace __gnu_cxx // of GCC's run-time, declared in no header
{

void __freeres(); // NOLINT(bugprone-reserved-identifier,readability-identifier-naming)

} // namespace __gnu_cxx

extern "C" BOOL WINAPI DllMain(HINSTANCE, DWORD reason, LPVOID processEnds)
{
    if (reason == DLL_PROCESS_DETACH && processEnds == nullptr)
    {
        __gnu_cxx::__freeres();
    }
    return TRUE;
}

#endif
