// A provider plug-in for tests, built once per defect. The build sets FAKE_TAG (its word in the journal), FAKE_NAME,
// FAKE_VERSION and the defect; functions may be missing in the export list.

#include "ActiveManifest.h"
#include "FakeJournal.h"
#include "FakeProvider.h"
#include "OrvixVersion.h"

#include <windows.h>

#include <comdef.h>

#include <cstdint>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <new>

#ifndef FAKE_VERSION
#define FAKE_VERSION ORVIX_PLUGIN_CONTRACT_VERSION
#endif
#if defined(FAKE_NAME_NON_ASCII)
#define FAKE_NAME L"D\u00E9p\u00F4t \u5009\u5EAB"
#elif !defined(FAKE_NAME)
#define FAKE_NAME L"Fake Depot"
#endif

namespace
{

void Note(const wchar_t* what)
{
    FakeJournal::Add(std::wstring(FAKE_TAG L".") + what);
}

/// Writes a text for a test in another process to the file that ORVIX_FAKE_MANIFEST_FILE names, if any.
void Report(const std::wstring& text)
{
    std::wstring file(1024, L'\0');
    file.resize(GetEnvironmentVariableW(L"ORVIX_FAKE_MANIFEST_FILE", file.data(), static_cast<DWORD>(file.size())));
    if (!file.empty())
    {
        std::wofstream(std::filesystem::path(file)) << text;
    }
}

/// Prints through the C run-time and through the system.
void Print([[maybe_unused]] const char* text)
{
#ifdef FAKE_PRINTS
    std::puts(text);
    std::fflush(stdout);
    DWORD written = 0;
    WriteFile(GetStdHandle(STD_OUTPUT_HANDLE), text, static_cast<DWORD>(std::strlen(text)), &written, nullptr);
#endif
}

} // namespace

extern "C" {

std::int32_t GetOrvixVersion()
{
    Note(L"version");
#ifdef FAKE_VERSION_THROWS
    throw FAKE_VERSION_THROWS;
#else
    return FAKE_VERSION;
#endif
}

IOrvixProvider* GetIOrvixProvider()
{
    Note(L"get");
#ifdef FAKE_PROVIDER_THROWS
    throw FAKE_PROVIDER_THROWS;
#else
    // Another object each time, so that the test sees whether the caller keeps one.
    static FakeProvider providers[] = {FakeProvider(FAKE_NAME), FakeProvider(FAKE_NAME), FakeProvider(FAKE_NAME)};
    static unsigned int next = 0;
    return &providers[next++ % 3];
#endif
}

void ReleaseIOrvixProvider(IOrvixProvider*)
{
    Note(L"release");
}

const wchar_t* GetOrvixProviderName()
{
    Note(L"name");
#ifdef FAKE_NAME_THROWS
    throw FAKE_NAME_THROWS;
#else
    return FAKE_NAME;
#endif
}

} // extern "C"

BOOL WINAPI DllMain(HINSTANCE, DWORD reason, void*)
{
    if (reason == DLL_PROCESS_ATTACH)
    {
        Note(L"load");
        Print("I am loaded");
#ifdef FAKE_CHANGES_FOLDER
        SetCurrentDirectoryW(L"C:\\windows");
#endif
        SetEnvironmentVariableW(L"ORVIX_FAKE_MANIFEST", ActiveManifest().c_str());
        Report(ActiveManifest());
#ifdef FAKE_START_FAILS
        return FALSE;
#endif
    }
    else if (reason == DLL_PROCESS_DETACH)
    {
        Note(L"unload");
        Print("I am unloaded");
    }
    return TRUE;
}
