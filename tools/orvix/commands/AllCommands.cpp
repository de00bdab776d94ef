#include "Command.h"
#include "DoctorCommand.h"
#include "FileCommands.h"
#include "FilterCommand.h"
#include "PromptCommands.h"
#include "ProviderCommands.h"
#include "ProviderList.h"
#include "RegistrationCommands.h"
#include "ValidateCommand.h"

namespace
{

constexpr const char* FilesHelp = "Files, and folders with everything in them";

constexpr Command Table[] = {
    {
        .name = "providers",
        .description = "List the providers",
        .examples = "  orvix providers\n"
                    "  orvix providers --sources plugins,msscci --json",
        .takes = Argument::Json,
        .usesProviders = true,
        .run = ListProviders,
    },
    {
        .name = "doctor",
        .description = "Show for every possible provider whether it is listed and why, and what is wrong",
        .examples = "  orvix doctor\n"
                    "  orvix doctor --sources msscci --json",
        .takes = Argument::Json,
        .defaultSources = OrvixProviderSource::Plugins | OrvixProviderSource::InstalledMSSCCI,
        .timeout = 30,
        .run = RunDoctor,
    },
    {
        .name = "status",
        .description = "Show the state of files",
        .examples = "  orvix status .\n"
                    "  orvix status src\\a.txt --json",
        .takes = Argument::Paths | Argument::Json,
        .pathHelp = FilesHelp,
        .usesProviders = true,
        .run = FileCommands::ShowStatus,
    },
    {
        .name = "add",
        .description = "Put files under control",
        .examples = "  orvix add src -m \"first version\"\n"
                    "  orvix add new.txt --keep --unattended",
        .takes = Argument::Paths | Argument::Json | Argument::Comment | Argument::Keep,
        .pathHelp = FilesHelp,
        .usesProviders = true,
        .run = FileCommands::Add,
    },
    {
        .name = "checkout",
        .description = "Check files out for editing",
        .examples = "  orvix checkout src\\a.txt -m \"to fix the title\"\n"
                    "  orvix checkout src --unattended --json",
        .takes = Argument::Paths | Argument::Json | Argument::Comment,
        .pathHelp = FilesHelp,
        .usesProviders = true,
        .run = FileCommands::CheckOut,
    },
    {
        .name = "checkin",
        .description = "Store new versions of checked-out files",
        .examples = "  orvix checkin . -m \"title fixed\"\n"
                    "  orvix checkin . --unattended -m nightly --veto *.key",
        .takes = Argument::Paths | Argument::Json | Argument::Comment | Argument::Keep,
        .pathHelp = FilesHelp,
        .usesProviders = true,
        .run = FileCommands::CheckIn,
    },
    {
        .name = "undo",
        .description = "Undo check-outs and discard the changes",
        .examples = "  orvix undo src\\a.txt",
        .takes = Argument::Paths | Argument::Json,
        .pathHelp = FilesHelp,
        .usesProviders = true,
        .run = FileCommands::UndoCheckOut,
    },
    {
        .name = "get",
        .description = "Get the latest versions",
        .examples = "  orvix get . --unattended\n"
                    "  orvix get src\\a.txt --force",
        .takes = Argument::Paths | Argument::Json | Argument::Force,
        .pathHelp = FilesHelp,
        .usesProviders = true,
        .run = FileCommands::GetLatest,
    },
    {
        .name = "history",
        .description = "Show the versions of files",
        .examples = "  orvix history src\\a.txt\n"
                    "  orvix history src --json",
        .takes = Argument::Paths | Argument::Json,
        .pathHelp = FilesHelp,
        .providerTextIsResult = true,
        .usesProviders = true,
        .run = FileCommands::ShowHistory,
    },
    {
        .name = "filters",
        .description = "Show which files the filters of providers exclude, and why",
        .examples = "  orvix filters src\n"
                    "  orvix filters a.tmp --provider Archive --json",
        .takes = Argument::Paths | Argument::Json,
        .pathHelp = FilesHelp,
        .usesProviders = true,
        .run = ShowFilters,
    },
    {
        .name = "prompts",
        .description = "Show and change the stored answers",
        .examples = "  orvix prompts list\n"
                    "  orvix prompts set 1330796546 yes\n"
                    "  orvix prompts reset --all\n"
                    "  orvix prompts lock 1330796546",
    },
    {
        .group = "prompts",
        .name = "list",
        .description = "List the prompts",
        .examples = "  orvix prompts list\n"
                    "  orvix prompts list --json --config D:\\Config",
        .takes = Argument::Json,
        .run = PromptCommands::List,
    },
    {
        .group = "prompts",
        .name = "set",
        .description = "Store an answer",
        .examples = "  orvix prompts set 1330796546 yes\n"
                    "  orvix prompts set 7 ask",
        .takes = Argument::Prompt | Argument::Answer | Argument::Json,
        .run = PromptCommands::Set,
    },
    {
        .group = "prompts",
        .name = "reset",
        .description = "Make a prompt ask again",
        .examples = "  orvix prompts reset 7\n"
                    "  orvix prompts reset --all",
        .takes = Argument::PromptOrAll | Argument::Json,
        .run = PromptCommands::Reset,
    },
    {
        .group = "prompts",
        .name = "lock",
        .description = "Lock the answer of a prompt",
        .examples = "  orvix prompts lock 7",
        .takes = Argument::Prompt | Argument::Json,
        .run = PromptCommands::Lock,
    },
    {
        .group = "prompts",
        .name = "unlock",
        .description = "Unlock it",
        .examples = "  orvix prompts unlock 7",
        .takes = Argument::Prompt | Argument::Json,
        .run = PromptCommands::Unlock,
    },
    {
        .name = "open",
        .description = "Open the project and close it again",
        .examples = "  orvix open --project D:\\Projects\\Song",
        .providerTextIsResult = true,
        .usesProviders = true,
        .run = ProviderCommands::Open,
    },
    {
        .name = "options",
        .description = "Show the provider's own options",
        .examples = "  orvix options --provider Archive",
        .providerTextIsResult = true,
        .usesProviders = true,
        .run = ProviderCommands::ShowOptions,
    },
    {
        .name = "client",
        .description = "Start the provider's own program",
        .examples = "  orvix client --sources msscci",
        .providerTextIsResult = true,
        .usesProviders = true,
        .run = ProviderCommands::RunClient,
    },
    {
        .name = "properties",
        .description = "Show the properties of a file",
        .examples = "  orvix properties src\\a.txt",
        .takes = Argument::Path,
        .pathHelp = "The file",
        .providerTextIsResult = true,
        .usesProviders = true,
        .run = ProviderCommands::ShowProperties,
    },
    {
        .name = "register",
        .description = "Register an MSSCCI library on this machine",
        .examples = "  orvix register archive_msscci.dll \"Archive MSSCCI\"\n"
                    "  orvix register depot32.dll Depot --isolated --patience 600",
        .takes = Argument::Path | Argument::Name | Argument::Isolation,
        .pathHelp = "The library, a DLL; a 32-bit one is always isolated",
        .run = RegistrationCommands::Register,
    },
    {
        .name = "unregister",
        .description = "Undo register",
        .examples = "  orvix unregister \"Archive MSSCCI\"",
        .takes = Argument::Name,
        .run = RegistrationCommands::Unregister,
    },
    {
        .name = "validate",
        .description = "Check a provider plug-in or an MSSCCI library",
        .examples = "  orvix validate plugins\\depot.dll\n"
                    "  orvix validate depot_msscci.dll --msscci --json",
        .takes = Argument::Path | Argument::Validation | Argument::Json,
        .pathHelp = "The plug-in or library",
        .timeout = 30,
        .run = RunValidate,
    },
};

} // namespace

std::span<const Command> AllCommands()
{
    return Table;
}
