#include "FilePath.h"

#include "ToolError.h"

#include <windows.h>

std::wstring FullPath(const std::wstring& path)
{
    std::wstring full(MAX_PATH, L'\0');
    DWORD length = GetFullPathNameW(path.c_str(), static_cast<DWORD>(full.size()), full.data(), nullptr);
    if (length >= full.size())
    {
        full.resize(length);
        length = GetFullPathNameW(path.c_str(), static_cast<DWORD>(full.size()), full.data(), nullptr);
    }
    if (length == 0 || length >= full.size())
    {
        throw ToolError(ExitCode::BadUsage, L"not a path: " + path);
    }
    full.resize(length);
    while (full.size() > 3 && full.back() == L'\\')
    {
        full.pop_back();
    }
    return full;
}

std::wstring PathBelow(const std::wstring& folder, const std::wstring& path)
{
    const std::wstring root = folder.back() == L'\\' ? folder : folder + L'\\';
    const bool below = PathKey(path.substr(0, root.size())) == PathKey(root);
    return below ? path.substr(root.size()) : path;
}

std::wstring PathKey(const std::wstring& path)
{
    std::wstring key(path);
    CharUpperBuffW(key.data(), static_cast<DWORD>(key.size()));
    return key;
}

std::wstring LongPath(const std::wstring& full)
{
    constexpr std::wstring_view Share = L"\\\\";
    const bool isLong = full.starts_with(L"\\\\?\\") || full.starts_with(L"\\\\.\\");
    return isLong ? full : full.starts_with(Share) ? L"\\\\?\\UNC\\" + full.substr(Share.size()) : L"\\\\?\\" + full;
}

bool PathExists(const std::wstring& path)
{
    return GetFileAttributesW(path.c_str()) != INVALID_FILE_ATTRIBUTES;
}

bool IsFolder(const std::wstring& path)
{
    const DWORD attributes = GetFileAttributesW(path.c_str());
    return attributes != INVALID_FILE_ATTRIBUTES && (attributes & FILE_ATTRIBUTE_DIRECTORY) != 0;
}
