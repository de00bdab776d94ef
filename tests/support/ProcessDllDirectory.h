#pragma once

#include <windows.h>

#include <string>

/// The folder that the process searches for libraries, for a scope; null for none. Afterwards as it was before.
class ProcessDllDirectory
{
public:
    explicit ProcessDllDirectory(const wchar_t* folder) : m_previous(Current()) { SetDllDirectoryW(folder); }
    ProcessDllDirectory(const ProcessDllDirectory&) = delete;
    ProcessDllDirectory& operator=(const ProcessDllDirectory&) = delete;
    ~ProcessDllDirectory() { SetDllDirectoryW(m_previous.empty() ? nullptr : m_previous.c_str()); }

    /// The folder now; empty for none.
    static std::wstring Current()
    {
        std::wstring folder(MAX_PATH, L'\0');
        folder.resize(GetDllDirectoryW(static_cast<DWORD>(folder.size()), folder.data()));
        return folder;
    }

private:
    std::wstring m_previous;
};
