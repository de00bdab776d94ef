// An MSSCCI library that does nothing at once; when it is asked to, it remembers how much memory its process has in the
// middle of the next SccQueryInfo.

#include "MSSCCI.h"

#include <psapi.h>

namespace
{

bool isWatched = false;
SIZE_T memoryInQuery = 0;

} // namespace

extern "C" {

LONG SccGetVersion()
{
    return 0x00010003;
}

SCCRTN SccInitialize(LPVOID*, HWND, LPCSTR, LPSTR, LPLONG, LPSTR, LPLONG, LPLONG)
{
    return SCC_OK;
}

SCCRTN SccUninitialize(LPVOID)
{
    return SCC_OK;
}

SCCRTN SccOpenProject(LPVOID, HWND, LPSTR, LPCSTR, LPCSTR, LPSTR, LPCSTR, LPTEXTOUTPROC, LONG)
{
    return SCC_OK;
}

SCCRTN SccCheckout(LPVOID, HWND, LONG, LPCSTR*, LPCSTR, LONG, LPCMDOPTS)
{
    return SCC_OK;
}

SCCRTN SccQueryInfo(LPVOID, LONG, LPCSTR*, LPLONG)
{
    if (isWatched)
    {
        PROCESS_MEMORY_COUNTERS counters = {};
        GetProcessMemoryInfo(GetCurrentProcess(), &counters, sizeof counters);
        memoryInQuery = counters.PagefileUsage;
        isWatched = false;
    }
    return SCC_OK;
}

void WatchNextQuery()
{
    isWatched = true;
}

SIZE_T MemoryInQuery()
{
    return memoryInQuery;
}

} // extern "C"
