// A provider that works, and does in one place what libraries in the wild do. `Defect` names it.

#include "Defect.h"
#include "DiskProvider.h"
#include "IOrvixClientAccess.h"
#include "OrvixClientInfo.h"
#include "OrvixKnownFiles.h"
#include "OrvixVersion.h"

#include <windows.h>

#include <objbase.h>

#include <cfloat>
#include <clocale>
#include <cstdint>
#include <stdexcept>
#include <string>

namespace
{

constexpr const wchar_t* Name = L"Wild";

/// Changes what belongs to the whole process and to the thread.
void ChangeProcess()
{
    SetCurrentDirectoryW(L"C:\\windows");
    CoUninitialize();
    CoInitializeEx(nullptr, COINIT_MULTITHREADED);
    std::setlocale(LC_ALL, "");
    SetErrorMode(SEM_NOALIGNMENTFAULTEXCEPT);
    SetDllDirectoryW(L"C:\\windows");
}

class WildProvider final : public DiskProvider
{
public:
    WildProvider() : DiskProvider(Name) {}

    int Initialize(OrvixClientInfo* info) override
    {
        if (Defect::Is(L"changes-process"))
        {
            ChangeProcess();
        }
        m_client = info->GetIOrvixClientAccess();
        return DiskProvider::Initialize(info);
    }

    int CheckIn(OrvixFileList* list, const wchar_t* comment, unsigned long options) override
    {
        return DiskProvider::CheckIn(list, comment, Defect::Is(L"keeps-nothing") ? 0 : options);
    }

    int QueryStatus(OrvixFileList* list, unsigned long options) override
    {
        if (Defect::Is(L"changes-process"))
        {
            ChangeProcess();
        }
        if (Defect::Is(L"exit-in-status"))
        {
            ExitProcess(0);
        }
        if (Defect::Is(L"crash-in-status"))
        {
            Defect::Crash();
        }
        if (Defect::Is(L"hang-in-status"))
        {
            Defect::Hang();
        }
        if (Defect::Is(L"window-in-status") &&
            MessageBoxW(nullptr, L"There is no repository. Create one?", L"Wild Provider", MB_YESNOCANCEL) != IDYES)
        {
            return OrvixProviderResult::Failure;
        }
        if (Defect::Is(L"talks"))
        {
            m_client->OutputText(L"looking", 0);
        }
        Defect::Report("QueryStatus", list->NumActiveEntries());
        const int result = DiskProvider::QueryStatus(list, options);
        return Defect::Is(L"every-state") ? ForEachEntry(list, SetEveryState) : result;
    }

private:
    /// As the library translates a status word of -1.
    static bool SetEveryState(OrvixFileEntry& entry)
    {
        entry.SetFlagsOut(OrvixFileState::Controlled | OrvixFileState::CheckedOut | OrvixFileState::CheckedOutByOther |
                          OrvixFileState::OutOfDate | OrvixFileState::Deleted | OrvixFileState::Modified |
                          OrvixFilePermission::GetLatest);
        return true;
    }

    IOrvixClientAccess* m_client = nullptr;
};

WildProvider provider;

/// Names gone.txt twice, a file that is not controlled, and what is no path of a file below the folder.
void NameNonsense(const std::wstring& folder, OrvixKnownFileCallback callback, void* callerData)
{
    callback(callerData, nullptr);
    for (const std::wstring& path : {
             folder + L"\\gone.txt",
             folder + L"\\GONE.TXT",
             folder + L"\\never.txt",
             folder + L"\\here.txt",
             folder + L"\\.hidden\\gone.txt",
             std::wstring(),
             std::wstring(L"gone.txt"),
             std::wstring(L"C:\\elsewhere\\gone.txt"),
             folder,
             folder + L"\\",
             folder + L"2\\gone.txt",
             folder + L"\\..\\gone.txt",
             folder + L"\\a\\..\\gone.txt",
             folder + L"\\a\\\\gone.txt",
             folder + L"\\a/gone.txt",
             folder + L"\\a\\gone.txt\\",
             folder + L"\\gone.txt ",
             folder + L"\\gone.txt:stream",
             folder + L"\\a\n\\gone.txt",
             folder + L"\\*\\gone.txt",
             folder + L'\\' + std::wstring(40000, L'a') + L"\\gone.txt",
         })
    {
        callback(callerData, path.c_str());
    }
}

} // namespace

extern "C" {
__declspec(dllexport) std::int32_t GetOrvixVersion()
{
    return ORVIX_PLUGIN_CONTRACT_VERSION;
}

__declspec(dllexport) IOrvixProvider* GetIOrvixProvider()
{
    return &provider;
}

__declspec(dllexport) void ReleaseIOrvixProvider(IOrvixProvider*)
{
}

__declspec(dllexport) const wchar_t* GetOrvixProviderName()
{
    return Name;
}

__declspec(dllexport) int GetOrvixKnownFiles(IOrvixProvider*, const wchar_t* folder, OrvixKnownFileCallback callback,
                                             void* callerData)
{
    if (Defect::Is(L"changes-process"))
    {
        ChangeProcess();
    }
    if (Defect::Is(L"names-nonsense"))
    {
        NameNonsense(folder, callback, callerData);
    }
    if (Defect::Is(L"throws-names"))
    {
        callback(callerData, (std::wstring(folder) + L"\\gone.txt").c_str());
        throw std::runtime_error("thrown by the export");
    }
    while (Defect::Is(L"names-endlessly"))
    {
        callback(callerData, (std::wstring(folder) + L"\\gone.txt").c_str());
    }
    return OrvixProviderResult::Success;
}
} // extern "C"

BOOL WINAPI DllMain(HINSTANCE, DWORD reason, void*)
{
    if (reason == DLL_PROCESS_ATTACH && Defect::Is(L"exit-at-load"))
    {
        ExitProcess(0);
    }
    if (reason == DLL_PROCESS_ATTACH && Defect::Is(L"hang-at-load"))
    {
        Defect::Hang();
    }
    if (reason == DLL_PROCESS_DETACH && Defect::Is(L"hang-at-unload"))
    {
        Defect::Hang();
    }
    return TRUE;
}
