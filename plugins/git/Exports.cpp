// The functions of the plug-in contract; git.def exports them under their plain names.

#include "GitProvider.h"
#include "OrvixKnownFiles.h"
#include "OrvixVersion.h"

#include <windows.h>

#include <cstdint>
#include <memory>

namespace
{

/// The only provider of this module. A host may ask for it several times and expects the same session each time. It is
/// deleted by the last release, or when the module is unloaded, since a host need not release it.
std::unique_ptr<GitProvider> theProvider;
int requests = 0;

/// Keeps this module in memory until the process ends. GCC's run-time, which is linked into it, keeps two handles for
/// the threads of a module, and would leave them open at each unload.
void StayLoaded()
{
#if defined(__MINGW32__)
    HMODULE self = nullptr;
    GetModuleHandleExW(GET_MODULE_HANDLE_EX_FLAG_PIN | GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS,
                       reinterpret_cast<const wchar_t*>(&theProvider), &self);
#endif
}

} // namespace

extern "C" std::int32_t GetOrvixVersion()
{
    return ORVIX_PLUGIN_CONTRACT_VERSION;
}

extern "C" const wchar_t* GetOrvixProviderName()
{
    return GitProvider::Name;
}

/// Null when the host's heap is exhausted: the provider's operator new does not throw.
extern "C" IOrvixProvider* GetIOrvixProvider()
{
    if (!theProvider)
    {
        StayLoaded();
        theProvider.reset(new GitProvider);
    }
    if (theProvider)
    {
        ++requests;
    }
    return theProvider.get();
}

extern "C" void ReleaseIOrvixProvider(IOrvixProvider* provider)
{
    if (provider != nullptr && provider == theProvider.get() && --requests == 0)
    {
        theProvider.reset();
    }
}

/// As `OrvixKnownFilesFunction` describes.
extern "C" int GetOrvixKnownFiles(IOrvixProvider* provider, const wchar_t* folder, OrvixKnownFileCallback callback,
                                  void* callerData)
{
    const bool isOurs = provider != nullptr && provider == theProvider.get();
    return isOurs ? theProvider->NameKnownFiles(folder, callback, callerData) : OrvixProviderResult::Failure;
}
