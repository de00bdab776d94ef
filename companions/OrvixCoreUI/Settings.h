#pragma once

#include <windows.h>

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

/// What the dialogs remember of the user from one session to the next, in the registry below
/// HKEY_CURRENT_USER\Software\OrvixCore\Dialogs. What cannot be read is not there, what cannot be written is lost.
namespace Settings
{

/// How many recent comments are kept.
constexpr std::size_t MaxRecentComments = 20;

/// The size of a dialog's window at 96 dots per inch.
std::optional<SIZE> WindowSize(const std::wstring& dialog);
void StoreWindowSize(const std::wstring& dialog, SIZE size);

/// The comments of confirmed dialogs, the latest first.
std::vector<std::wstring> RecentComments();

/// Puts a comment first, where it is not empty.
void AddRecentComment(const std::wstring& comment);

} // namespace Settings
