#pragma once

#include <chrono>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

/// What the user typed; an option that was not given is empty. Files and folders are full paths, so that a provider
/// that changes the current folder does not change what they name.
struct CommandLine
{
    std::wstring folder;  ///< the current folder
    std::wstring command; ///< its name; of prompts list and the like: prompts
    std::vector<std::wstring> paths;
    std::wstring provider; ///< name or index
    std::wstring project;
    std::wstring plugins;
    bool pluginsAreRelative = false; ///< the user typed a relative path for them
    std::wstring config;
    std::wstring user;
    std::uint32_t sources = 0; ///< bits of `OrvixProviderSource`
    std::vector<std::wstring> vetoes;
    bool providerTextIsResult = false; ///< what the provider prints is the result of the command
    bool unattended = false;
    std::optional<std::chrono::seconds> timeout; ///< 1 to 3600; empty for none
    bool watchesWindows = false;                 ///< names windows of providers also when somebody answers
    bool cancelsWindows = false;                 ///< presses Cancel in windows of providers
    bool noColor = false;
    bool verbose = false;
    bool json = false;

    // Of the commands that change files.
    std::wstring comment;
    bool keep = false;
    bool force = false; ///< get: also files with changes of the user

    // Of prompts.
    std::wstring prompt; ///< ID
    std::wstring answer;
    bool all = false;

    // Of register and unregister.
    std::wstring name;
    bool isolated = false;
    unsigned int patience = 300; ///< seconds, 1 to 86,400

    // Of validate.
    bool msscci = false;
    bool dialogs = false;
};
