#include "ProviderCommand.h"

#include "FilePath.h"
#include "OrvixFileList.h"
#include "ToolError.h"

#include <algorithm>
#include <iostream>
#include <iterator>
#include <new>

namespace
{

constexpr const wchar_t* Commands[] = {L"open", L"options", L"client", L"properties"};

// Results of a provider.
constexpr int Success = 0;
constexpr int Failure = -1;
constexpr int NotOffered = -2;

constexpr unsigned long Selected = 0x2; // bit of an entry's FlagsIn

} // namespace

bool ProviderCommand::IsOne(const std::wstring& command)
{
    return std::find(std::begin(Commands), std::end(Commands), command) != std::end(Commands);
}

void ProviderCommand::Run()
{
    const std::wstring& command = m_commandLine.command;
    IOrvixProvider& provider = m_project.Provider();
    const int result = command == L"open"      ? ShowOpened()
                       : command == L"options" ? provider.ShowOptions()
                       : command == L"client"  ? provider.RunProviderClient()
                                               : ShowProperties();
    if (result == NotOffered)
    {
        throw ToolError(ExitCode::Failed, command + L" is not offered by the provider " + m_project.ProviderName());
    }
    if (result < Success)
    {
        throw ToolError(ExitCode::Failed, command + L" failed in the provider " + m_project.ProviderName());
    }
}

int ProviderCommand::ShowOpened()
{
    if (!m_project.Provider().IsProjectOpen())
    {
        return Failure;
    }
    std::cout << "opened " << Printable(m_project.Folder()) << " with " << Printable(m_project.ProviderName()) << '\n';
    return Success;
}

int ProviderCommand::ShowProperties()
{
    const std::wstring path = FullPath(m_commandLine.paths.front());
    if (IsFolder(path))
    {
        throw ToolError(ExitCode::Failed, L"a folder has no properties: " + path);
    }
    std::wstring filter;
    if (m_project.Services().IsFileExcludedByProvider(m_project.ProviderIndex(), path.c_str(), &filter))
    {
        throw ToolError(ExitCode::Failed, L"excluded by filter " + filter + L": " + path);
    }
    OrvixFileList list;
    if (list.CreateEntry(path.c_str(), nullptr, Selected, 0) == nullptr)
    {
        throw std::bad_alloc();
    }
    list.BuildActiveList(Selected, false);
    return m_project.Provider().ShowProperties(&list);
}
