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

/// Loads a library with the activation context of this library's own manifest, so that it binds to the same
/// side-by-side components, and without the system's error boxes. Null when it does not load.
UniqueModule LoadLibraryIsolated(const wchar_t* path) noexcept;
