#pragma once

#include "FileCollector.h"
#include "HostSession.h"
#include "OrvixProviderConfigManager.h"
#include "Output.h"
#include "ToolError.h"

/// `orvix filters`: shows which files the providers' filters exclude, and why. Throws `ToolError`.
ExitCode ShowFilters(const CommandLine& commandLine);

/// Asks the services object whether a filter excludes a file, and which one. The reason comes from the library's own
/// code, which reads the same file.
class FilterCommand
{
public:
    /// Reads OrvixProviders.xml. The arguments must outlive this object. Throws `ToolError` when the file exists but
    /// cannot be read.
    FilterCommand(HostSession& host, const CommandLine& commandLine, Output& output);

    /// Shows the results. `ExitCode::Failed` when a folder could not be read.
    ExitCode Run();

private:
    /// Indexes of the providers that the command concerns.
    std::vector<std::uint32_t> Providers();

    /// The row of a file and a provider. `excluded` becomes true when the provider excludes the file.
    std::vector<Listing::Cell> MakeRow(const std::wstring& path, std::uint32_t provider, bool& excluded);

    HostSession& m_host;
    const CommandLine& m_commandLine;
    Output& m_output;
    OrvixProviderConfigManager m_config;
};
