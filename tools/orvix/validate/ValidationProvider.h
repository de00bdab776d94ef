#pragma once

#include "IOrvixClientAccess.h"
#include "IOrvixProvider.h"
#include "OrvixClientInfo.h"
#include "OrvixServicesPointer.h"
#include "ValidationLibrary.h"

#include <atomic>
#include <optional>
#include <string>

/// The provider under validation, as a host uses it: the object of a plug-in, or OrvixCore's own provider for an MSSCCI
/// library. At the end it is closed, and the library is unloaded.
class ValidationProvider
{
public:
    /// `subject` must outlive this object. Throws `RuleSkipped` when there is no provider.
    explicit ValidationProvider(ValidationSubject& subject);
    ValidationProvider(const ValidationProvider&) = delete;
    ValidationProvider& operator=(const ValidationProvider&) = delete;
    ~ValidationProvider();

    IOrvixProvider& Get() { return *m_provider; }

    /// Whether the provider has printed from another thread than that of its calls.
    bool HasPrintedFromOtherThread() const { return m_access.WasCalledFromOtherThread(); }

    // Each returns what the provider returns, and throws `RuleBroken` for an exception.
    int Initialize();
    int OpenProject();
    int OpenProject(const std::wstring& folder);
    int CloseProject();
    int Uninitialize();

    /// Initialises the provider and opens the project. Throws `RuleSkipped` when one of them fails.
    void Begin();

private:
    void FindPlugin();
    void FindInstalled();
    void Close();

    /// Ignores what a provider prints.
    class SilentClient final : public IOrvixClientAccess
    {
    public:
        void OutputText(const wchar_t*, int) override
        {
            m_fromOtherThread = m_fromOtherThread || GetCurrentThreadId() != m_thread;
        }
        bool WasCalledFromOtherThread() const { return m_fromOtherThread; }
        std::intptr_t RelayA(void*, void*, void*, void*) override { return 0; }
        std::uint32_t GetColor(std::int32_t) override { return 0; }
        bool IsUnattended() override { return true; }
        std::intptr_t RelayB(void*, void*, void*, void*) override { return 0; }

    private:
        DWORD m_thread = GetCurrentThreadId();
        std::atomic<bool> m_fromOtherThread = false;
    };

    ValidationSubject& m_subject;
    SilentClient m_access;
    OrvixClientInfo m_client;
    std::optional<ValidationLibrary> m_library; // of a plug-in
    OrvixServicesPointer m_services;            // of an MSSCCI library
    IOrvixProvider* m_provider = nullptr;       // owned by one of these
};
