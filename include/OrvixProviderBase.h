#pragma once

#include "IOrvixProvider.h"
#include "OrvixProviderResult.h"

/// A provider that offers nothing yet: derive from it and write what your version-control system can do. A derived
/// class has to say its name, its session (initialise, open a project) and the state of files; every other operation
/// answers "not offered" until it is overridden. The reserved operations answer what the contract asks.
///
/// Header only: nothing is imported for it. Implemented by: plug-in.
class OrvixProviderBase : public IOrvixProvider
{
public:
    /// Each operation on files, the dialogs and the provider's own program: not offered.
    int CheckIn(OrvixFileList*, const wchar_t*, unsigned long) override { return OrvixProviderResult::NotOffered; }
    int CheckOut(OrvixFileList*, const wchar_t*, unsigned long) override { return OrvixProviderResult::NotOffered; }
    int UndoCheckOut(OrvixFileList*, unsigned long) override { return OrvixProviderResult::NotOffered; }
    int GetLatest(OrvixFileList*, unsigned long) override { return OrvixProviderResult::NotOffered; }
    int Add(OrvixFileList*, const wchar_t*, unsigned long) override { return OrvixProviderResult::NotOffered; }
    int ShowHistory(OrvixFileList*) override { return OrvixProviderResult::NotOffered; }
    int ShowProperties(OrvixFileList*) override { return OrvixProviderResult::NotOffered; }
    int ShowOptions() override { return OrvixProviderResult::NotOffered; }
    int RunProviderClient() override { return OrvixProviderResult::NotOffered; }

    // The reserved slots of the table.
    int ReservedA() override { return OrvixProviderResult::Success; }
    int ReservedB() override { return OrvixProviderResult::Success; }
    int ReservedC() override { return OrvixProviderResult::NotOffered; }
    int ReservedD(void*, unsigned long* first, unsigned long* second) override
    {
        *first = 0;
        *second = 0;
        return OrvixProviderResult::NotOffered;
    }
    int ReservedE() override { return OrvixProviderResult::NotOffered; }
    int ReservedF() override { return OrvixProviderResult::NotOffered; }
    int ReservedG() override { return OrvixProviderResult::NotOffered; }
    int ReservedH() override { return OrvixProviderResult::NotOffered; }
    bool ReservedI() override { return true; }
};
