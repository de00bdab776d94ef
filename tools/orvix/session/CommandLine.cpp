#include "CommandLine.h"

#include "OrvixProviderSource.h"
#include "OrvixVersion.h"
#include "ToolError.h"

#include <CLI/CLI.hpp>

#include <algorithm>
#include <iostream>
#include <iterator>

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
    const char* examples;
    bool takesComment;
    bool takesKeep;
};

constexpr Command Commands[] = {
    {"status", "Show the state of files",
     "  orvix status .\n"
     "  orvix status src\\a.txt --json",
     false, false},
    {"add", "Put files under control",
     "  orvix add src -m \"first version\"\n"
     "  orvix add new.txt --keep --unattended",
     true, true},
    {"checkout", "Take files for editing",
     "  orvix checkout src\\a.txt -m \"to mend the title\"\n"
     "  orvix checkout src --unattended --json",
     true, false},
    {"checkin", "Store new versions of checked-out files",
     "  orvix checkin . -m \"title mended\"\n"
     "  orvix checkin . --unattended -m nightly --veto *.key",
     true, true},
    {"undo", "Give checked-out files back unchanged", "  orvix undo src\\a.txt", false, false},
    {"get", "Bring the latest versions", "  orvix get . --unattended", false, false},
    {"history", "Show the versions of files",
     "  orvix history src\\a.txt\n"
     "  orvix history src --json",
     false, false},
};

/// Adds a command; its help ends with the examples.
CLI::App* AddCommand(CLI::App& parent, const char* name, const char* description, const std::string& examples)
{
    CLI::App* command = parent.add_subcommand(name, description);
    command->footer("Examples:\n" + examples + "\n\nOptions of every command, and exit codes: orvix --help");
    return command;
}

void AddJson(CLI::App* command, CommandLine& result)
{
    command->add_flag("--json", result.json, "Print the result as JSON");
}

void AddPrompts(CLI::App& app, CommandLine& result, std::string& id, std::string& answer)
{
    CLI::App* prompts = AddCommand(app, "prompts", "Show and change the stored answers",
                                   "  orvix prompts list\n"
                                   "  orvix prompts set 1330796546 yes\n"
                                   "  orvix prompts reset --all\n"
                                   "  orvix prompts lock 1330796546");
    prompts->require_subcommand(1);
    const auto add = [&](const char* name, const char* description, const char* examples) {
        CLI::App* command = AddCommand(*prompts, name, description, examples);
        AddJson(command, result);
        return command;
    };
    constexpr const char* IdHelp = "ID of the prompt; every row that has it is meant";

    add("list", "List the prompts", "  orvix prompts list\n  orvix prompts list --json --config D:\\Config");
    CLI::App* set = add("set", "Store an answer", "  orvix prompts set 1330796546 yes\n  orvix prompts set 7 ask");
    set->add_option("ID", id, IdHelp)->required();
    set->add_option("ANSWER", answer, "ask, yes, no, yes-to-all or no-to-all")->required();
    CLI::App* reset = add("reset", "Have a prompt ask again", "  orvix prompts reset 7\n  orvix prompts reset --all");
    CLI::Option_group* which = reset->add_option_group("Which");
    which->add_option("ID", id, IdHelp);
    which->add_flag("--all", result.all, "Every prompt that is not locked");
    which->require_option(1);
    add("lock", "Lock the answer of a prompt", "  orvix prompts lock 7")->add_option("ID", id, IdHelp)->required();
    add("unlock", "Unlock it", "  orvix prompts unlock 7")->add_option("ID", id, IdHelp)->required();
}

constexpr struct
{
    const char* text;
    std::uint32_t bits;
} SourceLists[] = {
    {"plugins", OrvixProviderSource::Plugins},
    {"msscci", OrvixProviderSource::InstalledMSSCCI},
    {"plugins,msscci", OrvixProviderSource::Plugins | OrvixProviderSource::InstalledMSSCCI},
    {"msscci,plugins", OrvixProviderSource::Plugins | OrvixProviderSource::InstalledMSSCCI},
};

std::uint32_t Sources(const std::string& text)
{
    const auto* found = std::find_if(std::begin(SourceLists), std::end(SourceLists),
                                     [&](const auto& list) { return text == list.text; });
    if (found == std::end(SourceLists))
    {
        throw ToolError(ExitCode::BadUsage, L"--sources takes plugins, msscci or both with a comma between, not " +
                                                (text.empty() ? L"an empty text" : Unmarked(text)));
    }
    return found->bits;
}

constexpr const char* Footer = "Examples:\n"
                               "  orvix providers\n"
                               "  orvix checkin . -m \"title mended\"\n"
                               "  orvix checkin --help\n"
                               "\n"
                               "Exit codes: 0 success, 1 something failed, was refused or is wrong, 2 bad usage,\n"
                               "3 no such provider, project, folder, library or prompt.";

std::string Version()
{
    return "orvix " + std::to_string(ORVIX_VERSION_MAJOR) + "." + std::to_string(ORVIX_VERSION_MINOR) + "." +
           std::to_string(ORVIX_VERSION_PATCH);
}

} // namespace

std::optional<CommandLine> CommandLine::Parse(int count, wchar_t** arguments)
{
    std::string sources = "plugins", plugins, config, provider, project, user, comment, name, prompt, answer;
    std::vector<std::string> paths, vetoes;
    CommandLine result;

    CLI::App app("Source control for files, through the providers of OrvixCore.", "orvix");
    app.footer(Footer);
    app.set_version_flag("--version", Version());
    app.allow_windows_style_options(false); // a path may start with a slash
    app.require_subcommand(1);
    app.fallthrough();
    app.add_option("--sources", sources,
                   "Where providers come from: plugins, msscci or both (default: plugins; doctor: both)");
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
    app.add_flag("--no-color", result.noColor, "No colours on a terminal; the same as the variable NO_COLOR");
    app.add_flag("--verbose", result.verbose, "Print notifications; doctor: name each library before it is loaded");

    AddJson(AddCommand(app, "providers", "List the providers",
                       "  orvix providers\n"
                       "  orvix providers --sources plugins,msscci --json"),
            result);
    AddJson(AddCommand(app, "doctor", "Say of every possible provider whether it is listed and why, and what is wrong",
                       "  orvix doctor\n"
                       "  orvix doctor --sources msscci --json"),
            result);
    for (const Command& command : Commands)
    {
        CLI::App* subcommand = AddCommand(app, command.name, command.description, command.examples);
        subcommand->add_option("PATH", paths, "Files, and folders with everything in them")->required();
        AddJson(subcommand, result);
        if (command.takesComment)
        {
            subcommand->add_option("-m", comment, "Comment");
        }
        if (command.takesKeep)
        {
            subcommand->add_flag("--keep", result.keep, "Keep the files checked out");
        }
    }
    CLI::App* filters = AddCommand(app, "filters", "Show which files the filters of providers exclude, and why",
                                   "  orvix filters src\n"
                                   "  orvix filters a.tmp --provider Archive --json");
    filters->add_option("PATH", paths, "Files, and folders with everything in them")->required();
    AddJson(filters, result);
    AddPrompts(app, result, prompt, answer);

    AddCommand(app, "open", "Open the project and close it again", "  orvix open --project D:\\Projects\\Song");
    AddCommand(app, "options", "Show the provider's own options", "  orvix options --provider Archive");
    AddCommand(app, "client", "Start the provider's own program", "  orvix client --sources msscci");
    AddCommand(app, "properties", "Show the properties of a file", "  orvix properties src\\a.txt")
        ->add_option("PATH", paths, "The file")
        ->required()
        ->expected(1)
        ->allow_extra_args(false);
    CLI::App* registering = AddCommand(app, "register", "Register an MSSCCI library on this machine",
                                       "  orvix register archive_msscci.dll \"Archive MSSCCI\"");
    registering->add_option("PATH", paths, "The library, a 64-bit DLL")
        ->required()
        ->expected(1)
        ->allow_extra_args(false);
    registering->add_option("NAME", name, "Its name as a provider")->required();
    AddCommand(app, "unregister", "Undo register", "  orvix unregister \"Archive MSSCCI\"")
        ->add_option("NAME", name, "Its name as a provider")
        ->required();
    CLI::App* validating = AddCommand(app, "validate", "Check a provider plug-in or an MSSCCI library",
                                      "  orvix validate plugins\\depot.dll\n"
                                      "  orvix validate depot_msscci.dll --msscci --json");
    validating->add_option("PATH", paths, "The plug-in or library")->required()->expected(1)->allow_extra_args(false);
    validating->add_flag("--msscci", result.msscci, "It is an MSSCCI library");
    validating->add_flag("--dialogs", result.dialogs, "Check also what may show windows");
    validating->add_option("--timeout", result.timeout, "Seconds that a rule may take (default: 30)")
        ->check(CLI::Range(1, 3600));
    AddJson(validating, result);

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

    const CLI::App* command = app.get_subcommands().front();
    result.command = Wide(command->get_name());
    result.action = command->get_subcommands().empty() ? L"" : Wide(command->get_subcommands().front()->get_name());
    result.prompt = Unmarked(prompt);
    result.answer = Unmarked(answer);
    result.paths = Unmarked(paths);
    result.name = Unmarked(name);
    const bool looksEverywhere = result.command == L"doctor" && app.count("--sources") == 0;
    result.sources =
        looksEverywhere ? OrvixProviderSource::Plugins | OrvixProviderSource::InstalledMSSCCI : Sources(sources);
    result.plugins = Unmarked(plugins);
    result.config = Unmarked(config);
    result.provider = Unmarked(provider);
    result.project = Unmarked(project);
    result.user = Unmarked(user);
    result.comment = Unmarked(comment);
    result.vetoes = Unmarked(vetoes);
    return result;
}
