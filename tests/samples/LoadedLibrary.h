#pragma once

#include "UniqueHandle.h"

#include <windows.h>

#include <filesystem>
#include <string>
#include <vector>

/// A library that is loaded as a host loads it, and freed at the end.
class LoadedLibrary
{
public:
    explicit LoadedLibrary(const std::filesystem::path& file) : m_module(LoadLibraryW(file.c_str())) {}

    void Unload() { m_module.Reset(); }
    HMODULE Module() const { return m_module.Get(); }

    /// An exported function; null when the library is not loaded or does not export it.
    template <typename Function>
    Function* Export(const char* name) const
    {
        return m_module ? reinterpret_cast<Function*>(reinterpret_cast<void*>(GetProcAddress(Module(), name)))
                        : nullptr;
    }

    /// The names in the export table, in order; empty for an entry without a name.
    std::vector<std::string> ExportedNames() const
    {
        const auto* base = reinterpret_cast<const char*>(Module());
        const auto* dos = reinterpret_cast<const IMAGE_DOS_HEADER*>(base);
        const auto* headers = reinterpret_cast<const IMAGE_NT_HEADERS*>(base + dos->e_lfanew);
        const auto& directory = headers->OptionalHeader.DataDirectory[IMAGE_DIRECTORY_ENTRY_EXPORT];
        const auto* exports = reinterpret_cast<const IMAGE_EXPORT_DIRECTORY*>(base + directory.VirtualAddress);
        const auto* names = reinterpret_cast<const DWORD*>(base + exports->AddressOfNames);
        std::vector<std::string> result;
        for (DWORD i = 0; i < exports->NumberOfNames; ++i)
        {
            result.emplace_back(base + names[i]);
        }
        result.resize(exports->NumberOfFunctions);
        return result;
    }

private:
    UniqueModule m_module;
};
