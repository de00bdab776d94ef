#include "PluginCandidate.h"

#include "ExceptionBarrier.h"
#include "IsolatedLoad.h"
#include "OrvixProviderConfig.h"
#include "OrvixProviderConfigManager.h"
#include "OrvixVersion.h"
#include "PluginSearch.h"

#include <utility>

PluginCandidate PluginCandidate::Judge(const std::wstring& path, const UniqueActivationContext& context,
                                       const OrvixProviderConfigManager& configs)
{
    PluginCandidate candidate;
    if (path.size() > PluginSearch::MaxPath)
    {
        return candidate;
    }
    UniqueModule module = LoadLibraryIsolated(path.c_str(), context);
    if (!module)
    {
        candidate.loadError = GetLastError();
        candidate.verdict = Verdict::DoesNotLoad;
        return candidate;
    }
    candidate.entry = std::make_unique<OrvixProviderEntry>();
    candidate.entry->module = std::move(module);
    // Within the life of the entry: what a plug-in throws is destroyed by the plug-in's own code.
    candidate.verdict = WithBarrier(Verdict::Throws, [&] { return candidate.Ask(configs); });
    return candidate;
}

std::vector<const char*> PluginCandidate::FindMissingExports() const
{
    std::vector<const char*> missing;
    for (const char* name : Exports)
    {
        if (entry && (Export<void()>(name) == nullptr))
        {
            missing.push_back(name);
        }
    }
    return missing;
}

PluginCandidate::Verdict PluginCandidate::Ask(const OrvixProviderConfigManager& configs)
{
    auto* const getVersion = Export<std::int32_t()>(GetVersion);
    if (getVersion == nullptr)
    {
        return Verdict::Incomplete;
    }
    version = getVersion();
    if (version != ORVIX_PLUGIN_CONTRACT_VERSION)
    {
        return Verdict::OtherVersion;
    }
    entry->getProvider = Export<IOrvixProvider*()>(GetProvider);
    entry->releaseProvider = Export<void(IOrvixProvider*)>(ReleaseProvider);
    auto* const getName = Export<const wchar_t*()>(GetName);
    if (getName != nullptr)
    {
        // A null name stays the empty name, to which no configuration belongs.
        const wchar_t* name = getName();
        entry->name = name != nullptr ? name : L"";
        entry->config = configs.FindConfig(name);
    }
    if (entry->getProvider == nullptr || entry->releaseProvider == nullptr || getName == nullptr)
    {
        return Verdict::Incomplete;
    }
    return entry->config == nullptr || entry->config->m_enabled ? Verdict::Listed : Verdict::SwitchedOff;
}

/// A function of the plug-in; null when it is missing.
template <typename Function>
Function* PluginCandidate::Export(const char* name) const
{
    return reinterpret_cast<Function*>(reinterpret_cast<void (*)()>(GetProcAddress(entry->module.Get(), name)));
}
