#pragma once

#include <optional>
#include <string>
#include <vector>

/// What the user asked for; folders and files as typed. An option that was not given is empty.
struct CommandLine
{
    std::wstring command;
    std::vector<std::wstring> paths;
    std::wstring plugins;
    std::wstring config;
    std::wstring provider;
    std::wstring project;
    std::wstring user;
    std::wstring comment;
    std::vector<std::wstring> vetoes;
    bool keep = false;
    bool unattended = false;
    bool verbose = false;

    /// Reads the arguments of `wmain`. Nothing when help or the version was asked for, and printed. Throws
    /// `ToolError` with `ExitCode::BadUsage`.
    static std::optional<CommandLine> Parse(int count, wchar_t** arguments);
};
