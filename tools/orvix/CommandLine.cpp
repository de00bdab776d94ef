#include "CommandLine.h"

#include "OrvixVersion.h"
#include "ToolError.h"

#include <CLI/CLI.hpp>

#include <algorithm>
#include <iostream>

namespace
{
// CLI11 takes an argument that looks like "[a,b]" for a list, and loses sight of "--" once it has met a path. A mark
// in front of an argument prevents both.
constexpr char Mark = '\x01';

std::string Marked(const std::string& argument, bool optionsEnded)
{
    const bool needed = optionsEnded || argument.starts_with('[') || argument.starts_with(Mark);
    return needed ? Mark + argument : argument;
}

std::wstring Unmarked(std::string_view argument)
{
    return Wide(argument.starts_with(Mark) ? argument.substr(1) : argument);
}

std::vector<std::wstring> Unmarked(const std::vector<std::string>& arguments)
{
    std::vector<std::wstring> texts;
    for (const std::string& argument : arguments)
    {
        if (Unmarked(argument).empty())
        {
            throw ToolError(ExitCode::BadUsage, L"an empty path or pattern names nothing");
        }
        texts.push_back(Unmarked(argument));
    }
    return texts;
}

/// The arguments in the order in which CLI11 wants them, the last one first.
std::vector<std::string> Arguments(int count, wchar_t** arguments)
{
    std::vector<std::string> utf8;
    bool optionsEnded = false;
    for (int i = 1; i < count; ++i)
    {
        const std::wstring argument = arguments[i];
        if (!optionsEnded && argument == L"--")
        {
            optionsEnded = true;
            continue;
        }
        utf8.push_back(Marked(Utf8(argument), optionsEnded));
        if (Unmarked(utf8.back()) != argument)
        {
            throw ToolError(ExitCode::BadUsage, L"not valid Unicode: " + argument);
        }
    }
    std::reverse(utf8.begin(), utf8.end());
    return utf8;
}

struct Command
{
    const char* name;
    const char* description;
    bool takesComment;
    bool takesKeep;
};

constexpr Command Commands[] = {
    {"status", "Show the state of files", false, false},
    {"add", "Put files under control", true, true},
    {"checkout", "Take files for editing", true, false},
    {"checkin", "Store new versions of checked-out files", true, true},
    {"undo", "Give checked-out files back unchanged", false, false},
    {"get", "Bring the latest versions", false, false},
    {"history", "Show the versions of files", false, false},
};

constexpr const char* Footer = "Exit codes: 0 success, 1 something failed or was refused, 2 bad usage,\n"
                               "3 no such provider, project or folder.";

std::string Version()
{
    return "orvix " + std::to_string(ORVIX_VERSION_MAJOR) + "." + std::to_string(ORVIX_VERSION_MINOR) + "." +
           std::to_string(ORVIX_VERSION_PATCH);
}
} // namespace

std::optional<CommandLine> CommandLine::Parse(int count, wchar_t** arguments)
{
    std::string plugins, config, provider, project, user, comment;
    std::vector<std::string> paths, vetoes;
    CommandLine result;

    CLI::App app("Source control for files, through the providers of OrvixCore.", "orvix");
    app.footer(Footer);
    app.set_version_flag("--version", Version());
    app.allow_windows_style_options(false); // a path may start with a slash
    app.require_subcommand(1);
    app.fallthrough();
    app.add_option("--plugins", plugins, "Folder of provider plug-ins (default: plugins beside the program)");
    app.add_option("--config", config, "Configuration folder (default: %APPDATA%\\OrvixCore)");
    app.add_option("--provider", provider, "Provider by name or index (default: the first)");
    app.add_option("--project", project, "Project folder (default: the provider's fixed root, or the current folder)");
    app.add_option("--user", user, "User name (default: the Windows user)");
    app.add_option("--veto", vetoes, "Refuse an operation that would touch a file of this pattern; may repeat")
        ->expected(1)
        ->take_all()
        ->allow_extra_args(false);
    app.add_flag("--unattended", result.unattended, "Answer yes instead of showing a dialog");
    app.add_flag("--verbose", result.verbose, "Print notifications");

    app.add_subcommand("providers", "List the providers");
    for (const Command& command : Commands)
    {
        CLI::App* subcommand = app.add_subcommand(command.name, command.description);
        subcommand->add_option("PATH", paths, "Files, and folders with everything in them")->required();
        if (command.takesComment)
        {
            subcommand->add_option("-m", comment, "Comment");
        }
        if (command.takesKeep)
        {
            subcommand->add_flag("--keep", result.keep, "Keep the files checked out");
        }
    }

    try
    {
        app.parse(Arguments(count, arguments));
    }
    catch (const CLI::Success& request)
    {
        app.exit(request, std::cout, std::cout);
        return std::nullopt;
    }
    catch (const CLI::ParseError& error)
    {
        std::wstring message = Wide(error.what());
        std::erase(message, static_cast<wchar_t>(Mark));
        throw ToolError(ExitCode::BadUsage, message + L" (see --help)");
    }

    result.command = Wide(app.get_subcommands().front()->get_name());
    result.paths = Unmarked(paths);
    result.plugins = Unmarked(plugins);
    result.config = Unmarked(config);
    result.provider = Unmarked(provider);
    result.project = Unmarked(project);
    result.user = Unmarked(user);
    result.comment = Unmarked(comment);
    result.vetoes = Unmarked(vetoes);
    return result;
}
