#include "IsolationFindings.h"

#include "IsolatedLibrary.h"

#include <filesystem>
#include <system_error>

void IsolationFindings::Add(DoctorReport::Subject& subject, const std::wstring& path, const std::wstring& searchPath)
{
    const std::filesystem::path folder = std::filesystem::path(path).parent_path();
    std::error_code ignored;
    if (!std::filesystem::exists(folder / IsolationSettings::FileName, ignored))
    {
        return;
    }
    const IsolationSettings settings = IsolationSettings::Read(folder);
    subject.AddNote("isolated", L"it is isolated: " + settings.library.wstring() + L" (" +
                                    std::to_wstring(settings.bits) + L"-bit) runs in a process of its own");
    const auto library = std::make_shared<IsolatedLibrary>(settings, searchPath);
    if (library->Call(SccCalls::GetVersion) <= SCC_OK)
    {
        subject.AddProblem("isolated-library-fails",
                           library->LastReport().empty()
                               ? settings.library.wstring() + L" has no SccGetVersion that works"
                               : library->LastReport());
    }
}
