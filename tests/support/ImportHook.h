#pragma once

#include <windows.h>

/// Redirects one function that a loaded module imports, for as long as the object lives. Only calls made by
/// that module are redirected, whatever library the function comes from.
///
///     static BSTR __stdcall NoMemory(const OLECHAR*) { return nullptr; }
///     ImportHook hook(GetModuleHandleW(L"OrvixCore.dll"), "SysAllocString", reinterpret_cast<void*>(&NoMemory));
///
/// Hooks of the same import must end in reverse order of their beginning.
class ImportHook
{
public:
    /// `name` is the import's undecorated name. A module that does not import it gives an inactive hook.
    ImportHook(HMODULE module, const char* name, void* replacement);
    ImportHook(const ImportHook&) = delete;
    ImportHook& operator=(const ImportHook&) = delete;
    ~ImportHook();

    bool IsActive() const { return m_slot != nullptr; }

    /// The function as it was; null for an inactive hook.
    template <typename Function>
    Function* Original() const
    {
        return reinterpret_cast<Function*>(m_original);
    }

private:
    void** m_slot = nullptr;
    void* m_original = nullptr;
};
