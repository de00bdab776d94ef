#include "IsolatedLoad.h"

#include "LibraryModule.h"

namespace
{

/// This library's manifest, active on the thread for a scope. Without a manifest nothing is activated.
class ActivationScope
{
public:
    ActivationScope() noexcept
    {
        ACTCTXW description = {};
        description.cbSize = sizeof(description);
        description.dwFlags = ACTCTX_FLAG_HMODULE_VALID | ACTCTX_FLAG_RESOURCE_NAME_VALID;
        description.hModule = LibraryModule();
        description.lpResourceName = ISOLATIONAWARE_MANIFEST_RESOURCE_ID;
        m_context = CreateActCtxW(&description);
        m_active = m_context != INVALID_HANDLE_VALUE && ActivateActCtx(m_context, &m_cookie);
    }
    ActivationScope(const ActivationScope&) = delete;
    ActivationScope& operator=(const ActivationScope&) = delete;
    ~ActivationScope()
    {
        if (m_active)
            DeactivateActCtx(0, m_cookie);
        if (m_context != INVALID_HANDLE_VALUE)
            ReleaseActCtx(m_context);
    }

private:
    HANDLE m_context;
    ULONG_PTR m_cookie = 0;
    bool m_active;
};

/// Keeps the system from showing a box about a file that is no library; the thread's mode is restored.
class SilentErrors
{
public:
    SilentErrors() noexcept
        : m_changed(
              SetThreadErrorMode(GetThreadErrorMode() | SEM_FAILCRITICALERRORS | SEM_NOOPENFILEERRORBOX, &m_previous))
    {
    }
    SilentErrors(const SilentErrors&) = delete;
    SilentErrors& operator=(const SilentErrors&) = delete;
    ~SilentErrors()
    {
        if (m_changed)
            SetThreadErrorMode(m_previous, nullptr);
    }

private:
    DWORD m_previous = 0;
    BOOL m_changed;
};

} // namespace

UniqueModule LoadLibraryIsolated(const wchar_t* path) noexcept
{
    const ActivationScope activation;
    const SilentErrors silent;
    return UniqueModule(LoadLibraryExW(path, nullptr, 0));
}
