#pragma once

#include <windows.h>

#include <filesystem>
#include <string>
#include <vector>

/// A library that is loaded as a host loads it, and freed at the end.
class LoadedLibrary
{
public:
    explicit LoadedLibrary(const std::filesystem::path& file) : m_module(LoadLibraryW(file.c_str())) {}
    LoadedLibrary(const LoadedLibrary&) = delete;
    LoadedLibrary& operator=(const LoadedLibrary&) = delete;
    ~LoadedLibrary() { Unload(); }

    void Unload()
    {
        if (m_module != nullptr)
        {
            FreeLibrary(m_module);
        }
        m_module = nullptr;
    }

    HMODULE Module() const { return m_module; }

    /// An exported function; null when the library is not loaded or lacks it.
    template <typename Function>
    Function* Export(const char* name) const
    {
        return m_module ? reinterpret_cast<Function*>(reinterpret_cast<void*>(GetProcAddress(m_module, name)))
                        : nullptr;
    }

    /// The names in the export table, in order; an entry without a name stands as an empty one.
    std::vector<std::string> ExportedNames() const
    {
        const auto* base = reinterpret_cast<const char*>(m_module);
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
    HMODULE m_module;
};
