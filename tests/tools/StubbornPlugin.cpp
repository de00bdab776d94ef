// A provider that reports success for every operation on files and changes nothing, so that a host must not trust it.

#include "OrvixFileEntry.h"
#include "OrvixFileFlags.h"
#include "OrvixFileList.h"
#include "OrvixProviderBase.h"
#include "OrvixVersion.h"

#include <cstdint>
#include <cwchar>

namespace
{

using OrvixProviderResult::Failure;
using OrvixProviderResult::Success;

constexpr const wchar_t* Name = L"Stubborn";

class StubbornProvider final : public OrvixProviderBase
{
public:
    const wchar_t* GetName() override { return Name; }
    bool IsInitialized() override { return false; }
    bool IsProjectOpen() override { return false; }
    int Initialize(OrvixClientInfo*) override { return Success; }
    int Uninitialize() override { return Success; }
    int OpenProject(const wchar_t*, const wchar_t*) override { return Success; }
    int CloseProject() override { return Success; }
    int Add(OrvixFileList*, const wchar_t*, unsigned long) override { return Success; }
    int ShowOptions() override { return Failure; }
    int RunProviderClient() override { return Failure; }

    /// No file is controlled. Each may be added, except one with "reserved" in its path. The query fails for a file
    /// with "riddle" in its path.
    int QueryStatus(OrvixFileList* list, unsigned long) override
    {
        for (unsigned int i = 0; i < list->NumActiveEntries(); ++i)
        {
            OrvixFileEntry* entry = list->GetActiveFileEntry(i);
            if (std::wcsstr(entry->GetFile(), L"riddle") != nullptr)
            {
                return Failure;
            }
            const bool reserved = std::wcsstr(entry->GetFile(), L"reserved") != nullptr;
            entry->SetFlagsOut(OrvixFileState::NotControlled | (reserved ? 0 : OrvixFilePermission::Add));
        }
        return Success;
    }
};

} // namespace

extern "C" {
__declspec(dllexport) std::int32_t GetOrvixVersion()
{
    return ORVIX_PLUGIN_CONTRACT_VERSION;
}

__declspec(dllexport) IOrvixProvider* GetIOrvixProvider()
{
    static StubbornProvider provider;
    return &provider;
}

__declspec(dllexport) void ReleaseIOrvixProvider(IOrvixProvider*)
{
}

__declspec(dllexport) const wchar_t* GetOrvixProviderName()
{
    return Name;
}
} // extern "C"
