/* A complete plug-in, but for 32-bit processes. */

#include "OrvixVersion.h"

#include <wchar.h>

int GetOrvixVersion(void)
{
    return ORVIX_PLUGIN_CONTRACT_VERSION;
}

void* GetIOrvixProvider(void)
{
    return 0;
}

void ReleaseIOrvixProvider(void* provider)
{
    (void)provider;
}

const wchar_t* GetOrvixProviderName(void)
{
    return L"Wrong Bitness";
}
