#pragma once

#include <windows.h>

#include <string>

/// The absolute path of what the user typed, without a separator at its end (but for a root).
std::wstring FullPath(const std::wstring& path);

/// The path as seen from a folder: its part below the folder, the whole path when it lies elsewhere.
std::wstring PathBelow(const std::wstring& folder, const std::wstring& path);

/// The path in a form in which the names of one file are equal.
std::wstring PathKey(const std::wstring& path);

/// A full path in the form in which its length has no limit.
std::wstring LongPath(const std::wstring& full);

/// Whether a file or folder is there.
bool PathExists(const std::wstring& path);

/// The full path of a loaded module; of this program for null.
std::wstring ModulePath(HMODULE module);

/// Whether a folder is there.
bool IsFolder(const std::wstring& path);
