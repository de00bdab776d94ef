#pragma once

#include "IOrvixProvider.h"
#include "UniqueHandle.h"

#include <memory>
#include <string>

class OrvixProviderConfig;

/// One discovered provider. Destroying an entry destroys its provider and then frees its library.
class OrvixProviderEntry
{
public:
    OrvixProviderEntry() = default;
    OrvixProviderEntry(const OrvixProviderEntry&) = delete;
    OrvixProviderEntry& operator=(const OrvixProviderEntry&) = delete;
    virtual ~OrvixProviderEntry() = default;

    std::wstring name;
    bool isMSSCCI = false;
    UniqueModule module;                      ///< the plug-in's library; empty for an MSSCCI library
    std::unique_ptr<IOrvixProvider> provider; ///< the wrapper of an MSSCCI library; always null for a plug-in
    OrvixProviderConfig* config = nullptr;
    IOrvixProvider* (*getProvider)() = nullptr;
    void (*releaseProvider)(IOrvixProvider*) = nullptr; ///< required of a plug-in and never called: it owns its objects
};
