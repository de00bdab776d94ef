#include "FileState.h"

std::string FileState::InWords(unsigned long flags, bool exists)
{
    if ((flags & Controlled) == 0)
    {
        return exists ? "not controlled" : "no such file";
    }
    std::string words = (flags & CheckedOut) != 0          ? "checked out"
                        : (flags & CheckedOutByOther) != 0 ? "checked out by another user"
                                                           : "checked in";
    const struct
    {
        bool applies;
        const char* words;
    } additions[] = {
        {(flags & CheckedOut) != 0 && (flags & CheckedOutByOther) != 0, "also by another user"},
        {(flags & Modified) != 0, "modified"},
        {(flags & OutOfDate) != 0, "out of date"},
        {(flags & Deleted) != 0, "deleted in the project"},
        {!exists, "missing on disk"},
    };
    for (const auto& addition : additions)
    {
        words += addition.applies ? std::string(", ") + addition.words : "";
    }
    return words;
}
