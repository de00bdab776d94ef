#pragma once

#include <windows.h>

#include <string>

/// The folder that the process searches for libraries; none again at the end.
class ProcessDllDirectory
{
public:
    explicit ProcessDllDirectory(const wchar_t* folder) { SetDllDirectoryW(folder); }
    ProcessDllDirectory(const ProcessDllDirectory&) = delete;
    ProcessDllDirectory& operator=(const ProcessDllDirectory&) = delete;
    ~ProcessDllDirectory() { SetDllDirectoryW(nullptr); }

    static std::wstring Current()
    {
        std::wstring folder(MAX_PATH, L'\0');
        folder.resize(GetDllDirectoryW(static_cast<DWORD>(folder.size()), folder.data()));
        return folder;
    }
};
