#pragma once

#include <windows.h>

#include <string>

/// Full path of a loaded module; of the program for null. Empty when the module is not loaded.
inline std::wstring ModulePath(HMODULE module)
{
    constexpr std::size_t LongestPath = 32768; // characters, with the terminator
    std::wstring path(LongestPath, L'\0');
    path.resize(GetModuleFileNameW(module, path.data(), static_cast<DWORD>(path.size())));
    return path;
}
