#pragma once

#include "ModulePath.h"

#include <windows.h>

#include <filesystem>
#include <stdexcept>
#include <string>

/// The full path of a file of the build that is tested. Its bin folder is the one on the PATH that has OrvixCore.dll.
inline std::filesystem::path BuiltFile(const std::filesystem::path& name)
{
    std::wstring library(LongestModulePath, L'\0');
    library.resize(
        SearchPathW(nullptr, L"OrvixCore.dll", nullptr, static_cast<DWORD>(library.size()), library.data(), nullptr));
    if (library.empty())
    {
        throw std::runtime_error("no folder on the PATH has OrvixCore.dll");
    }
    return std::filesystem::path(library).replace_filename(name);
}
