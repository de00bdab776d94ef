#include "WindowsPath.h"

#include <windows.h>

#include <string_view>

namespace
{

constexpr std::wstring_view LongPrefix = L"\\\\?\\";
constexpr std::wstring_view LongSharePrefix = L"\\\\?\\UNC\\";
constexpr std::wstring_view SharePrefix = L"\\\\";

} // namespace

std::wstring FullPath(std::wstring path)
{
    if (path.starts_with(LongSharePrefix))
    {
        path.replace(0, LongSharePrefix.size(), SharePrefix);
    }
    else if (path.starts_with(LongPrefix))
    {
        path.erase(0, LongPrefix.size());
    }
    std::wstring full;
    for (DWORD size = MAX_PATH; full.size() < size;)
    {
        full.resize(size);
        size = GetFullPathNameW(path.c_str(), size, full.data(), nullptr);
        if (size < full.size())
        {
            full.resize(size);
            break;
        }
    }
    full.erase(full.find_last_not_of(L'\\') + 1);
    return full;
}

std::wstring LongForm(const std::wstring& full)
{
    return full.starts_with(SharePrefix) ? std::wstring(LongSharePrefix) + full.substr(SharePrefix.size())
                                         : std::wstring(LongPrefix) + full;
}
