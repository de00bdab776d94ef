#pragma once

#include "IOrvixCoreUIClientAccess.h"
#include "IOrvixServices.h"
#include "OrvixProviderConfigManager.h"
#include "OrvixProviderEntry.h"
#include "StoredAnswers.h"
#include "UserInterface.h"

#include <memory>
#include <vector>

/// The services object. `IOrvixServices` and `IOrvixCoreUIClientAccess` say what the operations do.
class OrvixServices final : public IOrvixServices, public IOrvixCoreUIClientAccess
{
public:
    OrvixServices() = default;
    /// Destroys the object, at once or at the end of the operation in which it is called.
    void Release();

    OrvixServices(const OrvixServices&) = delete;
    OrvixServices& operator=(const OrvixServices&) = delete;

    bool Initialize(OrvixClientInfo* info, std::uint32_t sources) override;
    void Shutdown() override;
    std::uint32_t GetProviderCount() override;
    const wchar_t* GetProviderName(std::uint32_t index) override;
    IOrvixProvider* GetProvider(std::uint32_t index) override;
    std::int32_t ShowPrompt(void* a, void* b, void* c, std::uint32_t options, std::uint32_t promptID,
                            bool* dontAskAgain) override;
    std::int32_t ShowFileListDialog(void* a, OrvixFileListDialogParams* params) override;
    std::int32_t RunFileListOperation(void* a, OrvixFileListDialogParams* params, bool callProviderFirst,
                                      IOrvixProvider* provider, std::uint32_t operations,
                                      std::uint32_t flagsOutMask) override;
    std::uint32_t GetPromptAction(std::uint32_t promptID) override;
    bool SetPromptAction(std::uint32_t promptID, std::uint32_t action) override;
    bool RegisterPrompt(std::uint32_t promptID, const wchar_t* text, std::uint32_t action, std::uint32_t actionOpts,
                        bool overwriteSettings) override;
    std::int32_t EditPrompts(void* a, void* b) override;
    const wchar_t* GetProviderFixedProjectRoot(std::uint32_t index) override;
    const wchar_t* GetProviderAltExecutable(std::uint32_t index) override;
    bool IsFileExcludedByProvider(std::uint32_t index, const wchar_t* fileName, std::wstring* filterName) override;

    /// Shuts down when initialised; an error in saving is dropped here, since a destructor does not throw.
    ~OrvixServices() override;

    std::intptr_t ClientRelayA(void* a, void* b, void* c, void* d) override;
    std::uint32_t GetColor(std::int32_t index) override;
    std::intptr_t ClientRelayB(void* a, void* b, void* c, void* d) override;

private:
    /// Holds the object for an operation that calls foreign code: `Shutdown` and `Release` wait for the end of the last
    /// one. Declared first in an operation, which touches the object no more when it is gone.
    class Hold
    {
    public:
        explicit Hold(OrvixServices& services) : m_services(services) { ++services.m_operations; }
        Hold(const Hold&) = delete;
        Hold& operator=(const Hold&) = delete;
        ~Hold()
        {
            if (m_services.m_operations == 1)
            {
                m_services.EndHeld();
                return;
            }
            --m_services.m_operations;
        }

    private:
        OrvixServices& m_services;
    };

    void EndHeld();
    void SaveAndReleaseProviders();
    bool DiscoverPlugins(OrvixClientInfo* info);
    bool DiscoverMSSCCIProviders();
    void AddMSSCCIProvider(const std::wstring& keyPath);
    void ReleaseProviders();
    bool LoadPrompts();
    bool SavePrompts();
    OrvixProviderConfig* ConfigOf(std::uint32_t index);

    bool m_initialized = false;
    bool m_shutdownWaits = false;
    bool m_releaseWaits = false;
    unsigned int m_operations = 0; ///< operations that are running, one within the other
    std::vector<std::unique_ptr<OrvixProviderEntry>> m_providers;
    std::wstring m_configFolder;
    StoredAnswers m_answers;
    OrvixProviderConfigManager m_config;
    UserInterface m_userInterface{*this}; // last: the dialogs go first
};
