#include "IsolatedLoad.h"

#include "LibraryModule.h"

namespace
{

/// A context that is active on the thread for a scope.
class ActivationScope
{
public:
    explicit ActivationScope(HANDLE context) noexcept
        : m_active(context != INVALID_HANDLE_VALUE && (ActivateActCtx(context, &m_cookie) != 0))
    {
    }
    ActivationScope(const ActivationScope&) = delete;
    ActivationScope& operator=(const ActivationScope&) = delete;
    ~ActivationScope()
    {
        if (m_active)
        {
            DeactivateActCtx(0, m_cookie);
        }
    }

private:
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
        {
            SetThreadErrorMode(m_previous, nullptr);
        }
    }

private:
    DWORD m_previous = 0;
    BOOL m_changed;
};

} // namespace

ManifestContext::ManifestContext() noexcept
{
    ACTCTXW description = {};
    description.cbSize = sizeof(description);
    description.dwFlags = ACTCTX_FLAG_HMODULE_VALID | ACTCTX_FLAG_RESOURCE_NAME_VALID;
    description.hModule = LibraryModule();
    description.lpResourceName = ISOLATIONAWARE_MANIFEST_RESOURCE_ID;
    m_context = CreateActCtxW(&description);
}

ManifestContext::~ManifestContext()
{
    if (m_context != INVALID_HANDLE_VALUE)
    {
        ReleaseActCtx(m_context);
    }
}

UniqueModule LoadLibraryIsolated(const wchar_t* path, const ManifestContext& context, DWORD flags) noexcept
{
    UniqueModule module;
    DWORD error = ERROR_SUCCESS;
    {
        const ActivationScope activation(context.Get());
        const SilentErrors silent;
        module.reset(LoadLibraryExW(path, nullptr, flags));
        error = GetLastError();
    }
    SetLastError(error);
    return module;
}
