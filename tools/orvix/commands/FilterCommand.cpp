#include "FilterCommand.h"

#include "CommandOutput.h"
#include "FilePath.h"
#include "OrvixProviderConfig.h"

#include <numeric>

ExitCode ShowFilters(const CommandLine& commandLine)
{
    return WithOutput(commandLine, [&](CommandOutput& output) {
        HostSession host(commandLine, output.Results());
        return FilterCommand(host, commandLine, output.Results()).Run();
    });
}

FilterCommand::FilterCommand(HostSession& host, const CommandLine& commandLine, Output& output)
    : m_host(host), m_commandLine(commandLine), m_output(output)
{
    const std::wstring path = HostSession::ConfigFolder(commandLine) + L'\\' + OrvixProviderConfigManager::FileName;
    if (!m_config.LoadConfig(path.c_str()) && PathExists(path))
    {
        throw ToolError(ExitCode::Failed,
                        L"no filter applies, since the file cannot be read (see orvix doctor): " + path);
    }
}

ExitCode FilterCommand::Run()
{
    const std::vector<std::uint32_t> providers = Providers();
    FileCollector collector(m_output);
    for (const std::wstring& path : m_commandLine.paths)
    {
        collector.Add(path);
    }

    Listing listing{.key = "files",
                    .columns = {{"excluded", "Excluded"},
                                {"provider", "Provider"},
                                {"filter", "Filter"},
                                {"by", "By"},
                                {"file", "File"}},
                    .rows = {},
                    .summary = {}};
    unsigned int numExcluded = 0;
    for (const FileCollector::File& file : collector.Files())
    {
        bool excluded = false;
        for (const std::uint32_t provider : providers)
        {
            listing.rows.push_back(MakeRow(file.path, provider, excluded));
        }
        numExcluded += excluded ? 1 : 0;
    }
    const auto total = static_cast<unsigned int>(collector.Files().size());
    listing.summary = {{"files", total == 1 ? "file" : "files", total},
                       {"excluded", "excluded", numExcluded},
                       FileCollector::CountOfSkipped(collector.SkippedFolders().size())};
    m_output.Show(listing);
    return collector.ReportUnreadableFolders() ? ExitCode::Failed : ExitCode::Success;
}

std::vector<std::uint32_t> FilterCommand::Providers()
{
    const std::uint32_t first = m_host.FindProvider(m_commandLine.provider);
    std::vector<std::uint32_t> providers(m_commandLine.provider.empty() ? m_host.Services().GetProviderCount() : 1);
    std::iota(providers.begin(), providers.end(), first);
    return providers;
}

std::vector<Listing::Cell> FilterCommand::MakeRow(const std::wstring& path, std::uint32_t provider, bool& excluded)
{
    const std::wstring name = m_host.Services().GetProviderName(provider);
    std::wstring filter;
    if (!m_host.Services().IsFileExcludedByProvider(provider, path.c_str(), &filter))
    {
        return {{false, Listing::Tone::Good}, {name}, {}, {}, {path}};
    }
    excluded = true;
    const OrvixProviderConfig* config = m_config.FindConfig(name.c_str());
    const Exclusion reason = config != nullptr ? config->FindExclusion(path.c_str()).reason : Exclusion::None;
    Listing::Cell by; // empty when somebody changed the file after the services object read it
    if (reason != Exclusion::None)
    {
        by.value = reason == Exclusion::ByFolder ? L"folder" : L"type";
    }
    return {{true, Listing::Tone::Bad}, {name}, {filter}, by, {path}};
}
