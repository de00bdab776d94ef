/* A complete plug-in, but for 32-bit processes. */

#include <wchar.h>

int GetOrvixVersion(void)
{
    return 200;
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
