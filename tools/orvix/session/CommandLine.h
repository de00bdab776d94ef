#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

/// What the user asked for; folders and files as typed. An option that was not given is empty.
struct CommandLine
{
    std::wstring command;
    std::wstring action; ///< of prompts: list, set, reset, lock or unlock
    std::wstring prompt; ///< ID
    std::wstring answer; ///< to the prompt
    std::vector<std::wstring> paths;
    std::wstring name;         ///< of a registration
    std::uint32_t sources = 0; ///< bits of `OrvixProviderSource`
    std::wstring plugins;
    std::wstring config;
    std::wstring provider;
    std::wstring project;
    std::wstring user;
    std::wstring comment;
    std::vector<std::wstring> vetoes;
    bool all = false;
    bool json = false;
    bool noColor = false;
    bool keep = false;
    bool unattended = false;
    bool verbose = false;

    // Of validate.
    bool msscci = false;
    bool dialogs = false;
    unsigned int timeout = 30; ///< seconds

    /// Reads the arguments of `wmain`. Nothing when help or the version was asked for, and printed. Throws
    /// `ToolError` with `ExitCode::BadUsage`.
    static std::optional<CommandLine> Parse(int count, wchar_t** arguments);
};
