#include "GitProgram.h"

#include "GitFailure.h"
#include "GitText.h"

#include <windows.h>

#include <charconv>
#include <filesystem>
#include <utility>
#include <vector>

namespace
{

// The oldest Git that prints relative paths on demand.
constexpr int OldestMajor = 2;
constexpr int OldestMinor = 31;

bool IsFile(const std::wstring& path)
{
    const DWORD attributes = GetFileAttributesW(path.c_str());
    return attributes != INVALID_FILE_ATTRIBUTES && (attributes & FILE_ATTRIBUTE_DIRECTORY) == 0;
}

bool IsAbsolute(const std::wstring& path)
{
    return std::filesystem::path(path).is_absolute();
}

/// Where Git for Windows says that it is installed; empty when it is not.
std::wstring FindInstalled()
{
    for (HKEY root : {HKEY_LOCAL_MACHINE, HKEY_CURRENT_USER})
    {
        wchar_t folder[MAX_PATH] = L"";
        DWORD size = sizeof folder;
        if (RegGetValueW(root, L"SOFTWARE\\GitForWindows", L"InstallPath", RRF_RT_REG_SZ, nullptr, folder, &size) !=
            ERROR_SUCCESS)
        {
            continue;
        }
        std::wstring program = folder + std::wstring(L"\\cmd\\git.exe");
        if (IsAbsolute(program) && IsFile(program))
        {
            return program;
        }
    }
    return {};
}

std::wstring EnvironmentVariable(const wchar_t* name)
{
    std::wstring value;
    for (DWORD size = 256; value.size() < size;)
    {
        value.resize(size);
        size = GetEnvironmentVariableW(name, value.data(), size);
        if (size < value.size())
        {
            value.resize(size);
            break;
        }
    }
    return value;
}

} // namespace

std::wstring GitProgram::Find(const std::wstring& alternative)
{
    if (!alternative.empty())
    {
        if (!IsAbsolute(alternative) || !IsFile(alternative))
        {
            throw GitFailure(L"The setting AltProviderExecutable does not name a program by its full path: " +
                             alternative);
        }
        return alternative;
    }
    std::wstring program = FindInstalled();
    if (program.empty())
    {
        program = FindInFolders(EnvironmentVariable(L"PATH"));
    }
    if (program.empty())
    {
        throw GitFailure(L"Git is not installed: git.exe is neither registered by Git for Windows nor in a folder of "
                         L"PATH");
    }
    return program;
}

std::wstring GitProgram::FindInFolders(std::wstring_view folders)
{
    while (!folders.empty())
    {
        const std::size_t end = folders.find(L';');
        std::wstring folder(folders.substr(0, end));
        folders.remove_prefix(end == std::wstring_view::npos ? folders.size() : end + 1);
        std::erase(folder, L'"');
        std::wstring program = folder + L"\\git.exe";
        if (IsAbsolute(folder) && IsFile(program))
        {
            return program;
        }
    }
    return {};
}

void GitProgram::CheckVersion(std::string_view printed)
{
    constexpr std::string_view Before = "git version ";
    const std::size_t begin = printed.find(Before);
    int major = 0;
    int minor = 0;
    if (begin != std::string_view::npos)
    {
        const char* end = printed.data() + printed.size();
        const auto [dot, error] = std::from_chars(printed.data() + begin + Before.size(), end, major);
        if (error == std::errc() && dot != end && *dot == '.')
        {
            std::from_chars(dot + 1, end, minor);
        }
    }
    if (std::pair(major, minor) < std::pair(OldestMajor, OldestMinor))
    {
        const std::vector<std::wstring> lines = GitText::Lines(printed);
        throw GitFailure(L"Git " + std::to_wstring(OldestMajor) + L"." + std::to_wstring(OldestMinor) +
                         L" or later is needed; this is: " + (lines.empty() ? L"no Git" : lines.front()));
    }
}
