#include "FileBytes.h"

#include "UniqueHandle.h"

#include <windows.h>

#include <aclapi.h>

#include <algorithm>
#include <limits>
#include <memory>

namespace
{

constexpr DWORD LongestWait = 500; // milliseconds for other programs' handles, in one save
constexpr DWORD Pause = 20;        // milliseconds between two attempts

constexpr DWORD AllSharing = FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE;

bool IsInUse(DWORD error)
{
    return error == ERROR_SHARING_VIOLATION || error == ERROR_LOCK_VIOLATION || error == ERROR_USER_MAPPED_FILE;
}

/// Waits for other programs' handles, in all for as long as one save may.
class Patience
{
public:
    /// Runs `attempt` until it succeeds, until its error is one for which `isWorthIt` is false, or until the time is
    /// over.
    template <typename Attempt>
    bool Try(const Attempt& attempt, bool (*isWorthIt)(DWORD error) = IsInUse)
    {
        while (!attempt())
        {
            if (!isWorthIt(GetLastError()) || GetTickCount64() + Pause > m_end)
            {
                return false;
            }
            Sleep(Pause);
        }
        return true;
    }

private:
    ULONGLONG m_end = GetTickCount64() + LongestWait;
};

bool SaysMissing(DWORD error)
{
    return error == ERROR_FILE_NOT_FOUND || error == ERROR_PATH_NOT_FOUND;
}

bool IsMissing(const wchar_t* path)
{
    return GetFileAttributesW(path) == INVALID_FILE_ATTRIBUTES && SaysMissing(GetLastError());
}

/// A full path; what begins with `\\?\` is one already.
std::wstring FullPath(const wchar_t* path)
{
    std::wstring full;
    DWORD size = GetFullPathNameW(path, 0, nullptr, nullptr);
    if (size == 0 || std::wstring_view(path).starts_with(L"\\\\?\\"))
    {
        return path;
    }
    full.resize(size);
    size = GetFullPathNameW(path, size, full.data(), nullptr);
    full.resize(size);
    return full;
}

/// Writes the bytes from the file's beginning, and nothing after them, onto the disk.
bool WriteAll(HANDLE file, const std::string& bytes)
{
    std::size_t written = 0;
    while (written < bytes.size())
    {
        constexpr std::size_t Most = std::numeric_limits<DWORD>::max();
        DWORD count = 0;
        if (WriteFile(file, bytes.data() + written, static_cast<DWORD>(std::min(bytes.size() - written, Most)), &count,
                      nullptr) == FALSE ||
            count == 0)
        {
            return false;
        }
        written += count;
    }
    return SetEndOfFile(file) != FALSE && FlushFileBuffers(file) != FALSE;
}

bool WriteInPlace(const wchar_t* path, const std::string& bytes, Patience& patience)
{
    UniqueFile file;
    const auto open = [&] {
        file.Reset(
            CreateFileW(path, GENERIC_WRITE, FILE_SHARE_READ, nullptr, OPEN_ALWAYS, FILE_ATTRIBUTE_NORMAL, nullptr));
        return static_cast<bool>(file);
    };
    return patience.Try(open) && WriteAll(file.Get(), bytes);
}

/// Gives a new file the attributes and the access rights of the file that it replaces, as far as the drive has them.
void CopyRights(const wchar_t* from, DWORD attributes, const wchar_t* to)
{
    constexpr DWORD Copied =
        FILE_ATTRIBUTE_HIDDEN | FILE_ATTRIBUTE_SYSTEM | FILE_ATTRIBUTE_ARCHIVE | FILE_ATTRIBUTE_NOT_CONTENT_INDEXED;
    SetFileAttributesW(to, (attributes & Copied) != 0 ? attributes & Copied : FILE_ATTRIBUTE_NORMAL);
    PACL rights = nullptr;
    PSECURITY_DESCRIPTOR descriptor = nullptr;
    if (GetNamedSecurityInfoW(from, SE_FILE_OBJECT, DACL_SECURITY_INFORMATION, nullptr, nullptr, &rights, nullptr,
                              &descriptor) != ERROR_SUCCESS)
    {
        return;
    }
    const std::unique_ptr<void, decltype(&LocalFree)> owner(descriptor, LocalFree);
    SECURITY_DESCRIPTOR_CONTROL control = 0;
    DWORD revision = 0;
    if (rights != nullptr && GetSecurityDescriptorControl(descriptor, &control, &revision) != FALSE)
    {
        const SECURITY_INFORMATION inheritance = (control & SE_DACL_PROTECTED) != 0
                                                     ? PROTECTED_DACL_SECURITY_INFORMATION
                                                     : UNPROTECTED_DACL_SECURITY_INFORMATION;
        std::wstring path = to; // the function takes no constant
        SetNamedSecurityInfoW(path.data(), SE_FILE_OBJECT, DACL_SECURITY_INFORMATION | inheritance, nullptr, nullptr,
                              rights, nullptr);
    }
}

/// Whether whoever has the file open lets it be replaced.
bool CanBeDeleted(const wchar_t* path)
{
    return static_cast<bool>(
        UniqueFile(CreateFileW(path, DELETE, AllSharing, nullptr, OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr)));
}

/// Moves a finished file to its place in one step.
bool MoveIntoPlace(const wchar_t* from, const wchar_t* to, Patience& patience)
{
    // A file that is open elsewhere may refuse to be replaced with either error.
    const auto isWorthIt = [](DWORD error) { return IsInUse(error) || error == ERROR_ACCESS_DENIED; };
    const auto move = [&] {
        return MoveFileExW(from, to, MOVEFILE_REPLACE_EXISTING | MOVEFILE_WRITE_THROUGH) != FALSE;
    };
    if (patience.Try(move, isWorthIt))
    {
        return true;
    }
    // A rename happens as a whole or not at all. `ReplaceFileW` can replace an open file as well, but moves the old one
    // away first: a process that is ended there leaves no file.
    return CanBeDeleted(to) &&
           (ReplaceFileW(to, from, nullptr, REPLACEFILE_IGNORE_MERGE_ERRORS, nullptr, nullptr) != FALSE ||
            (IsMissing(to) && move()));
}

/// Whether an error says that no file can be made under this name, though the file beside it may be written.
bool ForbidsNewFile(DWORD error)
{
    return error == ERROR_ACCESS_DENIED || error == ERROR_FILENAME_EXCED_RANGE || error == ERROR_INVALID_NAME;
}

} // namespace

FileBytes::Found FileBytes::Read(const wchar_t* path, std::size_t limit, std::string& bytes)
{
    const UniqueFile file(
        CreateFileW(path, GENERIC_READ, AllSharing, nullptr, OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr));
    if (!file)
    {
        return SaysMissing(GetLastError()) ? Found::Missing : Found::Unreadable;
    }
    LARGE_INTEGER size = {};
    if (GetFileSizeEx(file.Get(), &size) == FALSE)
    {
        return Found::Unreadable;
    }
    if (static_cast<unsigned long long>(size.QuadPart) > limit)
    {
        return Found::TooLarge;
    }
    bytes.resize(static_cast<std::size_t>(size.QuadPart));
    DWORD count = 0;
    if (ReadFile(file.Get(), bytes.data(), static_cast<DWORD>(bytes.size()), &count, nullptr) == FALSE)
    {
        return Found::Unreadable;
    }
    bytes.resize(count); // another program may have cut the file meanwhile
    return Found::Bytes;
}

bool FileBytes::Replace(const wchar_t* path, const std::string& bytes, Previous previous)
{
    const std::wstring target = FullPath(path);
    const DWORD attributes = GetFileAttributesW(target.c_str());
    const bool exists = attributes != INVALID_FILE_ATTRIBUTES;
    if (exists && (attributes & (FILE_ATTRIBUTE_READONLY | FILE_ATTRIBUTE_DIRECTORY)) != 0)
    {
        return false;
    }
    Patience patience;
    if (exists && previous == Previous::Kept &&
        !patience.Try([&] { return CopyFileW(target.c_str(), KeptName(target).c_str(), FALSE) != 0; }))
    {
        return false;
    }
    const std::wstring beside = target + L".new";
    SetFileAttributesW(beside.c_str(), FILE_ATTRIBUTE_NORMAL); // of an interrupted save: a hidden one is not replaced
    UniqueFile file;
    // Nobody else opens it meanwhile: two programs that save at the same time wait for each other.
    const auto create = [&] {
        file.Reset(
            CreateFileW(beside.c_str(), GENERIC_WRITE, 0, nullptr, CREATE_ALWAYS, FILE_ATTRIBUTE_NORMAL, nullptr));
        return static_cast<bool>(file);
    };
    if (!patience.Try(create))
    {
        return ForbidsNewFile(GetLastError()) && WriteInPlace(target.c_str(), bytes, patience);
    }
    const bool written = WriteAll(file.Get(), bytes);
    file.Reset();
    if (written && exists)
    {
        CopyRights(target.c_str(), attributes, beside.c_str());
    }
    const bool replaced = written && MoveIntoPlace(beside.c_str(), target.c_str(), patience);
    if (!replaced && (!exists || !IsMissing(target.c_str())))
    {
        DeleteFileW(beside.c_str());
    }
    return replaced;
}

std::wstring FileBytes::KeptName(const std::wstring& path)
{
    return path + L".unreadable";
}
