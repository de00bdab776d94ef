#pragma once

#include "ArchiveFailure.h"

#include <windows.h>

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

/// What the archive does to files. Paths are full ones with the prefix "\\?\". Everything throws
/// `ArchiveFailure` (mostly `ArchiveError::Access`) when Windows refuses.
namespace ArchiveFiles
{

struct HandleCloser
{
    using pointer = HANDLE;
    void operator()(HANDLE handle) const noexcept { CloseHandle(handle); }
};
using UniqueHandle = std::unique_ptr<HANDLE, HandleCloser>;

/// Opens or creates a file; null when that failed, with the reason in `GetLastError`.
UniqueHandle Open(const std::wstring& path, DWORD access, DWORD share, DWORD disposition, DWORD flags = 0) noexcept;

/// Throws `ArchiveFailure` with `what` and the system's message for the error.
[[noreturn]] void ThrowError(const std::wstring& what, DWORD error);

/// The same for the last error.
[[noreturn]] void ThrowLastError(const std::wstring& what);

/// A directory entry.
struct Facts
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
std::optional<Facts> Find(const std::wstring& path);

/// The entries of a folder, in no order.
std::vector<Facts> List(const std::wstring& folder);

/// True when the last error says that a file or its folder does not exist.
bool IsMissing(DWORD error);

/// The bytes of a file; nothing when there is no such file. A file above `limit` bytes is damaged.
std::optional<std::string> ReadText(const std::wstring& path, std::size_t limit);

/// Replaces a file by new bytes through `temporary`, which lies on the same volume: whatever happens, the
/// file is whole, the old one or the new one.
void WriteText(const std::wstring& path, const std::wstring& temporary, std::string_view bytes);

/// Deletes the file at the end of the scope, if it is still there.
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

/// What is known of the bytes of a file.
struct Contents
{
    std::string sha256;
    std::uint64_t size;
    std::uint64_t lastWrite;
};

/// Reads a file to its end.
Contents Read(HANDLE file);

/// Copies a file to a new or emptied one, writes it through to the disk and gives the copy `lastWrite`, or
/// the source's time. Returns what was read.
Contents Copy(HANDLE source, const std::wstring& target, std::optional<std::uint64_t> lastWrite = std::nullopt);

/// Renames a file over another, which may be read-only.
void Replace(const std::wstring& from, const std::wstring& to);

void SetReadOnly(const std::wstring& path, bool readOnly);

/// Makes a folder unless it is there.
void MakeFolder(const std::wstring& path);

} // namespace ArchiveFiles
