#pragma once

#include <windows.h>

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

/// What the dialogs remember about the user from one session to the next, in the registry key
/// HKEY_CURRENT_USER\Software\OrvixCore\Dialogs. A value that cannot be read counts as missing; one that cannot be
/// written is lost.
namespace Settings
{

/// How many recent comments are stored.
constexpr std::size_t MaxRecentComments = 20;

/// The size of the window of a dialog, in pixels at 96 dots per inch; nothing when none is stored. `dialog` is the name
/// that the dialog has in the registry.
std::optional<SIZE> WindowSize(const std::wstring& dialog);
void StoreWindowSize(const std::wstring& dialog, SIZE size);

/// How the user left a list.
struct ListView
{
    std::vector<int> shares; ///< the widths of the columns, in thousandths of the whole; empty when none are stored
    int sortColumn = 0;      ///< counted from 1; 0 for the order of the host
    bool descending = false;
};

/// What is stored about the list of a dialog, which has `columns` columns.
ListView StoredListView(const std::wstring& dialog, std::size_t columns);
void StoreListView(const std::wstring& dialog, const ListView& view);

/// The comments of confirmed dialogs, the latest first, at most `MaxRecentComments`.
std::vector<std::wstring> RecentComments();

/// Makes a comment the first of the recent ones. An empty comment is ignored.
void AddRecentComment(const std::wstring& comment);

} // namespace Settings
