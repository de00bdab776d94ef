#include "CommandLineParser.h"

#include "FilePath.h"
#include "OrvixVersion.h"

#include <CLI/CLI.hpp>

#include <algorithm>
#include <iostream>
#include <iterator>
#include <map>
#include <numeric>
#include <utility>

namespace
{

// CLI11 takes an argument that looks like "[a,b]" for a list, and ignores "--" after it has met a path. A mark before
// an argument prevents both.
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

/// The arguments in the order that CLI11 expects, the last one first.
std::vector<std::string> ReversedArguments(int count, wchar_t** arguments)
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

std::wstring FullPathOrEmpty(const std::wstring& path)
{
    return path.empty() ? path : FullPath(path);
}

std::vector<std::wstring> FullPaths(std::vector<std::wstring> paths)
{
    std::transform(paths.begin(), paths.end(), paths.begin(), FullPath);
    return paths;
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

std::uint32_t ParseSources(const std::string& text)
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

/// How many letters must be added, removed or replaced to make one word of the other.
std::size_t Distance(std::string_view from, std::string_view to)
{
    std::vector<std::size_t> row(to.size() + 1);
    std::iota(row.begin(), row.end(), std::size_t{0});
    for (std::size_t i = 0; i < from.size(); ++i)
    {
        std::size_t diagonal = std::exchange(row[0], i + 1);
        for (std::size_t j = 0; j < to.size(); ++j)
        {
            const std::size_t replaced = diagonal + (from[i] == to[j] ? 0 : 1);
            diagonal = row[j + 1];
            row[j + 1] = std::min({replaced, diagonal + 1, row[j] + 1});
        }
    }
    return row.back();
}

/// The command whose name is most like a word.
const char* NearestCommand(const std::string& word)
{
    const auto commands = AllCommands();
    const auto nearest = std::min_element(commands.begin(), commands.end(), [&](const auto& left, const auto& right) {
        const auto distance = [&](const Command& command) {
            return command.group != nullptr ? std::string::npos : Distance(word, command.name);
        };
        return distance(left) < distance(right);
    });
    return nearest->name;
}

constexpr const char* Footer =
    "Examples:\n"
    "  orvix providers\n"
    "  orvix checkin . -m \"title fixed\"\n"
    "  orvix checkin --help\n"
    "\n"
    "Exit codes: 0 success, 1 something failed, was refused or is wrong, 2 bad usage,\n"
    "3 no such provider, project, folder, library or prompt, 4 OrvixProviders.xml cannot be\n"
    "read, 5 a provider ended the process, 6 a provider gave no sign of life.";

std::string Version()
{
    return "orvix " + std::to_string(ORVIX_VERSION_MAJOR) + "." + std::to_string(ORVIX_VERSION_MINOR) + "." +
           std::to_string(ORVIX_VERSION_PATCH);
}

class Parser
{
public:
    Parser();

    std::optional<Invocation> Parse(int count, wchar_t** arguments);

private:
    /// Texts as CLI11 stores them: UTF-8, some with a mark.
    struct Texts
    {
        std::string sources, plugins, config, provider, project, user, comment, name, prompt, answer, onWindow;
        std::vector<std::string> paths, vetoes;
    };

    void AddSharedOptions();
    void AddCommand(const Command& command);
    void AddArguments(CLI::App& app, const Command& command);
    void AddPathArguments(CLI::App& app, const Command& command);
    void AddPromptArguments(CLI::App& app, const Command& command);
    void AddIsolationOptions(CLI::App& app);
    void AddValidationOptions(CLI::App& app);

    const Command& ChosenCommand() const;
    std::optional<std::chrono::seconds> Timeout(const Command& command) const;
    CommandLine MakeCommandLine(const Command& command) const;

    CLI::App m_app{"Source control for files, through the providers of OrvixCore.", "orvix"};
    std::map<const CLI::App*, const Command*> m_commands;
    Texts m_texts;
    CommandLine m_values; // flags, which CLI11 stores itself
    unsigned int m_timeout = 0;
};

Parser::Parser()
{
    m_app.footer(Footer);
    m_app.set_version_flag("--version", Version());
    m_app.allow_windows_style_options(false); // a path may start with a slash
    m_app.require_subcommand(1);
    m_app.fallthrough();
    AddSharedOptions();
    for (const Command& command : AllCommands())
    {
        AddCommand(command);
    }
}

void Parser::AddSharedOptions()
{
    m_app.add_option("--sources", m_texts.sources,
                     "Where providers come from: plugins, msscci or both (default: plugins; doctor: both)");
    m_app.add_option("--plugins", m_texts.plugins, "Folder of provider plug-ins (default: plugins beside the program)");
    m_app.add_option("--config", m_texts.config, "Configuration folder (default: %APPDATA%\\OrvixCore)");
    m_app.add_option("--provider", m_texts.provider, "Provider by name or index (default: the first)");
    m_app.add_option("--project", m_texts.project,
                     "Project folder (default: the provider's fixed root, or the current folder)");
    m_app.add_option("--user", m_texts.user, "User name (default: the Windows user)");
    m_app
        .add_option("--veto", m_texts.vetoes, "Refuse an operation that would touch a file of this pattern; may repeat")
        ->expected(1)
        ->take_all()
        ->allow_extra_args(false);
    m_app.add_flag("--unattended", m_values.unattended, "Answer yes instead of showing a dialog");
    m_app
        .add_option("--timeout", m_timeout,
                    "Seconds that a provider may take without a sign of life (default: 60 with --unattended, otherwise "
                    "none; doctor and validate: 30)")
        ->check(CLI::Range(1, 3600));
    m_app.add_option("--on-window", m_texts.onWindow, "What to do when a provider shows a window: report or cancel")
        ->check(CLI::IsMember({"report", "cancel"}));
    m_app.add_flag("--no-color", m_values.noColor, "No colours on a terminal; the same as the variable NO_COLOR");
    m_app.add_flag("--verbose", m_values.verbose, "Print notifications; doctor: name each library before it is loaded");
}

void Parser::AddCommand(const Command& command)
{
    CLI::App* const parent = command.group != nullptr ? m_app.get_subcommand(command.group) : &m_app;
    CLI::App* const app = parent->add_subcommand(command.name, command.description);
    app->footer("Examples:\n" + std::string(command.examples) +
                "\n\nOptions of every command, and exit codes: orvix --help");
    if (command.run == nullptr)
    {
        app->require_subcommand(1);
    }
    AddArguments(*app, command);
    m_commands[app] = &command;
}

/// Adds them in the order in which the help shows them.
void Parser::AddArguments(CLI::App& app, const Command& command)
{
    AddPathArguments(app, command);
    if ((command.takes & Argument::Name) != 0)
    {
        app.add_option("NAME", m_texts.name, "Its name as a provider")->required();
    }
    if ((command.takes & Argument::Isolation) != 0)
    {
        AddIsolationOptions(app);
    }
    if ((command.takes & Argument::Validation) != 0)
    {
        AddValidationOptions(app);
    }
    if ((command.takes & Argument::Json) != 0)
    {
        app.add_flag("--json", m_values.json, "Print the result as JSON");
    }
    if ((command.takes & Argument::Comment) != 0)
    {
        app.add_option("-m", m_texts.comment, "Comment");
    }
    if ((command.takes & Argument::Keep) != 0)
    {
        app.add_flag("--keep", m_values.keep, "Keep the files checked out");
    }
    if ((command.takes & Argument::Force) != 0)
    {
        app.add_flag("--force", m_values.force, "Replace also files that you have changed or checked out");
    }
    AddPromptArguments(app, command);
}

void Parser::AddPathArguments(CLI::App& app, const Command& command)
{
    if ((command.takes & Argument::Paths) != 0)
    {
        app.add_option("PATH", m_texts.paths, command.pathHelp)->required();
    }
    if ((command.takes & Argument::Path) != 0)
    {
        app.add_option("PATH", m_texts.paths, command.pathHelp)->required()->expected(1)->allow_extra_args(false);
    }
}

void Parser::AddPromptArguments(CLI::App& app, const Command& command)
{
    constexpr const char* IDHelp = "ID of the prompt; applies to every row with this ID";
    if ((command.takes & Argument::Prompt) != 0)
    {
        app.add_option("ID", m_texts.prompt, IDHelp)->required();
    }
    if ((command.takes & Argument::Answer) != 0)
    {
        app.add_option("ANSWER", m_texts.answer, "ask, yes, no, yes-to-all or no-to-all")->required();
    }
    if ((command.takes & Argument::PromptOrAll) != 0)
    {
        CLI::Option_group* const which = app.add_option_group("Which");
        which->add_option("ID", m_texts.prompt, IDHelp);
        which->add_flag("--all", m_values.all, "Every prompt that is not locked");
        which->require_option(1);
    }
}

void Parser::AddIsolationOptions(CLI::App& app)
{
    app.add_flag("--isolated", m_values.isolated, "Run it in a process of its own");
    app.add_option("--patience", m_values.patience,
                   "Seconds until an isolated call without an answer or a window is ended (default: 300)")
        ->check(CLI::Range(1, 86400));
}

void Parser::AddValidationOptions(CLI::App& app)
{
    app.add_flag("--msscci", m_values.msscci, "It is an MSSCCI library");
    app.add_flag("--dialogs", m_values.dialogs, "Check also what may show windows");
}

std::optional<Invocation> Parser::Parse(int count, wchar_t** arguments)
{
    try
    {
        m_app.parse(ReversedArguments(count, arguments));
    }
    catch (const CLI::Success& request)
    {
        m_app.exit(request, std::cout, std::cout);
        return std::nullopt;
    }
    catch (const CLI::ParseError& error)
    {
        std::wstring message = Wide(error.what());
        std::erase(message, static_cast<wchar_t>(Mark));
        const std::vector<std::string> rest = m_app.remaining();
        if (m_app.get_subcommands().empty() && !rest.empty() && !rest.front().starts_with('-'))
        {
            message = L"there is no command " + Unmarked(rest.front()) + L"; the nearest one is " +
                      Wide(NearestCommand(rest.front()));
        }
        throw ToolError(ExitCode::BadUsage, message + L" (see --help)");
    }
    const Command& command = ChosenCommand();
    return Invocation{&command, MakeCommandLine(command)};
}

const Command& Parser::ChosenCommand() const
{
    const CLI::App* app = m_app.get_subcommands().front();
    if (!app->get_subcommands().empty())
    {
        app = app->get_subcommands().front();
    }
    return *m_commands.at(app);
}

std::optional<std::chrono::seconds> Parser::Timeout(const Command& command) const
{
    constexpr std::chrono::seconds Unattended(60);

    if (m_timeout != 0)
    {
        return std::chrono::seconds(m_timeout);
    }
    if (command.timeout != 0)
    {
        return std::chrono::seconds(command.timeout);
    }
    return m_values.unattended ? std::optional(Unattended) : std::nullopt;
}

CommandLine Parser::MakeCommandLine(const Command& command) const
{
    for (const char* option : {"--plugins", "--config", "--provider", "--project"})
    {
        // An unset variable of a script must not mean another folder or provider.
        if (m_app.count(option) > 0 && m_app.get_option(option)->as<std::string>().empty())
        {
            throw ToolError(ExitCode::BadUsage, Wide(option) + L" needs a value");
        }
    }
    CommandLine result = m_values;
    result.command = Wide(command.group != nullptr ? command.group : command.name);
    result.folder = FullPath(L".");
    result.timeout = Timeout(command);
    result.providerTextIsResult = command.providerTextIsResult;
    result.watchesWindows = !m_texts.onWindow.empty();
    result.cancelsWindows = m_texts.onWindow == "cancel";
    result.prompt = Unmarked(m_texts.prompt);
    result.answer = Unmarked(m_texts.answer);
    result.paths = FullPaths(Unmarked(m_texts.paths));
    result.name = Unmarked(m_texts.name);
    result.sources = m_app.count("--sources") == 0 ? command.defaultSources : ParseSources(m_texts.sources);
    const std::wstring plugins = Unmarked(m_texts.plugins);
    result.plugins = FullPathOrEmpty(plugins);
    result.pluginsAreRelative = !plugins.empty() && !IsAbsolutePath(plugins);
    result.config = FullPathOrEmpty(Unmarked(m_texts.config));
    result.provider = Unmarked(m_texts.provider);
    result.project = FullPathOrEmpty(Unmarked(m_texts.project));
    result.user = Unmarked(m_texts.user);
    result.comment = Unmarked(m_texts.comment);
    result.vetoes = Unmarked(m_texts.vetoes);
    return result;
}

} // namespace

std::optional<Invocation> ParseCommandLine(int count, wchar_t** arguments)
{
    return Parser().Parse(count, arguments);
}
