#pragma once

#include "FileCollector.h"
#include "HostSession.h"
#include "OrvixProviderConfigManager.h"
#include "Output.h"
#include "ToolError.h"

/// `orvix filters`: which files the providers' filters exclude, and why. The services object says whether and by which
/// filter; the reason comes from the library's own code.
class FilterCommand
{
public:
    /// Reads OrvixProviders.xml. Throws `ToolError` when the file is there but cannot be read. The arguments must
    /// outlive this object.
    FilterCommand(HostSession& host, const CommandLine& commandLine, Output& output);

    /// Shows the verdicts. `ExitCode::Failed` when a folder could not be read.
    ExitCode Run();

private:
    std::vector<std::uint32_t> Providers();

    /// The row of a file and a provider; `excluded` becomes true when the provider excludes the file.
    std::vector<Listing::Cell> Verdict(const std::wstring& path, std::uint32_t provider, bool& excluded);

    HostSession& m_host;
    const CommandLine& m_commandLine;
    Output& m_output;
    OrvixProviderConfigManager m_config;
};
