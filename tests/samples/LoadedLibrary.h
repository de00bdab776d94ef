#pragma once

#include "UniqueHandle.h"

#include <windows.h>

#include <array>
#include <cstddef>
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

/// Bytes in use in all heaps of the process.
inline std::size_t BusyHeapBytes()
{
    std::array<HANDLE, 64> heaps = {};
    const DWORD count = GetProcessHeaps(static_cast<DWORD>(heaps.size()), heaps.data());
    std::size_t bytes = 0;
    for (DWORD i = 0; i < count && i < heaps.size(); ++i)
    {
        HeapLock(heaps[i]);
        PROCESS_HEAP_ENTRY entry = {};
        while (HeapWalk(heaps[i], &entry) != FALSE)
        {
            bytes += (entry.wFlags & PROCESS_HEAP_ENTRY_BUSY) != 0 ? entry.cbData : 0;
        }
        HeapUnlock(heaps[i]);
    }
    return bytes;
}

/// The heap memory in bytes that stays allocated each time that a library is loaded and unloaded.
inline std::size_t LeftByLoading(const std::filesystem::path& file)
{
    constexpr std::size_t Times = 20;
    const auto load = [&] { return LoadedLibrary(file).Module() != nullptr; };
    if (!load())
    {
        return static_cast<std::size_t>(-1);
    }
    const std::size_t before = BusyHeapBytes();
    for (std::size_t i = 0; i < Times; ++i)
    {
        load();
    }
    const std::size_t after = BusyHeapBytes();
    return after > before ? (after - before) / Times : 0;
}
