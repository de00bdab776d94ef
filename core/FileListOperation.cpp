#include "FileListOperation.h"

#include "ExceptionBarrier.h"
#include "GuardedBroadcast.h"
#include "IOrvixCoreUI.h"
#include "IOrvixProvider.h"
#include "OrvixDialogOption.h"
#include "OrvixFileEntry.h"
#include "OrvixFileFlags.h"
#include "OrvixFileList.h"
#include "OrvixFileListDialogParams.h"
#include "OrvixNotificationID.h"
#include "OrvixNotifyParams.h"
#include "OrvixOperation.h"
#include "OrvixPrompt.h"
#include "OrvixProviderOption.h"
#include "StoredAnswers.h"
#include "UserInterface.h"

#include <vector>

namespace
{

constexpr std::uint32_t AnyProviderCall = OrvixOperation::CheckIn | OrvixOperation::Add | OrvixOperation::GetLatest |
                                          OrvixOperation::CheckOut | OrvixOperation::UndoCheckOut;

struct NotificationIDs
{
    std::uint32_t operation;
    std::uint32_t before;
    std::uint32_t after;
};

/// The first row with a requested operation gives the identifiers.
constexpr NotificationIDs Notifications[] = {
    {OrvixOperation::CheckIn, OrvixNotificationID::BeforeCheckIn, OrvixNotificationID::AfterCheckIn},
    {OrvixOperation::Add, OrvixNotificationID::BeforeAdd, OrvixNotificationID::AfterAdd},
    {OrvixOperation::GetLatest, OrvixNotificationID::BeforeGetLatest, OrvixNotificationID::AfterGetLatest},
    {OrvixOperation::CheckOut, OrvixNotificationID::BeforeCheckOut, OrvixNotificationID::AfterCheckOut},
    {OrvixOperation::UndoCheckOut, OrvixNotificationID::BeforeUndoCheckOut, OrvixNotificationID::AfterUndoCheckOut},
};

const NotificationIDs* IDsFor(std::uint32_t operations)
{
    if ((operations & OrvixOperation::Notify) != 0)
    {
        for (const NotificationIDs& ids : Notifications)
        {
            if ((operations & ids.operation) != 0)
            {
                return &ids;
            }
        }
    }
    return nullptr;
}

/// A listener that throws counts as one that gives the last answer.
std::uint32_t Broadcast(std::uint32_t id, OrvixFileList& list, bool cancelled,
                        std::uint32_t answerForException = OrvixListenerAnswer::Accept)
{
    OrvixNotifyParams params;
    params.SetID(id);
    params.SetOrvixFileList(&list);
    params.SetCancelled(cancelled);
    return BroadcastGuarded(params, answerForException);
}

void RemoveActiveEntries(OrvixFileList& list, const std::vector<OrvixFileEntry*>& entries)
{
    for (OrvixFileEntry* entry : entries)
    {
        list.RemoveActiveEntry(entry);
    }
}

} // namespace

FileListOperation::FileListOperation(StoredAnswers& answers, UserInterface& userInterface, void* dialogArgument,
                                     OrvixFileListDialogParams& params, OrvixFileList& list, IOrvixProvider* provider,
                                     std::uint32_t operations)
    : m_answers(answers), m_userInterface(userInterface), m_dialogArgument(dialogArgument), m_params(params),
      m_list(list), m_provider(provider), m_operations(operations),
      m_dialogPrompt(static_cast<std::uint32_t>(params.GetDialogPromptID())),
      m_optionPrompt(static_cast<std::uint32_t>(params.GetOptionPromptID()))
{
}

std::int32_t FileListOperation::Run(bool callProviderFirst, std::uint32_t flagsOutMask)
{
    if (callProviderFirst)
    {
        if (m_provider == nullptr)
        {
            return OrvixOperationResult::Cancelled;
        }
        Completes([&] { m_provider->QueryStatus(&m_list, 0); });
    }
    if (m_list.NumActiveEntries() == 0)
    {
        return OrvixOperationResult::Done;
    }
    if (m_provider == nullptr && (m_operations & AnyProviderCall) != 0)
    {
        return OrvixOperationResult::Cancelled;
    }
    if (!KeepFittingEntries(flagsOutMask))
    {
        return OrvixOperationResult::Done;
    }
    if (NotifyBefore(false))
    {
        return OrvixOperationResult::Cancelled;
    }

    // A dialog or a host that throws has cancelled, and nothing is remembered.
    const Confirmation confirmation =
        WithBarrier(Confirmation{OrvixOperationResult::Cancelled, false}, [this] { return Confirm(); });
    if (confirmation.result == OrvixOperationResult::Cancelled)
    {
        NotifyBefore(true);
        return OrvixOperationResult::Cancelled;
    }
    if (confirmation.run)
    {
        CallProvider();
        NotifyAfter();
    }
    return confirmation.result;
}

/// Selects the active entries whose state fits and removes the others; false, with nothing removed, when
/// none fits.
bool FileListOperation::KeepFittingEntries(std::uint32_t flagsOutMask)
{
    bool anyFits = false;
    std::vector<OrvixFileEntry*> others;
    for (unsigned int i = 0; i < m_list.NumActiveEntries(); ++i)
    {
        OrvixFileEntry* entry = m_list.GetActiveFileEntry(i);
        if (entry == nullptr)
        {
            continue;
        }
        if ((entry->GetFlagsOut() & flagsOutMask) != 0)
        {
            entry->SetFlagsIn(entry->GetFlagsIn() | OrvixFileSelection::Selected);
            anyFits = true;
        }
        else
        {
            others.push_back(entry);
        }
    }
    if (anyFits)
    {
        RemoveActiveEntries(m_list, others);
    }
    return anyFits;
}

/// Removes the entries that the user cleared in the dialog.
void FileListOperation::RemoveClearedEntries()
{
    std::vector<OrvixFileEntry*> cleared;
    for (unsigned int i = 0; i < m_list.NumActiveEntries(); ++i)
    {
        OrvixFileEntry* entry = m_list.GetActiveFileEntry(i);
        if (entry != nullptr && (entry->GetFlagsOut() & OrvixFileSelection::Confirmed) == 0)
        {
            cleared.push_back(entry);
        }
    }
    RemoveActiveEntries(m_list, cleared);
}

/// Confirms by the stored answer, or by the dialog where the user is to be asked.
FileListOperation::Confirmation FileListOperation::Confirm()
{
    if (m_dialogPrompt == OrvixPromptID::None)
    {
        return ShowDialog(false);
    }

    const bool locked = m_answers.IsLocked(m_dialogPrompt);
    const std::uint32_t action = m_answers.GetAction(m_dialogPrompt);
    const bool ask = (action & OrvixPromptAction::Ask) != 0;
    std::uint32_t optionAction = 0;
    if (!ask && m_optionPrompt != OrvixPromptID::None)
    {
        optionAction = m_answers.GetAction(m_optionPrompt);
    }
    if (ask && !m_userInterface.IsUnattended())
    {
        return ShowDialog(locked);
    }

    if ((action & OrvixPromptAction::Yes) == 0)
    {
        return {OrvixOperationResult::Cancelled, false};
    }
    m_mode = OrvixProviderOption::NoDialog;
    if (optionAction == OrvixPromptAction::OptionChecked)
    {
        m_mode |= OfferedOption();
    }
    return {OrvixOperationResult::Done, true};
}

FileListOperation::Confirmation FileListOperation::ShowDialog(bool locked)
{
    const std::uint32_t options = m_params.GetOptions() | OrvixDialogOption::EntriesCanBeCleared;
    m_params.SetOptions(locked ? options & ~OrvixDialogOption::OfferRemember : options);
    const std::int32_t result = m_userInterface.CoreUI().ShowFileListDialog(m_dialogArgument, &m_params);

    bool run = false;
    if (result == OrvixDialogResult::Confirmed)
    {
        RemoveClearedEntries();
        if ((m_operations & OrvixOperation::Notify) != 0)
        {
            Broadcast(OrvixNotificationID::FilesConfirmed, m_list, false);
        }
        run = m_list.NumActiveEntries() > 0;
        if (run && HasOption(OrvixDialogOption::OptionChecked))
        {
            m_mode = OfferedOption();
        }
    }
    if (HasOption(OrvixDialogOption::RememberChecked))
    {
        StoreAnswers(result);
    }
    return {result, run};
}

void FileListOperation::StoreAnswers(std::int32_t result)
{
    if (m_dialogPrompt != OrvixPromptID::None)
    {
        const bool confirmed = result == OrvixDialogResult::Confirmed;
        m_answers.SetAction(m_dialogPrompt, confirmed ? OrvixPromptAction::Yes : OrvixPromptAction::No);
    }
    if (m_optionPrompt != OrvixPromptID::None)
    {
        const bool checked = HasOption(OrvixDialogOption::OptionChecked);
        m_answers.SetAction(m_optionPrompt,
                            checked ? OrvixPromptAction::OptionChecked : OrvixPromptAction::OptionCleared);
    }
}

/// Whether the record's options have a bit. Read each time, since the dialog and listeners change them.
bool FileListOperation::HasOption(std::uint32_t bit)
{
    return (m_params.GetOptions() & bit) != 0;
}

/// The provider's option for what the dialog offers; keeping the files checked out goes first.
unsigned long FileListOperation::OfferedOption()
{
    if (HasOption(OrvixDialogOption::OfferKeepCheckedOut))
    {
        return OrvixProviderOption::KeepCheckedOut;
    }
    return HasOption(OrvixDialogOption::OfferGetLatest) ? OrvixProviderOption::GetLatest : 0;
}

/// Runs each operation that is asked for. One that throws has failed, and the next one runs, as after a failure.
void FileListOperation::CallProvider()
{
    const wchar_t* comment = m_params.GetComment();
    const auto run = [this](std::uint32_t operation, const auto& call) {
        if ((m_operations & operation) != 0)
        {
            Completes(call);
        }
    };
    run(OrvixOperation::Add, [&] { m_provider->Add(&m_list, comment, m_mode); });
    run(OrvixOperation::CheckIn, [&] { m_provider->CheckIn(&m_list, comment, m_mode); });
    run(OrvixOperation::GetLatest, [&] { m_provider->GetLatest(&m_list, m_mode); });
    run(OrvixOperation::CheckOut, [&] { m_provider->CheckOut(&m_list, comment, m_mode); });
    run(OrvixOperation::UndoCheckOut, [&] { m_provider->UndoCheckOut(&m_list, m_mode); });
}

/// True when a listener vetoed; one that throws counts as a veto while something can still be stopped.
bool FileListOperation::NotifyBefore(bool cancelled)
{
    const NotificationIDs* ids = IDsFor(m_operations);
    const std::uint32_t answerForException = cancelled ? OrvixListenerAnswer::Accept : OrvixListenerAnswer::Veto;
    return ids != nullptr && Broadcast(ids->before, m_list, cancelled, answerForException) == OrvixListenerAnswer::Veto;
}

void FileListOperation::NotifyAfter()
{
    if (const NotificationIDs* ids = IDsFor(m_operations))
    {
        Broadcast(ids->after, m_list, false);
    }
}
