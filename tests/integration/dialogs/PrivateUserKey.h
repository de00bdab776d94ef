#pragma once

#include "UniqueHandle.h"

#include <windows.h>

#include <string>

/// While it exists, HKEY_CURRENT_USER is an empty key for this process.
class PrivateUserKey
{
public:
    PrivateUserKey() : m_path(L"Software\\OrvixCoreTest" + std::to_wstring(GetCurrentProcessId()))
    {
        UniqueRegistryKey key;
        RegCreateKeyExW(HKEY_CURRENT_USER, m_path.c_str(), 0, nullptr, 0, KEY_ALL_ACCESS, nullptr, key.Out(), nullptr);
        RegOverridePredefKey(HKEY_CURRENT_USER, key.Get());
    }
    PrivateUserKey(const PrivateUserKey&) = delete;
    PrivateUserKey& operator=(const PrivateUserKey&) = delete;
    ~PrivateUserKey()
    {
        RegOverridePredefKey(HKEY_CURRENT_USER, nullptr);
        RegDeleteTreeW(HKEY_CURRENT_USER, m_path.c_str());
    }

private:
    std::wstring m_path;
};
