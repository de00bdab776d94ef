#pragma once

#include <windows.h>

#include <string>

/// Path of a loaded module; null means the program.
inline std::wstring ModulePath(HMODULE module)
{
    std::wstring path(1024, L'\0');
    path.resize(GetModuleFileNameW(module, path.data(), static_cast<DWORD>(path.size())));
    return path;
}
