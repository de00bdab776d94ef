#pragma once

#include <windows.h>

#include <string>

/// The current folder of this process; empty when its path is longer than MAX_PATH.
inline std::wstring CurrentFolderPath()
{
    std::wstring folder(MAX_PATH, L'\0');
    const DWORD size = GetCurrentDirectoryW(static_cast<DWORD>(folder.size()), folder.data());
    folder.resize(size < folder.size() ? size : 0);
    return folder;
}
