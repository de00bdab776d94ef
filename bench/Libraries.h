#pragma once

#include "ModulePath.h"

#include <windows.h>

#include <filesystem>

inline constexpr wchar_t IdleLibrary[] = L"idle_msscci.dll"; // beside the program

/// A function of a library; null when the library does not have it.
template <typename Function>
Function* Export(HMODULE module, const char* name)
{
    return reinterpret_cast<Function*>(reinterpret_cast<void (*)()>(GetProcAddress(module, name)));
}

inline std::filesystem::path ProgramFolder()
{
    return std::filesystem::path(ModulePath(nullptr)).parent_path();
}
