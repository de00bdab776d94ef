#include "Settings.h"

#include <windows.h>

namespace
{

constexpr const wchar_t* Key = L"Software\\OrvixDesk";
constexpr const wchar_t* ClearedKey = L"Software\\OrvixDesk\\ClearedProviders"; // has a value for each one

bool HasValue(const wchar_t* key, const std::wstring& name)
{
    return RegGetValueW(HKEY_CURRENT_USER, key, name.c_str(), RRF_RT_ANY, nullptr, nullptr, nullptr) == ERROR_SUCCESS;
}

void StoreText(const wchar_t* key, const std::wstring& name, const std::wstring& text)
{
    RegSetKeyValueW(HKEY_CURRENT_USER, key, name.c_str(), REG_SZ, text.c_str(),
                    static_cast<DWORD>((text.size() + 1) * sizeof(wchar_t)));
}

void StoreMark(const wchar_t* key, const std::wstring& name, bool set)
{
    if (set)
    {
        StoreText(key, name, L"");
    }
    else
    {
        RegDeleteKeyValueW(HKEY_CURRENT_USER, key, name.c_str());
    }
}

} // namespace

std::wstring Settings::Provider()
{
    wchar_t name[256] = {};
    DWORD size = sizeof name;
    const bool found =
        RegGetValueW(HKEY_CURRENT_USER, Key, L"Provider", RRF_RT_REG_SZ, nullptr, name, &size) == ERROR_SUCCESS;
    return found ? name : L"";
}

void Settings::StoreProvider(const std::wstring& name)
{
    StoreText(Key, L"Provider", name);
}

bool Settings::IsProviderUsed(const std::wstring& name)
{
    return !HasValue(ClearedKey, name);
}

void Settings::StoreProviderUsed(const std::wstring& name, bool used)
{
    StoreMark(ClearedKey, name, !used);
}

bool Settings::IsDark()
{
    return HasValue(Key, L"Dark");
}

void Settings::StoreDark(bool dark)
{
    StoreMark(Key, L"Dark", dark);
}
