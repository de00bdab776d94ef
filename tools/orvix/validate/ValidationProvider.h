#pragma once

#include "ClientAccess.h"
#include "IOrvixProvider.h"
#include "IOrvixServices.h"
#include "OrvixClientInfo.h"
#include "ValidationLibrary.h"

#include <memory>
#include <optional>

/// The provider under validation as a host meets it: the object that a plug-in hands out, or an MSSCCI library behind
/// OrvixCore's own wrapper and bridge. At the end it is closed and the library is freed.
class ValidationProvider
{
public:
    /// Throws `RuleSkipped` when there is no provider to be had.
    explicit ValidationProvider(ValidationSubject& subject);
    ValidationProvider(const ValidationProvider&) = delete;
    ValidationProvider& operator=(const ValidationProvider&) = delete;
    ~ValidationProvider();

    IOrvixProvider& Get() { return *m_provider; }

    // Each gives what the provider gives, and throws `RuleBroken` for an exception.
    int Initialize();
    int OpenProject();
    int CloseProject();
    int Uninitialize();

    /// Initialises the provider and opens the project. Throws `RuleSkipped` when it fails at one.
    void Begin();

private:
    void FindPlugin();
    void FindInstalled();

    struct Release
    {
        void operator()(IOrvixServices* services) const
        {
            services->Shutdown();
            ReleaseIOrvixServices(services);
        }
    };

    /// Keeps what a provider prints to itself.
    class SilentClient final : public IOrvixClientAccess
    {
    public:
        void OutputText(const wchar_t*, int) override {}
        std::intptr_t RelayA(void*, void*, void*, void*) override { return 0; }
        std::uint32_t GetColor(std::int32_t) override { return 0; }
        bool IsUnattended() override { return true; }
        std::intptr_t RelayB(void*, void*, void*, void*) override { return 0; }
    };

    ValidationSubject& m_subject;
    SilentClient m_access;
    OrvixClientInfo m_client;
    std::optional<ValidationLibrary> m_library;          ///< of a plug-in
    std::unique_ptr<IOrvixServices, Release> m_services; ///< of an MSSCCI library
    IOrvixProvider* m_provider = nullptr;
};
