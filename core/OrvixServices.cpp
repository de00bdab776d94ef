#include "OrvixServices.h"

#include "ActivationContext.h"
#include "ExceptionBarrier.h"
#include "FileListOperation.h"
#include "HostHeap.h"
#include "IOrvixClientAccess.h"
#include "IOrvixCoreUI.h"
#include "IOrvixProvider.h"
#include "InstalledProviders.h"
#include "LibraryModule.h"
#include "OrvixClientInfo.h"
#include "OrvixDialogOption.h"
#include "OrvixFileListDialogParams.h"
#include "OrvixMSSCC.h"
#include "OrvixOperation.h"
#include "OrvixPrompt.h"
#include "OrvixProviderConfig.h"
#include "OrvixProviderSource.h"
#include "OrvixProviderWrapper.h"
#include "PluginCandidate.h"
#include "PluginSearch.h"
#include "PromptFile.h"

#include <windows.h>

#include <new>
#include <utility>

IOrvixServices* GetIOrvixServices()
{
    // With (): the object is filled with zeros before its members are made.
    return new (std::nothrow) OrvixServices();
}

void ReleaseIOrvixServices(IOrvixServices* services)
{
    if (services != nullptr)
    {
        static_cast<OrvixServices*>(services)->Release();
    }
}

void OrvixServices::Release()
{
    if (m_operations > 0)
    {
        m_releaseWaits = true;
        return;
    }
    delete this;
}

/// At the end of the outermost operation: what waited for it, still held, since releasing providers runs their code.
/// The object may be gone afterwards.
void OrvixServices::EndHeld()
{
    while (std::exchange(m_shutdownWaits, false))
    {
        Completes([this] { SaveAndReleaseProviders(); });
    }
    m_operations = 0;
    if (m_releaseWaits)
    {
        delete this;
    }
}

bool OrvixServices::Initialize(OrvixClientInfo* info, std::uint32_t sources)
{
    if (info == nullptr || m_operations > 0)
    {
        return false;
    }
    const Hold hold(*this);
    return WithXmlBarrier(false, [&] {
        if (const wchar_t* configPath = info->GetConfigFilePath())
        {
            m_configFolder = std::wstring(configPath) + L'\\';
        }
        WithXmlBarrier(false, [&] {
            return m_config.LoadConfig((m_configFolder + OrvixProviderConfigManager::FileName).c_str());
        });
        m_userInterface.SetClientAccess(info->GetIOrvixClientAccess());
        LoadPrompts();
        const bool pluginsAdded =
            (sources & OrvixProviderSource::Plugins) != 0 && WithBarrier(false, [&] { return DiscoverPlugins(info); });
        const bool registryRead = (sources & OrvixProviderSource::InstalledMSSCCI) != 0 && DiscoverMSSCCIProviders();
        m_initialized = true;
        return pluginsAdded || registryRead;
    });
}

void OrvixServices::Shutdown()
{
    if (m_operations > 0)
    {
        m_shutdownWaits = true;
        return;
    }
    const Hold hold(*this);
    SaveAndReleaseProviders();
}

void OrvixServices::SaveAndReleaseProviders()
{
    SavePrompts();
    ReleaseProviders();
}

OrvixServices::~OrvixServices()
{
    ++m_operations; // what a provider's last code calls waits for ever
    if (m_initialized)
    {
        try
        {
            SavePrompts();
        }
        catch (const _com_error&)
        {
        }
        ReleaseProviders();
    }
}

void OrvixServices::ReleaseProviders()
{
    // Taken out first: a library that shows windows when it ends may let the host call back.
    auto providers = std::exchange(m_providers, {});
    m_initialized = false;
    for (auto& entry : providers)
    {
        entry.reset(); // in order of discovery
    }
}

std::uint32_t OrvixServices::GetProviderCount()
{
    return static_cast<std::uint32_t>(m_providers.size());
}

const wchar_t* OrvixServices::GetProviderName(std::uint32_t index)
{
    return index < GetProviderCount() ? m_providers[index]->name.c_str() : nullptr;
}

IOrvixProvider* OrvixServices::GetProvider(std::uint32_t index)
{
    const Hold hold(*this);
    if (index >= GetProviderCount())
    {
        return nullptr;
    }
    const OrvixProviderEntry& entry = *m_providers[index];
    if (entry.isMSSCCI)
    {
        return entry.provider.get();
    }
    return WithBarrier(static_cast<IOrvixProvider*>(nullptr), [&] { return entry.getProvider(); });
}

std::int32_t OrvixServices::ShowPrompt(void* a, void* b, void* c, std::uint32_t options, std::uint32_t promptID,
                                       bool* dontAskAgain)
{
    const Hold hold(*this);
    return WithBarrier(OrvixPromptAnswer::No, [&] {
        const bool stored = promptID != OrvixPromptID::None;
        if (stored)
        {
            const bool locked = m_answers.IsLocked(promptID);
            const std::uint32_t action = m_answers.GetAction(promptID);
            const bool ask = (action & OrvixPromptAction::Ask) != 0;
            if (!ask && dontAskAgain != nullptr)
            {
                *dontAskAgain = true;
            }
            if (m_userInterface.IsUnattended() || !ask)
            {
                return OrvixPromptAction::ToAnswer(action);
            }
            if (locked)
            {
                options &= ~OrvixPromptOption::OfferStopAsking;
            }
        }
        bool stopAsking = false;
        const std::int32_t answer = m_userInterface.CoreUI().ShowPrompt(a, b, c, options, &stopAsking);
        if (dontAskAgain != nullptr)
        {
            *dontAskAgain = stopAsking;
        }
        if (stored && (options & OrvixPromptOption::OfferStopAsking) != 0 && stopAsking)
        {
            m_answers.SetAction(promptID, OrvixPromptAction::FromAnswer(answer));
        }
        return answer;
    });
}

std::int32_t OrvixServices::ShowFileListDialog(void* a, OrvixFileListDialogParams* params)
{
    const Hold hold(*this);
    return WithBarrier(OrvixDialogResult::Cancelled,
                       [&] { return m_userInterface.CoreUI().ShowFileListDialog(a, params); });
}

std::int32_t OrvixServices::RunFileListOperation(void* a, OrvixFileListDialogParams* params, bool callProviderFirst,
                                                 IOrvixProvider* provider, std::uint32_t operations,
                                                 std::uint32_t flagsOutMask)
{
    const Hold hold(*this);
    return WithBarrier(OrvixOperationResult::Cancelled, [&] {
        OrvixFileList* list = params != nullptr ? params->GetOrvixFileList() : nullptr;
        if (list == nullptr)
        {
            return OrvixOperationResult::Cancelled;
        }
        return FileListOperation(m_answers, m_userInterface, a, *params, *list, provider, operations)
            .Run(callProviderFirst, flagsOutMask);
    });
}

std::uint32_t OrvixServices::GetPromptAction(std::uint32_t promptID)
{
    return m_answers.GetAction(promptID);
}

bool OrvixServices::SetPromptAction(std::uint32_t promptID, std::uint32_t action)
{
    return m_answers.SetAction(promptID, action);
}

bool OrvixServices::RegisterPrompt(std::uint32_t promptID, const wchar_t* text, std::uint32_t action,
                                   std::uint32_t actionOpts, bool overwriteSettings)
{
    m_answers.Register(promptID, text, action, actionOpts, overwriteSettings);
    return true;
}

std::int32_t OrvixServices::EditPrompts(void* a, void* b)
{
    const Hold hold(*this);
    return WithXmlBarrier(OrvixPromptEditorResult::Unchanged, [&] {
        const std::int32_t result = m_userInterface.CoreUI().EditPrompts(a, b, &m_answers.Table());
        if (result == OrvixPromptEditorResult::Changed)
        {
            SavePrompts();
        }
        return result;
    });
}

const wchar_t* OrvixServices::GetProviderFixedProjectRoot(std::uint32_t index)
{
    const OrvixProviderConfig* config = ConfigOf(index);
    return config != nullptr ? config->m_fixedProjectRoot.c_str() : nullptr;
}

const wchar_t* OrvixServices::GetProviderAltExecutable(std::uint32_t index)
{
    const OrvixProviderConfig* config = ConfigOf(index);
    return config != nullptr ? config->m_altProviderExecutable.c_str() : nullptr;
}

bool OrvixServices::IsFileExcludedByProvider(std::uint32_t index, const wchar_t* fileName, std::wstring* filterName)
{
    const OrvixProviderConfig* config = ConfigOf(index);
    return config != nullptr && config->IsFileExcluded(fileName, filterName);
}

std::intptr_t OrvixServices::ClientRelayA(void* a, void* b, void* c, void* d)
{
    IOrvixClientAccess* access = m_userInterface.ClientAccess();
    return access != nullptr ? access->RelayA(a, b, c, d) : 0;
}

std::uint32_t OrvixServices::GetColor(std::int32_t index)
{
    IOrvixClientAccess* access = m_userInterface.ClientAccess();
    return access != nullptr ? access->GetColor(index) : GetSysColor(index);
}

std::intptr_t OrvixServices::ClientRelayB(void* a, void* b, void* c, void* d)
{
    IOrvixClientAccess* access = m_userInterface.ClientAccess();
    return access != nullptr ? access->RelayB(a, b, c, d) : 0;
}

/// Appends every accepted plug-in of the client's plug-in folder; true when there was one.
bool OrvixServices::DiscoverPlugins(OrvixClientInfo* info)
{
    PluginSearch search(*info);
    if (search.GetState() != PluginSearch::State::Found)
    {
        return false;
    }
    const UniqueActivationContext context = MakeManifestContext(LibraryModule());
    bool added = false;
    for (; search.GetState() == PluginSearch::State::Found; search.Next())
    {
        added |= WithBarrier(false, [&] {
            PluginCandidate candidate = PluginCandidate::Judge(search.Path(), context, m_config);
            if (candidate.verdict != PluginCandidate::Verdict::Listed)
            {
                return false;
            }
            m_providers.push_back(std::move(candidate.entry));
            return true;
        });
    }
    return added;
}

/// Appends every installed MSSCCI library that can be set up; false when the registry's list cannot be opened. The
/// libraries themselves are loaded on first use.
bool OrvixServices::DiscoverMSSCCIProviders()
{
    const UniqueRegistryKey list = InstalledProviders::OpenList();
    if (!list)
    {
        return false;
    }
    for (DWORD index = 0;; ++index)
    {
        const bool more = WithBarrier(true, [&] {
            std::wstring keyPath;
            const InstalledProviders::Step step = InstalledProviders::KeyPathAt(list.Get(), index, keyPath);
            if (step == InstalledProviders::Step::EndsProcess)
            {
                InstalledProviders::EndProcess();
            }
            if (step == InstalledProviders::Step::Found)
            {
                AddMSSCCIProvider(keyPath);
            }
            return step != InstalledProviders::Step::End;
        });
        if (!more)
        {
            return true;
        }
    }
}

/// Appends the provider of a registry key unless it is incomplete or switched off.
void OrvixServices::AddMSSCCIProvider(const std::wstring& keyPath)
{
    const InstalledProviders::Candidate candidate = InstalledProviders::Judge(keyPath, m_config);
    if (candidate.verdict == InstalledProviders::Verdict::EndsProcess)
    {
        InstalledProviders::EndProcess();
    }
    if (candidate.verdict != InstalledProviders::Verdict::Listed)
    {
        return;
    }

    auto bridge = std::make_unique<OrvixMSSCC>();
    bridge->SetProvider(candidate.serverPath.c_str(), candidate.searchPath.c_str(), candidate.name.c_str(), false);
    if (candidate.config != nullptr)
    {
        bridge->SetProjectSettingsFile(candidate.config->m_msSccProjectFile);
    }
    auto wrapper = MakeOnHostHeap<OrvixProviderWrapper>();
    wrapper->SetMSSCC(std::move(bridge));
    auto entry = std::make_unique<OrvixProviderEntry>();
    entry->name = candidate.name;
    entry->config = candidate.config;
    entry->isMSSCCI = true;
    entry->provider = std::move(wrapper);
    m_providers.push_back(std::move(entry));
}

bool OrvixServices::LoadPrompts()
{
    return WithXmlBarrier(false, [&] { return m_answers.Load((m_configFolder + PromptFileName).c_str()); });
}

bool OrvixServices::SavePrompts()
{
    return WithXmlBarrier(false, [&] { return m_answers.Save((m_configFolder + PromptFileName).c_str()); });
}

OrvixProviderConfig* OrvixServices::ConfigOf(std::uint32_t index)
{
    return index < GetProviderCount() ? m_providers[index]->config : nullptr;
}
