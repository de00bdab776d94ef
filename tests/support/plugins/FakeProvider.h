#pragma once

#include "IOrvixProvider.h"

/// The least that a provider can be: it has a name and offers nothing.
class FakeProvider : public IOrvixProvider
{
public:
    explicit FakeProvider(const wchar_t* name) : m_name(name) {}

    const wchar_t* GetName() override { return m_name; }
    int ReservedA() override { return 0; }
    bool IsInitialized() override { return false; }
    bool IsProjectOpen() override { return false; }
    int Initialize(OrvixClientInfo*) override { return -1; }
    int Uninitialize() override { return -1; }
    int OpenProject(const wchar_t*, const wchar_t*) override { return -1; }
    int CloseProject() override { return -1; }
    int ReservedB() override { return 0; }
    int ReservedC() override { return -2; }
    int CheckIn(OrvixFileList*, const wchar_t*, unsigned long) override { return -1; }
    int CheckOut(OrvixFileList*, const wchar_t*, unsigned long) override { return -1; }
    int UndoCheckOut(OrvixFileList*, unsigned long) override { return -1; }
    int GetLatest(OrvixFileList*, unsigned long) override { return -1; }
    int ReservedD(void*, unsigned long* first, unsigned long* second) override
    {
        *first = 0;
        *second = 0;
        return -2;
    }
    int ReservedE() override { return -2; }
    int Add(OrvixFileList*, const wchar_t*, unsigned long) override { return -1; }
    int ShowHistory(OrvixFileList*) override { return -1; }
    int ShowProperties(OrvixFileList*) override { return -1; }
    int QueryStatus(OrvixFileList*, unsigned long) override { return -1; }
    int ReservedF() override { return -2; }
    int ReservedG() override { return -2; }
    int ShowOptions() override { return -1; }
    int RunProviderClient() override { return -1; }
    int ReservedH() override { return -2; }
    bool ReservedI() override { return true; }

private:
    const wchar_t* m_name;
};
