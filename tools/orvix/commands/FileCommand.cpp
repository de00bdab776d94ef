#include "FileCommand.h"

#include "FilePath.h"
#include "FileStateText.h"
#include "NotificationPrinter.h"
#include "OrvixDialogOption.h"
#include "OrvixFileFlags.h"
#include "OrvixFileListDialogParams.h"
#include "OrvixOperation.h"
#include "OrvixPrompt.h"
#include "TemporaryAnswer.h"
#include "VetoRule.h"

#include <iostream>
#include <new>
#include <numeric>

namespace
{

constexpr struct
{
    const char* key;
    const char* words;
    Listing::Tone tone;
} OutcomeNames[] = {
    {"done", "done", Listing::Tone::Good},      {"notTicked", "not ticked", Listing::Tone::Quiet},
    {"refused", "refused", Listing::Tone::Bad}, {"cancelled", "cancelled", Listing::Tone::Bad},
    {"failed", "failed", Listing::Tone::Bad},
};

/// Bit of an entry's FlagsIn by which the tool selects.
constexpr unsigned long Selected = 0x2;

constexpr std::uint32_t OffersToAll = OrvixPromptOption::OfferYesToAll | OrvixPromptOption::OfferNoToAll;

Listing EmptyListing(const CommandLine& commandLine)
{
    Listing listing{.key = "files", .columns = {{"state", "State"}, {"file", "File"}}, .rows = {}, .summary = {}};
    if (commandLine.command != L"status")
    {
        listing.columns.insert(listing.columns.begin(), {"result", "Result"});
    }
    return listing;
}

/// Makes the prompts known; what the user stored before stays.
void RegisterPrompts(IOrvixServices& services, const OperationRule& rule)
{
    const std::wstring title = rule.title;
    services.RegisterPrompt(rule.dialogPrompt, (title + L": confirm the files").c_str(),
                            OrvixPromptAction::Ask | OrvixPromptAction::Yes, 0, false);
    if (rule.CanKeep())
    {
        services.RegisterPrompt(rule.keepPrompt, (title + L": keep the files checked out").c_str(),
                                OrvixPromptAction::OptionCleared, OffersToAll, false);
    }
}

} // namespace

FileCommand::FileCommand(ProjectSession& project, OrvixClientInfo& client, const CommandLine& commandLine,
                         Output& output)
    : m_project(project), m_client(client), m_commandLine(commandLine), m_output(output), m_collector(output),
      m_listing(EmptyListing(commandLine))
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
            Report(Refused, L"excluded by filter " + filter, path);
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
    m_listing.summary = Summary();
    m_output.Show(m_listing);

    const unsigned int bad = m_counts[Refused] + m_counts[Cancelled] + m_counts[Failed];
    return m_collector.ReportUnreadableFolders() || bad > 0 ? ExitCode::Failed : ExitCode::Success;
}

void FileCommand::ShowStatus()
{
    QueryStatus();
    for (unsigned int i = 0; i < m_list.NumEntries(); ++i)
    {
        OrvixFileEntry* entry = m_list.GetFileEntry(i);
        const bool known = (entry->GetFlagsOut() & OrvixFileState::Controlled) != 0 || PathExists(entry->GetFile());
        Report(known ? Done : Refused, *entry);
    }
}

void FileCommand::ShowHistory()
{
    QueryStatus();
    for (unsigned int i = 0; i < m_list.NumEntries(); ++i)
    {
        OrvixFileEntry* entry = m_list.GetFileEntry(i);
        if ((entry->GetFlagsOut() & OrvixFilePermission::ShowHistory) != 0)
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
        printer.emplace(m_output);
    }
    VetoRule veto(m_commandLine.vetoes, m_project.Folder());

    OrvixFileListDialogParams params;
    params.SetTitle(rule.title);
    params.SetMessage(rule.question);
    params.SetOrvixFileList(&m_list);
    params.SetComment(m_commandLine.comment.c_str());
    params.SetOptions(OrvixDialogOption::OfferRemember | (rule.CanKeep() ? OrvixDialogOption::OfferKeepCheckedOut : 0) |
                      (m_commandLine.keep ? OrvixDialogOption::OptionChecked : 0));
    params.SetDialogPromptID(static_cast<std::int32_t>(rule.dialogPrompt));
    params.SetOptionPromptID(static_cast<std::int32_t>(rule.keepPrompt));

    RegisterPrompts(services, rule);
    const bool asks =
        !m_commandLine.unattended && (services.GetPromptAction(rule.dialogPrompt) & OrvixPromptAction::Ask) != 0;
    std::optional<TemporaryAnswer> dialogAnswer;
    if (m_commandLine.unattended)
    {
        dialogAnswer.emplace(services, rule.dialogPrompt, OrvixPromptAction::Yes);
    }
    std::optional<TemporaryAnswer> keepAnswer;
    if (rule.CanKeep() && !asks && (m_commandLine.unattended || m_commandLine.keep))
    {
        keepAnswer.emplace(services, rule.keepPrompt,
                           m_commandLine.keep ? OrvixPromptAction::OptionChecked : OrvixPromptAction::OptionCleared);
    }

    m_list.BuildActiveList(Selected, false);
    m_output.Progress(std::wstring(rule.title) + L", files: " + std::to_wstring(m_list.NumActiveEntries()));
    const bool ran = services.RunFileListOperation(m_client.GetParentWindow(), &params, true, &m_project.Provider(),
                                                   OrvixOperation::Notify | rule.operation, rule.allowedBy) == 1;
    if (!veto.Reason().empty())
    {
        m_output.Progress({});
        std::cerr << "orvix: vetoed: " << Printable(veto.Reason()) << '\n';
    }

    const std::vector<std::optional<Outcome>> outcomes = OutcomesOfRun(rule, ran);
    const bool shown = (params.GetOptions() & OrvixDialogOption::EntriesCanBeCleared) != 0;
    const bool kept = shown ? (params.GetOptions() & OrvixDialogOption::OptionChecked) != 0
                            : m_commandLine.keep || (rule.CanKeep() && services.GetPromptAction(rule.keepPrompt) ==
                                                                           OrvixPromptAction::OptionChecked);
    QueryStatus();
    for (unsigned int i = 0; i < m_list.NumEntries(); ++i)
    {
        OrvixFileEntry* entry = m_list.GetFileEntry(i);
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
    for (unsigned int i = 0; i < m_list.NumEntries(); ++i)
    {
        OrvixFileEntry* entry = m_list.GetFileEntry(i);
        const bool active = entry == m_list.GetActiveFileEntry(nextActive);
        nextActive += active ? 1 : 0;
        if ((entry->GetFlagsIn() & OrvixFileSelection::Selected) != 0)
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
    m_output.Progress(L"asking for the state, files: " + std::to_wstring(m_list.NumActiveEntries()));
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
    Report(outcome, FileStateText::InWords(entry.GetFlagsOut(), PathExists(entry.GetFile())), entry.GetFile());
}

void FileCommand::Report(Outcome outcome, const std::wstring& state, const std::wstring& path)
{
    ++m_counts[outcome];
    const Listing::Tone tone = OutcomeNames[outcome].tone;
    std::vector<Listing::Cell>& row = m_listing.rows.emplace_back();
    if (m_commandLine.command != L"status")
    {
        row.push_back({Wide(OutcomeNames[outcome].words), tone});
    }
    row.push_back({state, outcome == Refused ? tone : Listing::Tone::Plain});
    row.push_back({PathBelow(m_project.Folder(), path)});
}

std::vector<Listing::Count> FileCommand::Summary() const
{
    const unsigned int total = std::accumulate(m_counts.begin(), m_counts.end(), 0U);
    std::vector<Listing::Count> counts = {{"files", total == 1 ? "file" : "files", total}};
    for (std::size_t outcome = 0; outcome < NumOutcomes; ++outcome)
    {
        if (m_commandLine.command != L"status" || outcome != Done)
        {
            counts.push_back({OutcomeNames[outcome].key, OutcomeNames[outcome].words, m_counts[outcome]});
        }
    }
    counts.push_back({"leftOutForState", "left out for their state", m_otherState});
    counts.push_back({"leftOutByFilters", "left out by filters", m_excluded});
    counts.push_back(m_collector.SkippedFolders());
    return counts;
}
