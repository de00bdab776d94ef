#pragma once

#include "ArchiveFailure.h"

#include <windows.h>

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

/// The operations on files that the archive needs. Paths are full and have the prefix "\\?\". A function that fails
/// throws `ArchiveFailure`, with `ArchiveError::Access` unless it says otherwise.
namespace ArchiveFiles
{

struct HandleCloser
{
    using pointer = HANDLE;
    void operator()(HANDLE handle) const noexcept { CloseHandle(handle); }
};
using UniqueHandle = std::unique_ptr<HANDLE, HandleCloser>;

/// Opens or creates a file. Null on failure; `GetLastError` then gives the reason.
UniqueHandle Open(const std::wstring& path, DWORD access, DWORD share, DWORD disposition, DWORD flags = 0) noexcept;

/// Throws `ArchiveFailure` with `what` and the system's message for the error.
[[noreturn]] void ThrowError(const std::wstring& what, DWORD error);

/// The same for the last error.
[[noreturn]] void ThrowLastError(const std::wstring& what);

/// A directory entry.
struct Entry
{
    std::wstring name; ///< long name in the letter case of the disk
    DWORD attributes;
    std::uint64_t size;
    std::uint64_t lastWrite; ///< FILETIME
    bool isLink;             ///< a symbolic link or a mount point

    bool IsFolder() const { return (attributes & FILE_ATTRIBUTE_DIRECTORY) != 0; }
    bool IsReadOnly() const { return (attributes & FILE_ATTRIBUTE_READONLY) != 0; }
};

/// The entry at a path; nothing when there is none.
std::optional<Entry> Find(const std::wstring& path);

/// The entries of a folder, in no order.
std::vector<Entry> List(const std::wstring& folder);

/// True when an error code of Windows says that a file or its folder does not exist.
bool IsMissing(DWORD error);

/// The bytes of a file; nothing when there is no such file. Throws `ArchiveError::Damaged` for more than `limit`
/// bytes.
std::optional<std::string> ReadText(const std::wstring& path, std::size_t limit);

/// Replaces a file by one with new bytes. They are written to `temporary`, on the same volume, which is then renamed:
/// at any moment the file is the whole old one or the whole new one.
void WriteText(const std::wstring& path, const std::wstring& temporary, std::string_view bytes);

/// Deletes a file at the end of the scope, if it still exists.
class TemporaryFile
{
public:
    explicit TemporaryFile(const std::wstring& path) : m_path(path) {}
    TemporaryFile(const TemporaryFile&) = delete;
    TemporaryFile& operator=(const TemporaryFile&) = delete;
    ~TemporaryFile() { DeleteFileW(m_path.c_str()); }

    const std::wstring& Path() const { return m_path; }

private:
    std::wstring m_path;
};

/// The digest of the bytes of a file, their number, and the time of the file.
struct Contents
{
    std::string sha256;
    std::uint64_t size;
    std::uint64_t lastWrite;
};

/// Reads an open file to its end.
Contents Read(HANDLE file);

/// Copies an open file to `target`, which is made or overwritten, and flushes it to the disk. The copy gets the time
/// `lastWrite`, or that of the source. Returns what was read.
Contents Copy(HANDLE source, const std::wstring& target, std::optional<std::uint64_t> lastWrite = std::nullopt);

/// Renames a file to `to`. A file of that name, read-only or not, is replaced.
void Replace(const std::wstring& from, const std::wstring& to);

void SetReadOnly(const std::wstring& path, bool readOnly);

/// Makes a folder unless it exists.
void MakeFolder(const std::wstring& path);

} // namespace ArchiveFiles
