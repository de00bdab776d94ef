#include "ImportHook.h"

#include <cstddef>
#include <cstring>
#include <stdexcept>

namespace
{

/// The place in the module's import table that holds the address of `name`; null when there is none.
void** FindImport(HMODULE module, const char* name)
{
    auto* base = reinterpret_cast<std::byte*>(module);
    const auto* dos = reinterpret_cast<const IMAGE_DOS_HEADER*>(base);
    const auto* headers = reinterpret_cast<const IMAGE_NT_HEADERS*>(base + dos->e_lfanew);
    const IMAGE_DATA_DIRECTORY& directory = headers->OptionalHeader.DataDirectory[IMAGE_DIRECTORY_ENTRY_IMPORT];
    if (directory.Size == 0)
    {
        return nullptr;
    }
    const auto* library = reinterpret_cast<const IMAGE_IMPORT_DESCRIPTOR*>(base + directory.VirtualAddress);
    for (; library->Name != 0; ++library)
    {
        const auto* names = reinterpret_cast<const IMAGE_THUNK_DATA*>(base + library->OriginalFirstThunk);
        auto* addresses = reinterpret_cast<void**>(base + library->FirstThunk);
        for (; names->u1.AddressOfData != 0; ++names, ++addresses)
        {
            if (IMAGE_SNAP_BY_ORDINAL(names->u1.Ordinal))
            {
                continue;
            }
            const auto* import = reinterpret_cast<const IMAGE_IMPORT_BY_NAME*>(base + names->u1.AddressOfData);
            if (std::strcmp(reinterpret_cast<const char*>(import->Name), name) == 0)
            {
                return addresses;
            }
        }
    }
    return nullptr;
}

bool WriteImport(void** slot, void* address)
{
    DWORD protection = 0;
    if (!VirtualProtect(slot, sizeof *slot, PAGE_READWRITE, &protection))
    {
        return false;
    }
    *slot = address;
    VirtualProtect(slot, sizeof *slot, protection, &protection);
    return true;
}

} // namespace

ImportHook::ImportHook(HMODULE module, const char* name, void* replacement) : m_slot(FindImport(module, name))
{
    if (m_slot == nullptr)
    {
        return;
    }
    m_original = *m_slot;
    if (!WriteImport(m_slot, replacement))
    {
        throw std::runtime_error("the import table cannot be written");
    }
}

ImportHook::~ImportHook()
{
    if (m_slot != nullptr)
    {
        WriteImport(m_slot, m_original);
    }
}
