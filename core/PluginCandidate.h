#pragma once

#include "OrvixProviderEntry.h"

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

class OrvixProviderConfigManager;

/// One file of the plug-in folder, judged: why it is a provider, or is none.
struct PluginCandidate
{
    enum class Verdict
    {
        Listed,
        PathTooLong,
        DoesNotLoad,
        OtherVersion,
        Incomplete,
        Throws,
        SwitchedOff
    };

    /// Loads the plug-in and asks for its version and its name. Throws std::bad_alloc; what the plug-in itself throws
    /// makes the verdict.
    static PluginCandidate Judge(const std::wstring& path, const ManifestContext& context,
                                 const OrvixProviderConfigManager& configs);

    Verdict verdict = Verdict::PathTooLong;
    DWORD loadError = ERROR_SUCCESS;           ///< the system's, of what does not load
    std::int32_t version = 0;                  ///< of the contract, as the plug-in says; 0 when it was not asked
    std::vector<const char*> missing;          ///< functions of the contract that an incomplete one lacks
    std::unique_ptr<OrvixProviderEntry> entry; ///< of what loads; frees it

private:
    Verdict Ask(const OrvixProviderConfigManager& configs);
    template <class Function>
    Function* Export(const char* name);
};
