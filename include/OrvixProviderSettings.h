#pragma once

class OrvixProviderConfig;

/// The administrator's settings for one provider: the element of "OrvixProviders.xml" that applies to its name. A
/// plug-in reads them itself with this class, by the rules that the library follows.
///
/// Link the static library `OrvixCore::Settings`. Reading initialises COM on the calling thread and uninitialises it
/// again. No operation throws. All operations: [plug-in, main-thread].
class OrvixProviderSettings
{
public:
    /// Reads the file. `configFolder` is what `OrvixClientInfo::GetConfigFilePath` returns, and `providerName` the name
    /// that the plug-in exports; both live only for the call. Without a file that can be read, and when no element
    /// applies to the name, the settings are the defaults. Each reading keeps its memory until the process ends: read
    /// once in `IOrvixProvider::Initialize`.
    OrvixProviderSettings(const wchar_t* configFolder, const wchar_t* providerName) noexcept;

    /// True when the file has an element for the provider.
    bool AreFound() const noexcept { return m_config != nullptr; }

    /// False when the administrator has switched the provider off; the library does not list it then.
    bool IsEnabled() const noexcept;

    /// The text of "FixedProjectRoot", as it is written; empty by default. Valid until the process ends.
    const wchar_t* GetFixedProjectRoot() const noexcept;

    /// The text of "AltProviderExecutable", as it is written; empty by default. Valid until the process ends.
    const wchar_t* GetAltProviderExecutable() const noexcept;

    /// True when one of the provider's filters excludes the file. `path` is a full path; null gives false.
    bool IsFileExcluded(const wchar_t* path) const noexcept;

private:
    const OrvixProviderConfig* m_config = nullptr;
};
