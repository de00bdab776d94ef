#pragma once

#include "OrvixProviderBase.h"

/// The least that a provider can be: it has a name, and no session of it ever starts.
class FakeProvider : public OrvixProviderBase
{
public:
    explicit FakeProvider(const wchar_t* name) : m_name(name) {}

    const wchar_t* GetName() override { return m_name; }
    bool IsInitialized() override { return false; }
    bool IsProjectOpen() override { return false; }
    int Initialize(OrvixClientInfo*) override { return OrvixProviderResult::Failure; }
    int Uninitialize() override { return OrvixProviderResult::Failure; }
    int OpenProject(const wchar_t*, const wchar_t*) override { return OrvixProviderResult::Failure; }
    int CloseProject() override { return OrvixProviderResult::Failure; }
    int QueryStatus(OrvixFileList*, unsigned long) override { return OrvixProviderResult::Failure; }

private:
    const wchar_t* m_name;
};
