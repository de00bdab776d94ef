#pragma once

#include <windows.h>

#include <string>

/// The full path of a loaded module; of the program for null.
inline std::wstring ModulePath(HMODULE module)
{
    std::wstring path(32768, L'\0'); // the longest path of Windows
    path.resize(GetModuleFileNameW(module, path.data(), static_cast<DWORD>(path.size())));
    return path;
}
