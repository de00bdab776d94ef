#pragma once

#include "OrvixProviderEntry.h"

#include <array>
#include <cstdint>
#include <memory>
#include <optional>
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

    // The functions that a plug-in has to export.
    static constexpr const char* GetVersion = "GetOrvixVersion";
    static constexpr const char* GetProvider = "GetIOrvixProvider";
    static constexpr const char* ReleaseProvider = "ReleaseIOrvixProvider";
    static constexpr const char* GetName = "GetOrvixProviderName";
    static constexpr std::array Exports = {GetVersion, GetProvider, ReleaseProvider, GetName};

    /// Loads the plug-in and asks for its version and its name. Throws std::bad_alloc; an exception of the plug-in
    /// itself gives the verdict `Throws`.
    static PluginCandidate Judge(const std::wstring& path, const UniqueActivationContext& context,
                                 const OrvixProviderConfigManager& configs);

    /// The functions that the plug-in does not export, whatever the verdict; empty when it does not load. Throws
    /// std::bad_alloc.
    std::vector<const char*> FindMissingExports() const;

    Verdict verdict = Verdict::PathTooLong;
    DWORD loadError = ERROR_SUCCESS;           ///< the system's, of what does not load
    std::optional<std::int32_t> version;       ///< of the contract, as the plug-in says; nothing when it was not asked
    std::unique_ptr<OrvixProviderEntry> entry; ///< of what loads; frees it

private:
    Verdict Ask(const OrvixProviderConfigManager& configs);
    template <typename Function>
    Function* Export(const char* name) const;
};
