// A host to start from: lists the providers of a plug-in folder, and with the name of one of them and a project's
// folder the state of each file in that folder.

#include "IOrvixClientAccess.h"
#include "IOrvixProvider.h"
#include "OrvixClientInfo.h"
#include "OrvixFileEntry.h"
#include "OrvixFileFlags.h"
#include "OrvixFileList.h"
#include "OrvixProviderResult.h"
#include "OrvixProviderSource.h"
#include "OrvixServicesPointer.h"

#include <windows.h>

#include <cstdio>
#include <filesystem>
#include <string>
#include <string_view>

namespace
{

void Print(std::wstring_view text)
{
    const int length = static_cast<int>(text.size());
    std::string bytes(3 * text.size(), '\0'); // at most three bytes of UTF-8 for each unit of UTF-16
    bytes.resize(static_cast<std::size_t>(WideCharToMultiByte(CP_UTF8, 0, text.data(), length, bytes.data(),
                                                              static_cast<int>(bytes.size()), nullptr, nullptr)));
    std::puts(bytes.c_str());
}

/// What the library asks of this host. A host with windows shows the text in its own window and gives its own colours.
class MyClientAccess final : public IOrvixClientAccess
{
public:
    void OutputText(const wchar_t* text, int) override { Print(text); }
    std::uint32_t GetColor(std::int32_t index) override { return GetSysColor(index); }
    bool IsUnattended() override { return true; }
    std::intptr_t RelayA(void*, void*, void*, void*) override { return 0; }
    std::intptr_t RelayB(void*, void*, void*, void*) override { return 0; }
};

/// The provider with this name, in any letter case; null when there is none.
IOrvixProvider* FindProvider(IOrvixServices& services, std::wstring_view name)
{
    for (std::uint32_t i = 0; i < services.GetProviderCount(); ++i)
    {
        const std::wstring_view found = services.GetProviderName(i);
        if (CompareStringOrdinal(found.data(), static_cast<int>(found.size()), name.data(),
                                 static_cast<int>(name.size()), TRUE) == CSTR_EQUAL)
        {
            return services.GetProvider(i);
        }
    }
    return nullptr;
}

/// Prints the state of every file in the folder; false when the provider does not know it.
bool PrintStates(IOrvixProvider& provider, const std::filesystem::path& folder)
{
    OrvixFileList files;
    for (const auto& item : std::filesystem::directory_iterator(folder))
    {
        if (item.is_regular_file())
        {
            files.AddActiveEntry(files.CreateEntry(item.path().c_str(), nullptr, 0, 0));
        }
    }
    if (files.NumActiveEntries() == 0)
    {
        return true;
    }
    if (provider.QueryStatus(&files, 0) != OrvixProviderResult::Success)
    {
        return false;
    }
    for (unsigned int i = 0; i < files.NumActiveEntries(); ++i)
    {
        OrvixFileEntry* entry = files.GetActiveFileEntry(i);
        const unsigned long state = entry->GetFlagsOut();
        const std::wstring word = (state & OrvixFileState::CheckedOut) != 0   ? L"checked out"
                                  : (state & OrvixFileState::Controlled) != 0 ? L"controlled"
                                                                              : L"not controlled";
        Print(word + L": " + entry->GetFile());
    }
    return true;
}

/// The life of a provider: initialize, open a project, work, close the project, uninitialize.
bool ShowProject(IOrvixProvider& provider, OrvixClientInfo& info, const std::filesystem::path& folder)
{
    if (provider.Initialize(&info) != OrvixProviderResult::Success)
    {
        return false;
    }
    bool shown = false;
    if (provider.OpenProject(folder.c_str(), L"") == OrvixProviderResult::Success)
    {
        shown = PrintStates(provider, folder);
        provider.CloseProject();
    }
    provider.Uninitialize();
    return shown;
}

} // namespace

int wmain(int count, wchar_t** arguments)
{
    SetConsoleOutputCP(CP_UTF8);
    if (count != 2 && count != 4)
    {
        Print(L"myhost PLUGIN-FOLDER [PROVIDER PROJECT-FOLDER]");
        return 2;
    }

    MyClientAccess access;
    OrvixClientInfo info;
    info.SetClientName(L"My host");
    info.SetConfigFilePath(std::filesystem::current_path().c_str());
    info.SetProviderPluginPath((std::filesystem::absolute(arguments[1]) / "").c_str()); // ends in a backslash
    info.SetIOrvixClientAccess(&access);

    const OrvixServicesPointer services = MakeOrvixServices();
    if (!services || !services->Initialize(&info, OrvixProviderSource::Plugins))
    {
        Print(L"no provider");
        return 1;
    }
    if (count == 2)
    {
        for (std::uint32_t i = 0; i < services->GetProviderCount(); ++i)
        {
            Print(services->GetProviderName(i));
        }
        return 0;
    }
    IOrvixProvider* provider = FindProvider(*services, arguments[2]);
    const std::filesystem::path folder = std::filesystem::absolute(arguments[3]).make_preferred(); // with backslashes
    if (provider == nullptr || !ShowProject(*provider, info, folder))
    {
        Print(L"the provider cannot show the project");
        return 1;
    }
    return 0;
}
