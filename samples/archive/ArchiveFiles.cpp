#include "ArchiveFiles.h"

#include "ArchiveText.h"
#include "Sha256.h"

namespace
{

std::uint64_t Join(DWORD high, DWORD low)
{
    return static_cast<std::uint64_t>(high) << 32 | low;
}

std::uint64_t LastWrite(HANDLE file)
{
    FILETIME time;
    if (!GetFileTime(file, nullptr, nullptr, &time))
    {
        ArchiveFiles::ThrowLastError(L"The time of a file cannot be read");
    }
    return Join(time.dwHighDateTime, time.dwLowDateTime);
}

struct SearchCloser
{
    using pointer = HANDLE;
    void operator()(HANDLE search) const noexcept { FindClose(search); }
};
using UniqueSearch = std::unique_ptr<HANDLE, SearchCloser>;

/// Starts a search for files. Null on failure; `GetLastError` then gives the reason.
UniqueSearch BeginSearch(const std::wstring& pattern, WIN32_FIND_DATAW& data)
{
    const HANDLE search = FindFirstFileW(pattern.c_str(), &data);
    return UniqueSearch(search == INVALID_HANDLE_VALUE ? nullptr : search);
}

ArchiveFiles::Entry EntryOf(const WIN32_FIND_DATAW& data)
{
    const bool isLink = (data.dwFileAttributes & FILE_ATTRIBUTE_REPARSE_POINT) != 0 &&
                        (data.dwReserved0 == IO_REPARSE_TAG_SYMLINK || data.dwReserved0 == IO_REPARSE_TAG_MOUNT_POINT);
    return {data.cFileName, data.dwFileAttributes, Join(data.nFileSizeHigh, data.nFileSizeLow),
            Join(data.ftLastWriteTime.dwHighDateTime, data.ftLastWriteTime.dwLowDateTime), isLink};
}

void Write(HANDLE file, const char* bytes, std::size_t size)
{
    constexpr std::size_t MaxBlock = 1 << 20;
    while (size > 0)
    {
        DWORD written = 0;
        if (!WriteFile(file, bytes, static_cast<DWORD>(size < MaxBlock ? size : MaxBlock), &written, nullptr))
        {
            ArchiveFiles::ThrowLastError(L"A file cannot be written");
        }
        bytes += written;
        size -= written;
    }
}

void Flush(HANDLE file)
{
    if (!FlushFileBuffers(file))
    {
        ArchiveFiles::ThrowLastError(L"A file cannot be flushed to the disk");
    }
}

ArchiveFiles::UniqueHandle Create(const std::wstring& path)
{
    ArchiveFiles::UniqueHandle file = ArchiveFiles::Open(path, GENERIC_WRITE, 0, CREATE_ALWAYS);
    if (!file)
    {
        ArchiveFiles::ThrowLastError(L"A file cannot be created");
    }
    return file;
}

/// Calls `attempt` again when it fails because another program has the file open. A virus scanner, for example, opens
/// every new file for a moment. False, with the last error set, when it still fails after a fifth of a second.
template <typename Attempt>
bool WithRetries(Attempt attempt)
{
    for (int pauses = 20; !attempt(); --pauses)
    {
        const DWORD error = GetLastError();
        if (pauses == 0 || (error != ERROR_SHARING_VIOLATION && error != ERROR_ACCESS_DENIED))
        {
            return false;
        }
        Sleep(10);
    }
    return true;
}

/// Calls `take` with each block of an open file.
template <typename Take>
void ReadBlocks(HANDLE file, Take take)
{
    std::vector<char> block(1 << 16);
    for (;;)
    {
        DWORD size = 0;
        if (!ReadFile(file, block.data(), static_cast<DWORD>(block.size()), &size, nullptr))
        {
            ArchiveFiles::ThrowLastError(L"A file cannot be read");
        }
        if (size == 0)
        {
            return;
        }
        take(block.data(), size);
    }
}

} // namespace

ArchiveFiles::UniqueHandle ArchiveFiles::Open(const std::wstring& path, DWORD access, DWORD share, DWORD disposition,
                                              DWORD flags) noexcept
{
    const HANDLE handle = CreateFileW(path.c_str(), access, share, nullptr, disposition, flags, nullptr);
    return UniqueHandle(handle == INVALID_HANDLE_VALUE ? nullptr : handle);
}

void ArchiveFiles::ThrowError(const std::wstring& what, DWORD error)
{
    throw ArchiveFailure{ArchiveError::Access, what + L": " + ArchiveText::SystemMessage(error), {}};
}

void ArchiveFiles::ThrowLastError(const std::wstring& what)
{
    ThrowError(what, GetLastError());
}

bool ArchiveFiles::IsMissing(DWORD error)
{
    return error == ERROR_FILE_NOT_FOUND || error == ERROR_PATH_NOT_FOUND;
}

std::optional<ArchiveFiles::Entry> ArchiveFiles::Find(const std::wstring& path)
{
    WIN32_FIND_DATAW data;
    if (BeginSearch(path, data))
    {
        return EntryOf(data);
    }
    if (IsMissing(GetLastError()))
    {
        return std::nullopt;
    }
    ThrowLastError(L"A file cannot be found");
}

std::vector<ArchiveFiles::Entry> ArchiveFiles::List(const std::wstring& folder)
{
    std::vector<Entry> entries;
    WIN32_FIND_DATAW data;
    const UniqueSearch search = BeginSearch(folder + L"\\*", data);
    for (bool more = search != nullptr; more; more = FindNextFileW(search.get(), &data) != FALSE)
    {
        const std::wstring_view name = data.cFileName;
        if (name != L"." && name != L"..")
        {
            entries.push_back(EntryOf(data));
        }
    }
    if (GetLastError() != ERROR_NO_MORE_FILES)
    {
        ThrowLastError(L"A folder of the archive cannot be listed");
    }
    return entries;
}

std::optional<std::string> ArchiveFiles::ReadText(const std::wstring& path, std::size_t limit)
{
    UniqueHandle file;
    const auto open = [&] {
        file = Open(path, GENERIC_READ, FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE, OPEN_EXISTING);
        return file != nullptr;
    };
    if (!WithRetries(open))
    {
        if (IsMissing(GetLastError()))
        {
            return std::nullopt;
        }
        ThrowLastError(L"A file of the archive cannot be opened");
    }
    std::string bytes;
    ReadBlocks(file.get(), [&](const char* block, std::size_t size) {
        if (size > limit - bytes.size())
        {
            throw ArchiveFailure{ArchiveError::Damaged, L"A file of the archive is too large", {}};
        }
        bytes.append(block, size);
    });
    return bytes;
}

void ArchiveFiles::WriteText(const std::wstring& path, const std::wstring& temporary, std::string_view bytes)
{
    const TemporaryFile guard(temporary);
    {
        const UniqueHandle file = Create(temporary);
        Write(file.get(), bytes.data(), bytes.size());
        Flush(file.get());
    }
    Replace(temporary, path);
}

ArchiveFiles::Contents ArchiveFiles::Read(HANDLE file)
{
    Sha256 sha256;
    std::uint64_t size = 0;
    ReadBlocks(file, [&](const char* block, std::size_t blockSize) {
        sha256.Add(block, blockSize);
        size += blockSize;
    });
    return {sha256.Finish(), size, LastWrite(file)};
}

ArchiveFiles::Contents ArchiveFiles::Copy(HANDLE source, const std::wstring& target,
                                          std::optional<std::uint64_t> lastWrite)
{
    const UniqueHandle file = Create(target);
    Sha256 sha256;
    std::uint64_t size = 0;
    ReadBlocks(source, [&](const char* block, std::size_t blockSize) {
        sha256.Add(block, blockSize);
        Write(file.get(), block, blockSize);
        size += blockSize;
    });
    Contents contents{sha256.Finish(), size, LastWrite(source)};
    const std::uint64_t stamp = lastWrite.value_or(contents.lastWrite);
    const FILETIME time{static_cast<DWORD>(stamp), static_cast<DWORD>(stamp >> 32)};
    if (!SetFileTime(file.get(), nullptr, nullptr, &time))
    {
        ThrowLastError(L"The time of a file cannot be set");
    }
    Flush(file.get());
    return contents;
}

void ArchiveFiles::Replace(const std::wstring& from, const std::wstring& to)
{
    const DWORD attributes = GetFileAttributesW(to.c_str());
    const bool wasReadOnly = attributes != INVALID_FILE_ATTRIBUTES && (attributes & FILE_ATTRIBUTE_READONLY) != 0;
    if (wasReadOnly)
    {
        SetReadOnly(to, false);
    }

    const auto move = [&] {
        return MoveFileExW(from.c_str(), to.c_str(), MOVEFILE_REPLACE_EXISTING | MOVEFILE_WRITE_THROUGH) != FALSE;
    };
    if (!WithRetries(move))
    {
        const DWORD error = GetLastError();
        if (wasReadOnly)
        {
            SetReadOnly(to, true);
        }
        ThrowError(L"A file cannot be replaced", error);
    }
}

void ArchiveFiles::SetReadOnly(const std::wstring& path, bool readOnly)
{
    const DWORD attributes = GetFileAttributesW(path.c_str());
    const DWORD wanted =
        readOnly ? attributes | FILE_ATTRIBUTE_READONLY : attributes & ~static_cast<DWORD>(FILE_ATTRIBUTE_READONLY);
    if (attributes == INVALID_FILE_ATTRIBUTES ||
        (wanted != attributes && !SetFileAttributesW(path.c_str(), wanted == 0 ? FILE_ATTRIBUTE_NORMAL : wanted)))
    {
        ThrowLastError(readOnly ? L"The file cannot be made read-only" : L"The file cannot be made writable");
    }
}

void ArchiveFiles::MakeFolder(const std::wstring& path)
{
    if (!CreateDirectoryW(path.c_str(), nullptr) && GetLastError() != ERROR_ALREADY_EXISTS)
    {
        ThrowLastError(L"A folder cannot be made");
    }
}
