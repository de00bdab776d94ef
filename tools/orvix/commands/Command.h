#pragma once

#include "CommandLine.h"
#include "OrvixProviderSource.h"
#include "ToolError.h"

#include <cstdint>
#include <span>

/// What a command takes besides the options of every command: bits of `Command::takes`.
namespace Argument
{

inline constexpr unsigned int Paths = 0x1;         ///< PATH, once or more
inline constexpr unsigned int Path = 0x2;          ///< PATH, exactly once
inline constexpr unsigned int Name = 0x4;          ///< NAME of a registration
inline constexpr unsigned int Validation = 0x8;    ///< --msscci and --dialogs
inline constexpr unsigned int Json = 0x10;         ///< --json
inline constexpr unsigned int Comment = 0x20;      ///< -m
inline constexpr unsigned int Keep = 0x40;         ///< --keep
inline constexpr unsigned int Prompt = 0x80;       ///< ID of a prompt
inline constexpr unsigned int Answer = 0x100;      ///< ANSWER to a prompt
inline constexpr unsigned int PromptOrAll = 0x200; ///< ID of a prompt, or --all
inline constexpr unsigned int Force = 0x400;       ///< --force
inline constexpr unsigned int Isolation = 0x800;   ///< --isolated and --patience

} // namespace Argument

/// One command of the tool.
struct Command
{
    const char* group = nullptr; ///< the command that it belongs to, such as prompts; null for none
    const char* name = nullptr;
    const char* description = nullptr;
    const char* examples = nullptr; ///< lines of the command's help
    unsigned int takes = 0;         ///< bits of `Argument`
    const char* pathHelp = nullptr; ///< what PATH is, where the command takes one
    std::uint32_t defaultSources = OrvixProviderSource::Plugins;
    bool providerTextIsResult = false; ///< what the provider prints is the result
    int timeout = 0;                   ///< default of --timeout in seconds; 0: only when unattended
    bool usesProviders = false;        ///< runs in a child process, since it loads code of others

    /// Runs the command. Null for a command that is a group. Throws `ToolError`.
    ExitCode (*run)(const CommandLine& commandLine) = nullptr;
};

/// Every command, in the order of the help. A group comes before its commands.
std::span<const Command> AllCommands();
