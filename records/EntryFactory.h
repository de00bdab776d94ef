#pragma once

#include "OrvixFileEntry.h"

#include <memory>

/// New entries on the host's heap, for lists and attachments. Throw std::bad_alloc when memory is exhausted.

/// An entry made from a path and values. `file` is not null.
std::unique_ptr<OrvixFileEntry> MakeEntry(const wchar_t* file, OrvixFileEntry* parent, unsigned long flagsIn,
                                          long long clientPtr);

/// A copy of `source`'s path, flags, client value and parent link, read through its virtual getters.
std::unique_ptr<OrvixFileEntry> CopyEntry(OrvixFileEntry& source);
