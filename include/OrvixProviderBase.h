#pragma once

#include "IOrvixProvider.h"
#include "OrvixFileList.h"
#include "OrvixProviderResult.h"

/// A provider that offers nothing yet: derive from it and write what your version-control system can do. A derived
/// class has to say its name, its session (initialise, open a project) and the state of files; every other operation
/// answers "not offered" until it is overridden, and fails for a list without an active entry, as the contract asks of
/// every file operation. The reserved operations answer what the contract asks.
///
/// Header only: nothing is imported for it. Implemented by: plug-in.
class OrvixProviderBase : public IOrvixProvider
{
public:
    /// Not offered; fails for a list without an active entry.
    int CheckIn(OrvixFileList* list, const wchar_t*, unsigned long) override { return NotOfferedFor(list); }
    /// Not offered; fails for a list without an active entry.
    int CheckOut(OrvixFileList* list, const wchar_t*, unsigned long) override { return NotOfferedFor(list); }
    /// Not offered; fails for a list without an active entry.
    int UndoCheckOut(OrvixFileList* list, unsigned long) override { return NotOfferedFor(list); }
    /// Not offered; fails for a list without an active entry.
    int GetLatest(OrvixFileList* list, unsigned long) override { return NotOfferedFor(list); }
    /// Not offered; fails for a list without an active entry.
    int Add(OrvixFileList* list, const wchar_t*, unsigned long) override { return NotOfferedFor(list); }
    /// Not offered; fails for a list without an active entry.
    int ShowHistory(OrvixFileList* list) override { return NotOfferedFor(list); }
    /// Not offered; fails for a list without an active entry.
    int ShowProperties(OrvixFileList* list) override { return NotOfferedFor(list); }

    /// Not offered.
    int ShowOptions() override { return OrvixProviderResult::NotOffered; }
    /// Not offered.
    int RunProviderClient() override { return OrvixProviderResult::NotOffered; }

    /// Reserved: succeeds.
    int ReservedA() override { return OrvixProviderResult::Success; }
    /// Reserved: succeeds.
    int ReservedB() override { return OrvixProviderResult::Success; }
    /// Reserved: not offered.
    int ReservedC() override { return OrvixProviderResult::NotOffered; }
    /// Reserved: not offered. Stores 0 through both pointers, which may not be null.
    int ReservedD(void*, unsigned long* first, unsigned long* second) override
    {
        *first = 0;
        *second = 0;
        return OrvixProviderResult::NotOffered;
    }
    /// Reserved: not offered.
    int ReservedE() override { return OrvixProviderResult::NotOffered; }
    /// Reserved: not offered.
    int ReservedF() override { return OrvixProviderResult::NotOffered; }
    /// Reserved: not offered.
    int ReservedG() override { return OrvixProviderResult::NotOffered; }
    /// Reserved: not offered.
    int ReservedH() override { return OrvixProviderResult::NotOffered; }
    /// Reserved: true.
    bool ReservedI() override { return true; }

private:
    static int NotOfferedFor(OrvixFileList* list)
    {
        const bool empty = list != nullptr && list->NumActiveEntries() == 0;
        return empty ? OrvixProviderResult::Failure : OrvixProviderResult::NotOffered;
    }
};
