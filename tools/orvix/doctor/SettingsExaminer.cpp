#include "SettingsExaminer.h"

#include "DeadSettings.h"
#include "XmlFileFindings.h"

DoctorReport::Subject SettingsExaminer::Examine(const std::wstring& path)
{
    DoctorReport::Subject file{.kind = "settings file", .location = path, .findings = {}};
    m_path = path;
    m_configs.LoadConfig(path.c_str(), &m_diagnostics);
    XmlFileFindings::AddContent(file, m_diagnostics, OrvixProviderConfigManager::RootName);
    if (m_diagnostics.hasRoot)
    {
        m_outline = XmlElement::Read(path);
    }
    XmlFileFindings::AddDiagnostics(file, m_diagnostics, L"provider element", m_outline ? &*m_outline : nullptr);
    if (m_outline)
    {
        DeadSettings::AddProviders(file, *m_outline);
    }
    return file;
}

std::wstring SettingsExaminer::WhyUnread(const std::wstring& path)
{
    return XmlFileFindings::WhyUnread(SettingsExaminer().Examine(path));
}

void SettingsExaminer::Explain(DoctorReport::Candidate& candidate, const OrvixProviderConfig* config, bool switchedOff)
{
    if (config == nullptr)
    {
        return;
    }
    m_used.insert(config);
    const std::wstring ofFile = std::wstring(L" of ") + OrvixProviderConfigManager::FileName;
    if (switchedOff)
    {
        candidate.AddNote("switched-off", ElementOf(config) + ofFile + L" switches it off");
    }
    else
    {
        candidate.AddNote("configured",
                          ElementOf(config) + ofFile + L" applies: its Name occurs in the provider's name");
    }
    for (const OrvixProviderConfig* other : m_configs.FindAllConfigs(candidate.name.value_or(L"").c_str()))
    {
        if (other != config)
        {
            m_hiddenBy.emplace(other, config);
            candidate.AddNote("hidden",
                              ElementOf(other) + ofFile + L" would also apply, but only the first one is used");
        }
    }
}

void SettingsExaminer::FindUnused(DoctorReport::Subject& file) const
{
    for (const FileDiagnostics::Provider& provider : m_diagnostics.providers)
    {
        if (m_used.contains(provider.config))
        {
            continue;
        }
        const auto addPlace = [&] {
            if (m_outline && provider.item <= m_outline->children.size())
            {
                file.findings.back().line = m_outline->children[provider.item - 1].line;
                file.findings.back().column = m_outline->children[provider.item - 1].column;
            }
        };
        const std::wstring hasNoEffect = ElementOf(provider.config) + L" has no effect: ";
        const auto hidden = m_hiddenBy.find(provider.config);
        if (hidden != m_hiddenBy.end())
        {
            file.AddProblem("always-hidden", hasNoEffect +
                                                 L"wherever it would apply, an earlier one applies, such as " +
                                                 ElementOf(hidden->second));
        }
        else
        {
            file.AddProblem("matches-nothing", hasNoEffect + L"its Name occurs in the name of no provider");
        }
        addPlace();
    }
}

std::wstring SettingsExaminer::ElementOf(const OrvixProviderConfig* config) const
{
    for (const FileDiagnostics::Provider& provider : m_diagnostics.providers)
    {
        if (provider.config == config)
        {
            return L"provider element " + std::to_wstring(provider.item) + L" (\"" + provider.name + L"\")";
        }
    }
    return L"";
}
