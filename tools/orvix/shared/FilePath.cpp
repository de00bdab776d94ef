#include "FilePath.h"

#include "ToolError.h"
#include "UniqueHandle.h"

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

bool IsAbsolutePath(const std::wstring& path)
{
    const auto isSeparator = [&path](std::size_t i) { return path[i] == L'\\' || path[i] == L'/'; };
    return path.size() > 2 && isSeparator(path[1] == L':' ? 2 : 0) && (path[1] == L':' || isSeparator(1));
}

std::wstring PathAsOnDisk(const std::wstring& full)
{
    std::size_t start = full.find(L'\\');
    for (int part = 0; full.starts_with(L"\\\\") && part < 3 && start != std::wstring::npos; ++part)
    {
        start = full.find(L'\\', start + 1); // after \\server\share
    }
    std::wstring path = full.substr(0, start);
    if (path.size() == 2)
    {
        CharUpperBuffW(path.data(), 1); // the letter of the drive
    }
    while (start != std::wstring::npos)
    {
        const std::size_t end = full.find(L'\\', start + 1);
        std::wstring name = full.substr(start + 1, end == std::wstring::npos ? end : end - start - 1);
        WIN32_FIND_DATAW found;
        const bool isPattern = name.find_first_of(L"*?") != std::wstring::npos;
        if (!isPattern && UniqueFind(FindFirstFileW((path + L'\\' + name).c_str(), &found)))
        {
            name = found.cFileName;
        }
        path += L'\\' + name;
        start = end;
    }
    return path;
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

bool IsMissing(const std::wstring& path)
{
    if (GetFileAttributesW(LongPath(path).c_str()) != INVALID_FILE_ATTRIBUTES)
    {
        return false;
    }
    const DWORD error = GetLastError();
    return error == ERROR_FILE_NOT_FOUND || error == ERROR_PATH_NOT_FOUND;
}

bool IsFolder(const std::wstring& path)
{
    const DWORD attributes = GetFileAttributesW(path.c_str());
    return attributes != INVALID_FILE_ATTRIBUTES && (attributes & FILE_ATTRIBUTE_DIRECTORY) != 0;
}
