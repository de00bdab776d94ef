#include "Library.h"

#include "Failure.h"
#include "FileCommand.h"
#include "OrvixPrompt.h"
#include "OrvixProviderSource.h"
#include "Settings.h"

Library::Library(const Arguments& arguments, IOrvixClientAccess& access, HWND window) : m_services(MakeOrvixServices())
{
    if (!m_services)
    {
        throw Failure{L"There is not enough memory."};
    }
    m_client.SetClientName(L"Desk");
    m_client.SetParentWindow(window);
    m_client.SetConfigFilePath(arguments.config.c_str());
    m_client.SetProviderPluginPath(arguments.plugins.c_str());
    m_client.SetIOrvixClientAccess(&access);
    m_services->Initialize(&m_client, OrvixProviderSource::Plugins | OrvixProviderSource::InstalledMSSCCI);
    RegisterPrompts();
}

std::optional<std::uint32_t> Library::FindProvider(const std::wstring& name) const
{
    for (std::uint32_t index = 0; index < m_services->GetProviderCount(); ++index)
    {
        if (CompareStringOrdinal(m_services->GetProviderName(index), -1, name.c_str(), -1, TRUE) == CSTR_EQUAL)
        {
            return index;
        }
    }
    return std::nullopt;
}

std::uint32_t Library::ChooseProvider(const std::wstring& name) const
{
    if (!name.empty())
    {
        const auto named = FindProvider(name);
        return named ? *named : throw Failure{L"There is no provider " + name + L"."};
    }
    const auto last = FindProvider(Settings::Provider());
    if (last && Settings::IsProviderUsed(Settings::Provider()))
    {
        return *last;
    }
    for (std::uint32_t index = 0; index < m_services->GetProviderCount(); ++index)
    {
        if (Settings::IsProviderUsed(m_services->GetProviderName(index)))
        {
            return index;
        }
    }
    throw Failure{L"There is no provider. Tools, Options lists those that can be used."};
}

void Library::RegisterPrompts() const
{
    for (const FileCommand& command : FileCommands())
    {
        const std::wstring name = command.name;
        m_services->RegisterPrompt(static_cast<std::uint32_t>(command.dialogPrompt),
                                   (name + L": confirm the files").c_str(), command.dialogAction, 0, false);
        if (command.optionPrompt != OrvixPromptID::Unset)
        {
            const std::wstring question =
                name + L": " + command.optionMeaning + L"? (Yes to all: do it. Any other answer: do not.)";
            m_services->RegisterPrompt(static_cast<std::uint32_t>(command.optionPrompt), question.c_str(),
                                       OrvixPromptAction::OptionCleared,
                                       OrvixPromptOption::OfferYesToAll | OrvixPromptOption::OfferNoToAll, false);
        }
    }
    m_services->RegisterPrompt(ExitPrompt, L"End the program while files are checked out",
                               OrvixPromptAction::Ask | OrvixPromptAction::Yes, OrvixPromptOption::OfferStopAsking,
                               false);
}
