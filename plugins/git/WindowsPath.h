#pragma once

#include <string>

/// The full path without "." and "..", without a separator at its end and without the prefix of the long form; paths
/// longer than 260 characters included. Empty when it is no path.
std::wstring FullPath(std::wstring path);

/// The form in which functions of Windows take a full path of any length, also one on a network share.
std::wstring LongForm(const std::wstring& full);
