// The functions of the plug-in contract; archive.def exports them under their plain names.

#include "ArchiveProvider.h"
#include "OrvixKnownFiles.h"
#include "OrvixVersion.h"

#include <cstdint>
#include <memory>

namespace
{

/// The only provider of this module. A host may ask for it several times and expects the same session each time. It is
/// deleted by the last release, or when the module is unloaded, since a host need not release it.
std::unique_ptr<ArchiveProvider> theProvider;
int requests = 0;

} // namespace

extern "C" std::int32_t GetOrvixVersion()
{
    return ORVIX_PLUGIN_CONTRACT_VERSION;
}

extern "C" const wchar_t* GetOrvixProviderName()
{
    return ArchiveProvider::Name;
}

/// Null when the host's heap is exhausted: the provider's operator new does not throw.
extern "C" IOrvixProvider* GetIOrvixProvider()
{
    if (!theProvider)
    {
        theProvider.reset(new ArchiveProvider);
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
