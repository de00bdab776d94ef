#include "OperationCommand.h"

#include "FileMark.h"
#include "FilePath.h"
#include "NotificationPrinter.h"
#include "OrvixDialogOption.h"
#include "OrvixListenerRegistration.h"
#include "VetoRule.h"

#include <iostream>
#include <new>

namespace
{

/// Registers a listener. Throws std::bad_alloc: an operation never runs without its veto.
OrvixListenerRegistration Registered(IOrvixNotifyCallback& listener)
{
    OrvixListenerRegistration registration(listener);
    if (!registration.IsRegistered())
    {
        throw std::bad_alloc();
    }
    return registration;
}

} // namespace

void OperationCommand::RunOnFiles()
{
    OrvixFileListDialogParams params;
    FillDialog(params);
    RegisterPrompts();
    StoreAnswers();
    Project().Provider().Withhold(m_rule.allowedBy, m_rule.protects);
    const bool ran = RunOperation(params);
    RequireStatus();
    const std::vector<std::optional<Result>> results = ResultsOfRun(ran);
    const bool kept = IsKept(params);
    QueryConcerned();
    ReportResults(results, kept);
}

void OperationCommand::FillDialog(OrvixFileListDialogParams& params)
{
    params.SetTitle(m_rule.title);
    params.SetMessage(m_rule.question);
    params.SetOrvixFileList(&List());
    params.SetComment(Arguments().comment.c_str());
    params.SetOptions(OrvixDialogOption::OfferRemember | OrvixDialogOption::ForOperation(m_rule.operation) |
                      (m_rule.CanKeep() ? OrvixDialogOption::OfferKeepCheckedOut : 0) |
                      (Arguments().keep ? OrvixDialogOption::OptionChecked : 0));
    params.SetDialogPromptID(static_cast<std::int32_t>(m_rule.dialogPrompt));
    params.SetOptionPromptID(static_cast<std::int32_t>(m_rule.keepPrompt));
}

void OperationCommand::RegisterPrompts()
{
    IOrvixServices& services = Project().Services();
    const std::wstring title = m_rule.title;
    services.RegisterPrompt(m_rule.dialogPrompt, (title + L": confirm the files").c_str(),
                            OrvixPromptAction::Ask | OrvixPromptAction::Yes, 0, false);
    if (m_rule.CanKeep())
    {
        services.RegisterPrompt(m_rule.keepPrompt, (title + L": keep the files checked out").c_str(),
                                OrvixPromptAction::OptionCleared,
                                OrvixPromptOption::OfferYesToAll | OrvixPromptOption::OfferNoToAll, false);
    }
}

void OperationCommand::StoreAnswers()
{
    IOrvixServices& services = Project().Services();
    const bool unattended = Arguments().unattended;
    const bool keep = Arguments().keep;
    const bool showsDialog =
        !unattended && (services.GetPromptAction(m_rule.dialogPrompt) & OrvixPromptAction::Ask) != 0;
    if (unattended)
    {
        m_dialogAnswer.emplace(services, m_rule.dialogPrompt, OrvixPromptAction::Yes);
    }
    if (m_rule.CanKeep() && !showsDialog && (unattended || keep))
    {
        m_keepAnswer.emplace(services, m_rule.keepPrompt,
                             keep ? OrvixPromptAction::OptionChecked : OrvixPromptAction::OptionCleared);
    }
}

bool OperationCommand::RunOperation(OrvixFileListDialogParams& params)
{
    NotificationPrinter printer(Results());
    const OrvixListenerRegistration printing = Arguments().verbose ? Registered(printer) : OrvixListenerRegistration();
    VetoRule veto(Arguments().vetoes, Project().Folder());
    const OrvixListenerRegistration vetoing = Registered(veto);

    List().BuildActiveList(FileMark::Chosen, false);
    Results().Progress(std::wstring(m_rule.title) + L", files: " + std::to_wstring(List().NumActiveEntries()));
    const std::int32_t result = Project().Services().RunFileListOperation(
        Project().Client().GetParentWindow(), &params, true, &Project().Provider(),
        OrvixOperation::Notify | m_rule.operation, m_rule.allowedBy);
    if (!veto.Reason().empty())
    {
        Results().Progress({});
        std::cerr << "orvix: vetoed: " << Printable(veto.Reason()) << '\n';
    }
    else if (result != OrvixOperationResult::Done)
    {
        ExplainCancel();
    }
    return result == OrvixOperationResult::Done;
}

std::vector<std::optional<FileCommand::Result>> OperationCommand::ResultsOfRun(bool ran)
{
    std::vector<std::optional<Result>> results;
    unsigned int nextActive = 0; // the active list has the order of the entries
    for (unsigned int i = 0; i < List().NumEntries(); ++i)
    {
        OrvixFileEntry* entry = List().GetFileEntry(i);
        const bool active = entry == List().GetActiveFileEntry(nextActive);
        nextActive += active ? 1 : 0;
        if ((entry->GetFlagsIn() & OrvixFileSelection::Selected) != 0)
        {
            results.emplace_back(!ran ? Cancelled : active ? Done : Cleared);
        }
        else if (IsNamed(*entry) || (m_rule.Concerns(entry->GetFlagsOut()) && !IsProtected(*entry)))
        {
            results.emplace_back(Refused);
        }
        else
        {
            results.emplace_back(std::nullopt);
        }
    }
    return results;
}

bool OperationCommand::IsKept(OrvixFileListDialogParams& params)
{
    const bool dialogShown = (params.GetOptions() & OrvixDialogOption::EntriesCanBeCleared) != 0;
    if (dialogShown)
    {
        return (params.GetOptions() & OrvixDialogOption::OptionChecked) != 0;
    }
    return Arguments().keep || (m_rule.CanKeep() && Project().Services().GetPromptAction(m_rule.keepPrompt) ==
                                                        OrvixPromptAction::OptionChecked);
}

void OperationCommand::QueryConcerned()
{
    for (unsigned int i = 0; i < List().NumEntries(); ++i)
    {
        OrvixFileEntry* entry = List().GetFileEntry(i);
        if ((entry->GetFlagsIn() & OrvixFileSelection::Selected) != 0)
        {
            entry->SetFlagsIn(entry->GetFlagsIn() | FileMark::Concerned);
        }
    }
    QueryStatus(FileMark::Concerned);
}

bool OperationCommand::IsProtected(OrvixFileEntry& entry) const
{
    return m_rule.Protects(entry.GetFlagsOut()) && PathExists(entry.GetFile());
}

void OperationCommand::ExplainCancel()
{
    IOrvixServices& services = Project().Services();
    const std::uint32_t action = services.GetPromptAction(m_rule.dialogPrompt);
    if ((action & (OrvixPromptAction::Ask | OrvixPromptAction::Yes)) == 0)
    {
        const std::string id = std::to_string(m_rule.dialogPrompt);
        Results().Progress({});
        std::cerr << "orvix: the stored answer no cancels it. orvix prompts reset " << id
                  << " makes it ask again; a locked answer needs orvix prompts unlock " << id << " first\n";
    }
}

FileCommand::Result OperationCommand::ResultOf(OrvixFileEntry& entry, bool kept)
{
    const unsigned long flags = entry.GetFlagsOut();
    if (!PathExists(entry.GetFile()))
    {
        return Failed;
    }
    if (m_rule.IsReached(flags, kept))
    {
        return Done;
    }
    // A provider that knows no check-outs keeps none.
    const bool isStored = kept && Project().Provider().KeepsCheckedOut() && m_rule.IsReached(flags, false);
    m_notKept += isStored ? 1 : 0;
    return isStored ? Done : Failed;
}

void OperationCommand::ReportResults(const std::vector<std::optional<Result>>& results, bool kept)
{
    for (unsigned int i = 0; i < List().NumEntries(); ++i)
    {
        OrvixFileEntry* entry = List().GetFileEntry(i);
        const bool isProtected = IsProtected(*entry);
        if (!results[i])
        {
            isProtected ? CountProtected() : CountOtherState();
        }
        else if (*results[i] == Refused && isProtected)
        {
            Report(Refused, *entry);
            std::cerr << "orvix: " << Printable(entry->GetFile())
                      << " has your changes, which get would replace: use undo, or get --force\n";
        }
        else if (*results[i] == Done)
        {
            Report(ResultOf(*entry, kept), *entry);
        }
        else
        {
            Report(*results[i], *entry);
        }
    }
    if (m_notKept > 0)
    {
        std::cerr << "orvix: " << m_notKept << (m_notKept == 1 ? " file was" : " files were")
                  << " not kept checked out by the provider\n";
    }
}
