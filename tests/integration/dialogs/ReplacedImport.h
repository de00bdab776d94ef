#pragma once

#include <windows.h>

#include <bit>
#include <cstdint>
#include <cstring>
#include <stdexcept>

/// While it exists, a module that is loaded calls another function in place of one that it imports by name.
class ReplacedImport
{
public:
    /// Throws std::runtime_error when the module imports no such function.
    ReplacedImport(const wchar_t* module, const char* function, std::uintptr_t replacement)
        : m_entry(Find(GetModuleHandleW(module), function)), m_original(*m_entry)
    {
        Write(replacement);
    }
    ReplacedImport(const ReplacedImport&) = delete;
    ReplacedImport& operator=(const ReplacedImport&) = delete;
    ~ReplacedImport() { Write(m_original); }

private:
    static std::uintptr_t* Find(HMODULE module, const char* function)
    {
        auto* const base = std::bit_cast<unsigned char*>(module);
        const auto& headers =
            *std::bit_cast<const IMAGE_NT_HEADERS*>(base + std::bit_cast<const IMAGE_DOS_HEADER*>(base)->e_lfanew);
        const IMAGE_DATA_DIRECTORY& directory = headers.OptionalHeader.DataDirectory[IMAGE_DIRECTORY_ENTRY_IMPORT];
        const auto* library = std::bit_cast<const IMAGE_IMPORT_DESCRIPTOR*>(base + directory.VirtualAddress);
        for (; library->Name != 0; ++library)
        {
            const auto* name = std::bit_cast<const IMAGE_THUNK_DATA*>(base + library->OriginalFirstThunk);
            auto* entry = std::bit_cast<std::uintptr_t*>(base + library->FirstThunk);
            for (; name->u1.AddressOfData != 0; ++name, ++entry)
            {
                const auto* const import = std::bit_cast<const IMAGE_IMPORT_BY_NAME*>(base + name->u1.AddressOfData);
                if (!IMAGE_SNAP_BY_ORDINAL(name->u1.Ordinal) && std::strcmp(import->Name, function) == 0)
                {
                    return entry;
                }
            }
        }
        throw std::runtime_error("the module does not import the function");
    }

    void Write(std::uintptr_t function) const
    {
        DWORD protection = 0;
        VirtualProtect(m_entry, sizeof *m_entry, PAGE_READWRITE, &protection);
        *m_entry = function;
        VirtualProtect(m_entry, sizeof *m_entry, protection, &protection);
    }

    std::uintptr_t* m_entry;
    std::uintptr_t m_original;
};
