#pragma once

#include <string>

/// The absolute path of what the user typed, without a separator at its end unless it is a root. Throws `ToolError`
/// with `ExitCode::BadUsage` when the text is not a path.
std::wstring FullPath(const std::wstring& path);

/// Whether a path names the same file whatever the current folder is: it begins with a drive and a separator, or with a
/// server.
bool IsAbsolutePath(const std::wstring& path);

/// A full path in the letter case of the disk, as far as it exists.
std::wstring PathAsOnDisk(const std::wstring& full);

/// The part of a path below a folder; the whole path when it is not below the folder. Letter case does not count.
std::wstring PathBelow(const std::wstring& folder, const std::wstring& path);

/// The path in upper case, so that paths can be compared without regard to letter case.
std::wstring PathKey(const std::wstring& path);

/// A full path with the prefix that removes the limit on its length.
std::wstring LongPath(const std::wstring& full);

/// Whether a file or a folder has this path.
bool PathExists(const std::wstring& path);

/// Whether the disk has neither a file nor a folder of this path; false also when that cannot be found out.
bool IsMissing(const std::wstring& path);

/// Whether a folder has this path.
bool IsFolder(const std::wstring& path);
