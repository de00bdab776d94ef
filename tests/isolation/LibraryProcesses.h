#pragma once

#include "UniqueHandle.h"

#include <tlhelp32.h>

#include <string>
#include <vector>

/// The IDs of the running processes of isolated libraries that this process started.
inline std::vector<DWORD> LibraryProcesses()
{
    const UniqueFile snapshot(CreateToolhelp32Snapshot(TH32CS_SNAPPROCESS, 0));
    PROCESSENTRY32W entry{};
    entry.dwSize = sizeof entry;
    std::vector<DWORD> processes;
    for (BOOL more = Process32FirstW(snapshot.Get(), &entry); more; more = Process32NextW(snapshot.Get(), &entry))
    {
        if (entry.th32ParentProcessID == GetCurrentProcessId() &&
            std::wstring(entry.szExeFile).starts_with(L"scc_host"))
        {
            processes.push_back(entry.th32ProcessID);
        }
    }
    return processes;
}
