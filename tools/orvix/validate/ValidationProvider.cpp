#include "ValidationProvider.h"

#include "CommandLine.h"
#include "InstalledProviders.h"
#include "OrvixProviderSource.h"
#include "PluginCandidate.h"
#include "SccFunctions.h"
#include "Text.h"

namespace
{

constexpr wchar_t Name[] = L"Validated";

void Demand(LSTATUS status)
{
    if (status != ERROR_SUCCESS)
    {
        throw RuleSkipped("it cannot be registered for this process alone: " +
                          Utf8(SystemMessage(static_cast<DWORD>(status), L"")));
    }
}

/// A key that would go with the session should this process be ended here.
UniqueRegistryKey NewKey(HKEY parent, const wchar_t* path)
{
    HKEY key = nullptr;
    Demand(RegCreateKeyExW(parent, path, 0, nullptr, REG_OPTION_VOLATILE, KEY_ALL_ACCESS, nullptr, &key, nullptr));
    return UniqueRegistryKey(key);
}

/// A key of the user for this process, which goes with this object.
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

/// A key in the place of HKEY_LOCAL_MACHINE, for this process alone, under which one MSSCCI library is registered: the
/// machine's own registry is left alone, and the services object finds this library and no other.
class PrivateRegistration
{
public:
    /// Throws `RuleSkipped` when the system refuses: another library would be validated.
    explicit PrivateRegistration(const std::wstring& library)
    {
        const UniqueRegistryKey list = NewKey(m_root.Get(), InstalledProviders::ListPath);
        const UniqueRegistryKey provider = NewKey(m_root.Get(), Name);
        Write(list.Get(), Name, Name);
        Write(provider.Get(), InstalledProviders::ServerName, Name);
        Write(provider.Get(), InstalledProviders::ServerPath, library);
        Demand(RegOverridePredefKey(HKEY_LOCAL_MACHINE, m_root.Get()));
    }
    PrivateRegistration(const PrivateRegistration&) = delete;
    PrivateRegistration& operator=(const PrivateRegistration&) = delete;
    ~PrivateRegistration() { RegOverridePredefKey(HKEY_LOCAL_MACHINE, nullptr); }

private:
    static void Write(HKEY key, const wchar_t* name, const std::wstring& text)
    {
        Demand(RegSetValueExW(key, name, 0, REG_SZ, reinterpret_cast<const BYTE*>(text.c_str()),
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
        throw RuleSkipped("it gives no provider");
    }
}

ValidationProvider::~ValidationProvider()
{
    const auto end = [this](const char* what, bool needed, auto work) {
        if (needed)
        {
            m_subject.Tell(ValidationSubject::Step, what);
            work();
        }
    };
    try
    {
        end("CloseProject", m_provider->IsProjectOpen(), [this] { m_provider->CloseProject(); });
        end("Uninitialize", m_provider->IsInitialized(), [this] { m_provider->Uninitialize(); });
    }
    catch (...) // what it lets out is found where a rule calls these
    {
    }
    m_subject.Tell(ValidationSubject::Step, "releasing the provider");
}

void ValidationProvider::FindPlugin()
{
    m_library.emplace(m_subject);
    auto* const get = m_library->Need<IOrvixProvider*()>(PluginCandidate::GetProvider);
    m_provider = m_subject.Call(PluginCandidate::GetProvider, get);
}

void ValidationProvider::FindInstalled()
{
    const ValidationLibrary loads(m_subject);
    loads.Need<void()>(SccFunctions::GetVersion.name);
    m_services.reset(GetIOrvixServices());
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
    return m_subject.Call("OpenProject",
                          [this] { return m_provider->OpenProject(m_subject.Project().c_str(), L"validation"); });
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
    if (Initialize() != 0)
    {
        throw RuleSkipped("Initialize fails");
    }
    if (OpenProject() != 0)
    {
        throw RuleSkipped("OpenProject fails for the scratch project");
    }
}
