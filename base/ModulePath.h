#pragma once

#include <windows.h>

#include <string>

/// In characters, with the terminator: no path of Windows is longer.
inline constexpr std::size_t LongestModulePath = 32768;

/// Full path of a loaded module; of the program for null. Empty when the module is not loaded.
inline std::wstring ModulePath(HMODULE module)
{
    std::wstring path(LongestModulePath, L'\0');
    path.resize(GetModuleFileNameW(module, path.data(), static_cast<DWORD>(path.size())));
    return path;
}
