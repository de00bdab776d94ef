#include "ValidationProvider.h"

#include "InstalledProviders.h"
#include "OrvixProviderResult.h"
#include "OrvixProviderSource.h"
#include "PluginCandidate.h"
#include "SccFunctions.h"
#include "Text.h"

namespace
{

constexpr wchar_t Name[] = L"Validated";

void Check(LSTATUS status)
{
    if (status != ERROR_SUCCESS)
    {
        throw RuleSkipped("it cannot be registered for this process alone: " +
                          Utf8(SystemMessage(static_cast<DWORD>(status), L"")));
    }
}

/// A volatile key: the system removes it when the user logs off, also after this process was terminated.
UniqueRegistryKey NewKey(HKEY parent, const wchar_t* path)
{
    UniqueRegistryKey key;
    Check(RegCreateKeyExW(parent, path, 0, nullptr, REG_OPTION_VOLATILE, KEY_ALL_ACCESS, nullptr, key.Out(), nullptr));
    return key;
}

/// A key of the user for this process. It is deleted at the end.
class PrivateKey
{
public:
    PrivateKey() : m_key(NewKey(HKEY_CURRENT_USER, m_path.c_str())) {}
    PrivateKey(const PrivateKey&) = delete;
    PrivateKey& operator=(const PrivateKey&) = delete;
    ~PrivateKey() { RegDeleteTreeW(HKEY_CURRENT_USER, m_path.c_str()); }

    HKEY Get() const { return m_key.Get(); }

private:
    std::wstring m_path = L"Software\\OrvixCore\\Validation-" + std::to_wstring(GetCurrentProcessId());
    UniqueRegistryKey m_key;
};

/// Registers one MSSCCI library for this process alone, under a key that replaces HKEY_LOCAL_MACHINE. The registry of
/// the machine stays unchanged, and the services object finds this library only.
class PrivateRegistration
{
public:
    /// Throws `RuleSkipped` when the system refuses, since another library would be validated.
    explicit PrivateRegistration(const std::wstring& library)
    {
        const UniqueRegistryKey list = NewKey(m_root.Get(), InstalledProviders::ListPath);
        const UniqueRegistryKey provider = NewKey(m_root.Get(), Name);
        Write(list.Get(), Name, Name);
        Write(provider.Get(), InstalledProviders::ServerName, Name);
        Write(provider.Get(), InstalledProviders::ServerPath, library);
        Check(RegOverridePredefKey(HKEY_LOCAL_MACHINE, m_root.Get()));
    }
    PrivateRegistration(const PrivateRegistration&) = delete;
    PrivateRegistration& operator=(const PrivateRegistration&) = delete;
    ~PrivateRegistration() { RegOverridePredefKey(HKEY_LOCAL_MACHINE, nullptr); }

private:
    static void Write(HKEY key, const wchar_t* name, const std::wstring& text)
    {
        Check(RegSetValueExW(key, name, 0, REG_SZ, reinterpret_cast<const BYTE*>(text.c_str()),
                             static_cast<DWORD>((text.size() + 1) * sizeof(wchar_t))));
    }

    PrivateKey m_root;
};

} // namespace

ValidationProvider::ValidationProvider(ValidationSubject& subject) : m_subject(subject)
{
    m_client.SetClientName(L"orvix");
    m_client.SetUserName(L"validator");
    m_client.SetConfigFilePath(subject.Outside().c_str());
    m_client.SetIOrvixClientAccess(&m_access);
    if (subject.IsMSSCCI())
    {
        FindInstalled();
    }
    else
    {
        FindPlugin();
    }
    if (m_provider == nullptr)
    {
        throw RuleSkipped("it returns no provider");
    }
}

ValidationProvider::~ValidationProvider()
{
    try
    {
        Close();
    }
    catch (...) // a rule that calls these operations itself reports it
    {
    }
    ParentLink::Send(ParentLink::Step, "releasing the provider");
}

void ValidationProvider::Close()
{
    if (m_provider->IsProjectOpen())
    {
        CloseProject();
    }
    if (m_provider->IsInitialized())
    {
        Uninitialize();
    }
}

void ValidationProvider::FindPlugin()
{
    m_library.emplace(m_subject);
    auto* const get = m_library->Need<IOrvixProvider*()>(PluginCandidate::GetProvider);
    m_provider = m_subject.Call(PluginCandidate::GetProvider, get);
}

void ValidationProvider::FindInstalled()
{
    const ValidationLibrary library(m_subject); // skips the rule when it does not load
    library.Need<void()>(SccFunctions::GetVersion.name);
    m_services = MakeOrvixServices();
    if (m_services)
    {
        const PrivateRegistration registration(m_subject.Library());
        m_services->Initialize(&m_client, OrvixProviderSource::InstalledMSSCCI);
        m_provider = m_services->GetProvider(0);
    }
}

int ValidationProvider::Initialize()
{
    return m_subject.Call("Initialize", [this] { return m_provider->Initialize(&m_client); });
}

int ValidationProvider::OpenProject()
{
    return OpenProject(m_subject.Project());
}

int ValidationProvider::OpenProject(const std::wstring& folder)
{
    return m_subject.Call("OpenProject", [&] { return m_provider->OpenProject(folder.c_str(), L"validation"); });
}

int ValidationProvider::CloseProject()
{
    return m_subject.Call("CloseProject", [this] { return m_provider->CloseProject(); });
}

int ValidationProvider::Uninitialize()
{
    return m_subject.Call("Uninitialize", [this] { return m_provider->Uninitialize(); });
}

void ValidationProvider::Begin()
{
    if (Initialize() != OrvixProviderResult::Success)
    {
        throw RuleSkipped("Initialize fails");
    }
    if (OpenProject() != OrvixProviderResult::Success)
    {
        throw RuleSkipped("OpenProject fails for the scratch project");
    }
}
