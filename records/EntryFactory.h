#pragma once

#include "OrvixFileEntry.h"

#include <memory>

/// New entries on the host's heap, for lists and attachments. Null when memory is exhausted.

/// True when a setter that was given `wanted` has stored it: setters leave the old, empty text without memory.
inline bool IsStored(const wchar_t* wanted, const wchar_t* stored)
{
    return !wanted || !*wanted || *stored;
}

/// An entry made from a path and values. `file` is not null.
std::unique_ptr<OrvixFileEntry> MakeEntry(const wchar_t* file, OrvixFileEntry* parent, unsigned long flagsIn,
                                          long long clientPtr);

/// A copy of `source`'s path, flags, client value and parent link, read through its virtual getters.
std::unique_ptr<OrvixFileEntry> CopyEntry(OrvixFileEntry& source);
