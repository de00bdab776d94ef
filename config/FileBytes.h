#pragma once

#include <cstddef>
#include <string>

/// Reads and replaces whole files, so that a reader sees either the old or the new content, also when a save is
/// interrupted. Paths are absolute and may begin with `\\?\`.
namespace FileBytes
{

enum class Found
{
    Missing,    ///< there is no such file
    Unreadable, ///< it cannot be opened or read, for instance because a program keeps others away from it
    TooLarge,
    Bytes
};

/// Reads a file of at most `limit` bytes. The file may be open in other programs. Throws std::bad_alloc.
Found Read(const wchar_t* path, std::size_t limit, std::string& bytes);

/// What happens to a file whose place the new one takes.
enum class Previous
{
    Replaced,
    Kept ///< as a copy, see `KeptName`
};

/// Puts a file with these bytes in the place of `path` in one step. They are first written to a file beside it (the
/// path with ".new" at its end), which gets the attributes and the access rights of the old file; its owner, its
/// creation time and its alternate streams are new. Where the system forbids that file, `path` is written in place.
/// Other programs' handles are waited for, for at most half a second in all. False when the file cannot be written
/// whole; the previous one is then as it was, unless it was written in place.
bool Replace(const wchar_t* path, const std::string& bytes, Previous previous);

/// Where the previous file is kept: beside it, with ".unreadable" at its end. One that is there already is replaced.
std::wstring KeptName(const std::wstring& path);

} // namespace FileBytes
