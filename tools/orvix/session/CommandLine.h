#pragma once

#include <cstdint>
#include <string>
#include <vector>

/// What the user typed. Folders and files are as typed; an option that was not given is empty.
struct CommandLine
{
    std::wstring command; ///< its name; of prompts list and the like: prompts
    std::vector<std::wstring> paths;
    std::wstring provider; ///< name or index
    std::wstring project;
    std::wstring plugins;
    std::wstring config;
    std::wstring user;
    std::uint32_t sources = 0; ///< bits of `OrvixProviderSource`
    std::vector<std::wstring> vetoes;
    bool unattended = false;
    bool noColor = false;
    bool verbose = false;
    bool json = false;

    // Of the commands that change files.
    std::wstring comment;
    bool keep = false;

    // Of prompts.
    std::wstring prompt; ///< ID
    std::wstring answer;
    bool all = false;

    // Of register and unregister.
    std::wstring name;

    // Of validate.
    bool msscci = false;
    bool dialogs = false;
    unsigned int timeout = 30; ///< seconds, 1 to 3600
};
