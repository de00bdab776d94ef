// GCC's run-time is linked into the module. At its start it reserves 73 KB for exceptions. They are freed here, since a
// host may load and unload a plug-in often, for example one that is switched off.

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
