#pragma once

#include "IsolatedLoad.h"

#include <string>

class IOrvixProvider;
class OrvixProviderConfig;

/// One discovered provider. Destroying an entry frees its library; the services object releases `provider`
/// before that.
class OrvixProviderEntry
{
public:
    OrvixProviderEntry() = default;
    OrvixProviderEntry(const OrvixProviderEntry&) = delete;
    OrvixProviderEntry& operator=(const OrvixProviderEntry&) = delete;
    virtual ~OrvixProviderEntry() = default;

    std::wstring name;
    bool isMSSCCI = false;
    IOrvixProvider* provider = nullptr; ///< the wrapper of an MSSCCI library; always null for a plug-in
    UniqueModule module;                ///< the plug-in's library; null for an MSSCCI library
    OrvixProviderConfig* config = nullptr;
    IOrvixProvider* (*getProvider)() = nullptr;
    void (*releaseProvider)(IOrvixProvider*) = nullptr;
};
