#include "FileCommand.h"

#include "FilePath.h"
#include "FileState.h"
#include "NotificationPrinter.h"
#include "OrvixFileListDialogParams.h"
#include "TemporaryAnswer.h"
#include "VetoRule.h"

#include <iostream>
#include <new>

namespace
{
constexpr const char* OutcomeNames[] = {"done", "not ticked", "refused", "cancelled", "failed"};

// Bits of an entry's FlagsIn.
constexpr unsigned long TakenByOperation = 0x1; // set by the library
constexpr unsigned long Selected = 0x2;

constexpr std::uint32_t NotifyListeners = 0x1;

namespace DialogOption
{
constexpr std::uint32_t Shown = 0x1; // set by the library
constexpr std::uint32_t OffersKeep = 0x4;
constexpr std::uint32_t Keep = 0x10;
constexpr std::uint32_t OffersRemember = 0x40;
} // namespace DialogOption

namespace PromptAction
{
constexpr std::uint32_t Ask = 0x1;
constexpr std::uint32_t Yes = 0x2;
constexpr std::uint32_t Keep = 0x8;
constexpr std::uint32_t DoNotKeep = 0x10;
} // namespace PromptAction

FileTable::Row Heading(const CommandLine& commandLine)
{
    return commandLine.command == L"status" ? FileTable::Row{"State", "File"}
                                            : FileTable::Row{"Result", "State", "File"};
}

/// Makes the prompts known; what the user stored before stays.
void RegisterPrompts(IOrvixServices& services, const OperationRule& rule)
{
    const std::wstring title = rule.title;
    services.RegisterPrompt(rule.dialogPrompt, (title + L": confirm the files").c_str(),
                            PromptAction::Ask | PromptAction::Yes, 0, false);
    if (rule.CanKeep())
    {
        services.RegisterPrompt(rule.keepPrompt, (title + L": keep the files checked out").c_str(),
                                PromptAction::DoNotKeep, 0, false);
    }
}
} // namespace

FileCommand::FileCommand(ProjectSession& project, OrvixClientInfo& client, const CommandLine& commandLine)
    : m_project(project), m_client(client), m_commandLine(commandLine), m_table(Heading(commandLine))
{
    for (const std::wstring& path : commandLine.paths)
    {
        m_collector.Add(path);
    }
    const std::vector<FileCollector::File>& files = m_collector.Files();
    for (std::size_t i = 0; i < files.size(); ++i)
    {
        const wchar_t* path = files[i].path.c_str();
        std::wstring filter;
        if (!project.Services().IsFileExcludedByProvider(project.ProviderIndex(), path, &filter))
        {
            if (m_list.CreateEntry(path, nullptr, Selected, static_cast<long long>(i)) == nullptr)
            {
                throw std::bad_alloc();
            }
        }
        else if (files[i].named)
        {
            Report(Refused, "excluded by filter " + Printable(filter), path);
        }
        else
        {
            ++m_excluded;
        }
    }
}

ExitCode FileCommand::Run()
{
    if (m_list.NumEntries() > 0)
    {
        if (const OperationRule* rule = OperationRule::Find(m_commandLine.command))
        {
            Change(*rule);
        }
        else if (m_commandLine.command == L"history")
        {
            ShowHistory();
        }
        else
        {
            ShowStatus();
        }
    }
    m_table.Print(std::cout);
    PrintSummary();

    const unsigned int bad = m_counts[Refused] + m_counts[Cancelled] + m_counts[Failed];
    return bad == 0 && m_collector.UnreadableFolders().empty() ? ExitCode::Success : ExitCode::Failed;
}

void FileCommand::ShowStatus()
{
    QueryStatus();
    for (unsigned int i = 0; OrvixFileEntry* entry = m_list.GetFileEntry(i); ++i)
    {
        const bool known = (entry->GetFlagsOut() & FileState::Controlled) != 0 || PathExists(entry->GetFile());
        Report(known ? Done : Refused, *entry);
    }
}

void FileCommand::ShowHistory()
{
    QueryStatus();
    for (unsigned int i = 0; OrvixFileEntry* entry = m_list.GetFileEntry(i); ++i)
    {
        if ((entry->GetFlagsOut() & FileState::AllowsHistory) != 0)
        {
            continue;
        }
        m_list.RemoveActiveEntry(entry);
        if (IsNamed(*entry))
        {
            Report(Refused, *entry);
        }
        else
        {
            ++m_otherState;
        }
    }
    if (m_list.NumActiveEntries() > 0 && m_project.Provider().ShowHistory(&m_list) < 0)
    {
        throw ToolError(ExitCode::Failed, L"the provider cannot show the history");
    }
    m_counts[Done] = m_list.NumActiveEntries();
}

void FileCommand::Change(const OperationRule& rule)
{
    IOrvixServices& services = m_project.Services();
    std::optional<NotificationPrinter> printer;
    if (m_commandLine.verbose)
    {
        printer.emplace();
    }
    VetoRule veto(m_commandLine.vetoes, m_project.Folder());

    OrvixFileListDialogParams params;
    params.SetTitle(rule.title);
    params.SetMessage(rule.question);
    params.SetOrvixFileList(&m_list);
    params.SetComment(m_commandLine.comment.c_str());
    params.SetOptions(DialogOption::OffersRemember | (rule.CanKeep() ? DialogOption::OffersKeep : 0) |
                      (m_commandLine.keep ? DialogOption::Keep : 0));
    params.SetDialogPromptID(static_cast<std::int32_t>(rule.dialogPrompt));
    params.SetOptionPromptID(static_cast<std::int32_t>(rule.keepPrompt));

    RegisterPrompts(services, rule);
    const bool asks =
        !m_commandLine.unattended && (services.GetPromptAction(rule.dialogPrompt) & PromptAction::Ask) != 0;
    std::optional<TemporaryAnswer> dialogAnswer;
    if (m_commandLine.unattended)
    {
        dialogAnswer.emplace(services, rule.dialogPrompt, PromptAction::Yes);
    }
    std::optional<TemporaryAnswer> keepAnswer;
    if (rule.CanKeep() && !asks && (m_commandLine.unattended || m_commandLine.keep))
    {
        keepAnswer.emplace(services, rule.keepPrompt,
                           m_commandLine.keep ? PromptAction::Keep : PromptAction::DoNotKeep);
    }

    m_list.BuildActiveList(Selected, false);
    const bool ran = services.RunFileListOperation(m_client.GetParentWindow(), &params, true, &m_project.Provider(),
                                                   NotifyListeners | rule.operation, rule.allowedBy) == 1;
    if (!veto.Reason().empty())
    {
        std::cerr << "orvix: vetoed: " << Printable(veto.Reason()) << '\n';
    }

    const std::vector<std::optional<Outcome>> outcomes = OutcomesOfRun(rule, ran);
    const bool shown = (params.GetOptions() & DialogOption::Shown) != 0;
    const bool kept = shown ? (params.GetOptions() & DialogOption::Keep) != 0
                            : m_commandLine.keep ||
                                  (rule.CanKeep() && services.GetPromptAction(rule.keepPrompt) == PromptAction::Keep);
    QueryStatus();
    for (unsigned int i = 0; OrvixFileEntry* entry = m_list.GetFileEntry(i); ++i)
    {
        if (!outcomes[i])
        {
            ++m_otherState;
        }
        else if (*outcomes[i] == Done)
        {
            const bool reached = rule.IsReached(entry->GetFlagsOut(), kept) && PathExists(entry->GetFile());
            Report(reached ? Done : Failed, *entry);
        }
        else
        {
            Report(*outcomes[i], *entry);
        }
    }
}

std::vector<std::optional<FileCommand::Outcome>> FileCommand::OutcomesOfRun(const OperationRule& rule, bool ran)
{
    std::vector<std::optional<Outcome>> outcomes;
    unsigned int nextActive = 0; // the active list is in the order of the entries
    for (unsigned int i = 0; OrvixFileEntry* entry = m_list.GetFileEntry(i); ++i)
    {
        const bool active = entry == m_list.GetActiveFileEntry(nextActive);
        nextActive += active ? 1 : 0;
        if ((entry->GetFlagsIn() & TakenByOperation) != 0)
        {
            outcomes.emplace_back(!ran ? Cancelled : active ? Done : Unticked);
        }
        else if (IsNamed(*entry) || rule.Concerns(entry->GetFlagsOut()))
        {
            outcomes.emplace_back(Refused);
        }
        else
        {
            outcomes.emplace_back(std::nullopt);
        }
    }
    return outcomes;
}

void FileCommand::QueryStatus()
{
    m_list.BuildActiveList(Selected, false);
    if (m_project.Provider().QueryStatus(&m_list, 0) != 0)
    {
        throw ToolError(ExitCode::Failed, L"the provider does not tell the state of the files");
    }
}

bool FileCommand::IsNamed(OrvixFileEntry& entry) const
{
    return m_collector.Files()[static_cast<std::size_t>(entry.GetClientPtr())].named;
}

void FileCommand::Report(Outcome outcome, OrvixFileEntry& entry)
{
    Report(outcome, FileState::InWords(entry.GetFlagsOut(), PathExists(entry.GetFile())), entry.GetFile());
}

void FileCommand::Report(Outcome outcome, const std::string& state, const std::wstring& path)
{
    ++m_counts[outcome];
    FileTable::Row row{OutcomeNames[outcome], state, Printable(PathBelow(m_project.Folder(), path))};
    if (m_commandLine.command == L"status")
    {
        row.erase(row.begin());
    }
    m_table.Add(std::move(row));
}

void FileCommand::PrintSummary() const
{
    for (const std::wstring& folder : m_collector.UnreadableFolders())
    {
        std::cerr << "orvix: cannot read the folder " << Printable(folder) << '\n';
    }
    unsigned int total = 0;
    std::string parts;
    const auto add = [&parts](unsigned int count, const char* what) {
        parts += count == 0 ? "" : ", " + std::to_string(count) + " " + what;
    };
    for (std::size_t outcome = 0; outcome < NumOutcomes; ++outcome)
    {
        total += m_counts[outcome];
        if (m_commandLine.command != L"status" || outcome != Done)
        {
            add(m_counts[outcome], OutcomeNames[outcome]);
        }
    }
    add(m_otherState, "left out for their state");
    add(m_excluded, "left out by filters");
    add(m_collector.NumSkippedFolders(),
        m_collector.NumSkippedFolders() == 1 ? "hidden folder skipped" : "hidden folders skipped");
    std::cout << total << (total == 1 ? " file" : " files") << parts << '\n';
}
