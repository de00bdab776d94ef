#pragma once

#include <windows.h>

#include <memory>

struct ModuleDeleter
{
    using pointer = HMODULE;
    void operator()(HMODULE module) const noexcept { FreeLibrary(module); }
};

/// A loaded library that frees itself.
using UniqueModule = std::unique_ptr<HMODULE, ModuleDeleter>;

/// The activation context of this library's own manifest. Making one reads the manifest; who loads many libraries
/// keeps it. Where it cannot be made, libraries load in the host's context.
class ManifestContext
{
public:
    ManifestContext() noexcept;
    ManifestContext(const ManifestContext&) = delete;
    ManifestContext& operator=(const ManifestContext&) = delete;
    ~ManifestContext();

    /// INVALID_HANDLE_VALUE when it could not be made.
    HANDLE Get() const { return m_context; }

private:
    HANDLE m_context;
};

/// Loads a library in the context, so that it binds to the same side-by-side components as this one, and without the
/// system's error boxes. `flags` are those of LoadLibraryExW. Null when it does not load; the thread's last error then
/// says why.
UniqueModule LoadLibraryIsolated(const wchar_t* path, const ManifestContext& context, DWORD flags = 0) noexcept;
