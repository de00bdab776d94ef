#include "FileState.h"

#include "OrvixFileFlags.h"

#include <string_view>

FileState StateOf(const FileRow& row)
{
    if (row.excluded)
    {
        return {Icon::Excluded, L"Excluded by the administrator"};
    }
    const auto has = [&row](unsigned long bit) { return (row.flags & bit) != 0; };
    if (!has(OrvixFileState::Controlled))
    {
        return has(OrvixFileState::NotControlled) ? FileState{Icon::NotControlled, L"Not controlled"}
                                                  : FileState{Icon::Unknown, L"Unknown"};
    }
    // The icon is that of the last fact that applies, the most important one.
    FileState state{Icon::CheckedIn, L"Checked in"};
    const auto addWhen = [&](bool condition, Icon icon, std::wstring_view words) {
        if (condition)
        {
            state.words = (state.icon == Icon::CheckedIn ? L"" : state.words + L", ");
            state.words += words;
            state.icon = icon;
        }
    };
    addWhen(has(OrvixFileState::CheckedOut), Icon::CheckedOut, L"Checked out");
    addWhen(has(OrvixFileState::CheckedOutByOther), Icon::CheckedOutByOther, L"Checked out by another user");
    addWhen(has(OrvixFileState::Modified), Icon::Modified, L"Modified");
    addWhen(has(OrvixFileState::OutOfDate), Icon::OutOfDate, L"Out of date");
    addWhen(has(OrvixFileState::Deleted), Icon::Deleted, L"Deleted in the project");
    return state;
}
