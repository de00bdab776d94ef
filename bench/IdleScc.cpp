// An MSSCCI library that does nothing at once; it only remembers how much memory its process had in the middle of
// the last SccQueryInfo.

#include "MSSCCI.h"

#include <psapi.h>

namespace
{

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
    PROCESS_MEMORY_COUNTERS counters = {};
    GetProcessMemoryInfo(GetCurrentProcess(), &counters, sizeof counters);
    memoryInQuery = counters.PagefileUsage;
    return SCC_OK;
}

SIZE_T MemoryInQuery()
{
    return memoryInQuery;
}

} // extern "C"
