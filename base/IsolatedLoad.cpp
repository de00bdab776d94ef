#include "IsolatedLoad.h"

#include "ActivationContext.h"

namespace
{

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

UniqueModule LoadLibraryIsolated(const wchar_t* path, const UniqueActivationContext& context, DWORD flags) noexcept
{
    UniqueModule module;
    DWORD error = ERROR_SUCCESS;
    {
        const ActivationScope activation(context);
        const SilentErrors silent;
        module.Reset(LoadLibraryExW(path, nullptr, flags));
        error = GetLastError();
    }
    SetLastError(error);
    return module;
}
