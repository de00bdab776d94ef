#pragma once

#include <vector>

class OrvixProviderConfig;
struct FileDiagnostics;

/// The administrator's settings from "OrvixProviders.xml". The file is only read.
class OrvixProviderConfigManager
{
public:
    static constexpr wchar_t FileName[] = L"OrvixProviders.xml";
    static constexpr wchar_t RootName[] = L"OrvixProviders"; ///< in any letter case

    OrvixProviderConfigManager();
    OrvixProviderConfigManager(const OrvixProviderConfigManager&) = delete;
    OrvixProviderConfigManager& operator=(const OrvixProviderConfigManager&) = delete;

    /// Frees the list only: configurations live until the process ends.
    virtual ~OrvixProviderConfigManager();

    /// Appends the configurations of a file; false with nothing added when the path is null, the file has no
    /// "OrvixProviders" element (a missing or broken file has none) or memory is exhausted. `diagnostics` may be null.
    bool LoadConfig(const wchar_t* path, FileDiagnostics* diagnostics = nullptr);

    /// The first configuration whose name occurs anywhere in `providerName`, in any letter case; null when
    /// there is none or the name is null. Throws std::bad_alloc, since null would mean "not switched off".
    OrvixProviderConfig* FindConfig(const wchar_t* providerName) const;

    /// Every configuration whose name occurs in `providerName`: first the one that `FindConfig` gives, then those that
    /// it hides. Throws std::bad_alloc.
    std::vector<OrvixProviderConfig*> FindAllConfigs(const wchar_t* providerName) const;

private:
    std::vector<OrvixProviderConfig*> m_configs;
};
