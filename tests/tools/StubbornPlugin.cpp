// A provider that answers success to everything and changes nothing: what a host must not believe.

#include "FakeProvider.h"
#include "OrvixFileEntry.h"
#include "OrvixFileList.h"
#include "OrvixVersion.h"

#include <cstdint>
#include <cwchar>

namespace
{

class StubbornProvider final : public FakeProvider
{
public:
    StubbornProvider() : FakeProvider(L"Stubborn") {}

    int Initialize(OrvixClientInfo*) override { return 0; }
    int OpenProject(const wchar_t*, const wchar_t*) override { return 0; }
    int Add(OrvixFileList*, const wchar_t*, unsigned long) override { return 0; }

    /// Every file may be added; the state of one that is called "riddle" is not told.
    int QueryStatus(OrvixFileList* list, unsigned long) override
    {
        for (unsigned int i = 0; i < list->NumActiveEntries(); ++i)
        {
            OrvixFileEntry* entry = list->GetActiveFileEntry(i);
            if (std::wcsstr(entry->GetFile(), L"riddle") != nullptr)
            {
                return -1;
            }
            entry->SetFlagsOut(0x1 | 0x100000);
        }
        return 0;
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
    return L"Stubborn";
}
} // extern "C"
