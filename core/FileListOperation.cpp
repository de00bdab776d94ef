#include "FileListOperation.h"

#include "IOrvixCoreUI.h"
#include "IOrvixProvider.h"
#include "OrvixFileEntry.h"
#include "OrvixFileList.h"
#include "OrvixFileListDialogParams.h"
#include "OrvixNotification.h"
#include "OrvixNotifyParams.h"
#include "OrvixServices.h"
#include "PromptAction.h"

#include <array>
#include <vector>

namespace
{

constexpr std::int32_t Cancelled = 0;
constexpr std::int32_t Done = 1;
constexpr std::uint32_t Vetoed = 1;

// Bits of `operations`.
constexpr std::uint32_t Notify = 0x1;
constexpr std::uint32_t CheckIn = 0x2;
constexpr std::uint32_t Add = 0x4;
constexpr std::uint32_t GetLatest = 0x8;
constexpr std::uint32_t CheckOut = 0x10;
constexpr std::uint32_t UndoCheckOut = 0x20;
constexpr std::uint32_t AnyProviderCall = CheckIn | Add | GetLatest | CheckOut | UndoCheckOut;

// Bits of the record's options.
constexpr std::uint32_t DialogShown = 0x1;
constexpr std::uint32_t OptionKeepsCheckedOut = 0x4;
constexpr std::uint32_t OptionGetsLatest = 0x8;
constexpr std::uint32_t OptionTicked = 0x10;
constexpr std::uint32_t RememberOffered = 0x40;
constexpr std::uint32_t RememberTicked = 0x80;

constexpr unsigned long Selected = 0x1; // bit of FlagsIn
constexpr unsigned long Ticked = 0x2;   // bit of FlagsOut behind the dialog

constexpr std::uint32_t FilesConfirmed = 27; // notification behind the dialog

struct NotificationIds
{
    std::uint32_t operation;
    std::uint32_t before;
    std::uint32_t after;
};

/// The first row whose operation is asked for gives the identifiers.
constexpr std::array<NotificationIds, 5> Notifications = {
    {{CheckIn, 13, 14}, {Add, 19, 20}, {GetLatest, 21, 22}, {CheckOut, 15, 16}, {UndoCheckOut, 17, 18}}};

const NotificationIds* IdsFor(std::uint32_t operations)
{
    if (operations & Notify)
    {
        for (const NotificationIds& ids : Notifications)
        {
            if (operations & ids.operation)
            {
                return &ids;
            }
        }
    }
    return nullptr;
}

std::uint32_t Broadcast(std::uint32_t id, OrvixFileList& list, bool cancelled)
{
    OrvixNotifyParams params;
    params.SetID(id);
    params.SetOrvixFileList(&list);
    params.SetCancelled(cancelled);
    return OrvixNotification::BroadcastOrvixNotification(&params);
}

void RemoveActiveEntries(OrvixFileList& list, const std::vector<OrvixFileEntry*>& entries)
{
    for (OrvixFileEntry* entry : entries)
    {
        list.RemoveActiveEntry(entry);
    }
}

} // namespace

FileListOperation::FileListOperation(OrvixServices& services, void* dialogArgument, OrvixFileListDialogParams& params,
                                     OrvixFileList& list, IOrvixProvider* provider, std::uint32_t operations)
    : m_services(services), m_dialogArgument(dialogArgument), m_params(params), m_list(list), m_provider(provider),
      m_operations(operations), m_dialogPrompt(static_cast<std::uint32_t>(params.GetDialogPromptID())),
      m_optionPrompt(static_cast<std::uint32_t>(params.GetOptionPromptID()))
{
}

std::int32_t FileListOperation::Run(bool callProviderFirst, std::uint32_t flagsOutMask)
{
    if (callProviderFirst)
    {
        if (m_provider == nullptr)
        {
            return Cancelled;
        }
        m_provider->QueryStatus(&m_list, 0);
    }
    if (m_list.NumActiveEntries() == 0)
    {
        return Done;
    }
    if (m_provider == nullptr && (m_operations & AnyProviderCall))
    {
        return Cancelled;
    }
    if (!KeepFittingEntries(flagsOutMask))
    {
        return Done;
    }
    if (NotifyBefore(false))
    {
        return Cancelled;
    }

    const Confirmation confirmation = Confirm();
    if (confirmation.result == Cancelled)
    {
        NotifyBefore(true);
        return Cancelled;
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
        if (entry->GetFlagsOut() & flagsOutMask)
        {
            entry->SetFlagsIn(entry->GetFlagsIn() | Selected);
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

void FileListOperation::RemoveUntickedEntries()
{
    std::vector<OrvixFileEntry*> unticked;
    for (unsigned int i = 0; i < m_list.NumActiveEntries(); ++i)
    {
        OrvixFileEntry* entry = m_list.GetActiveFileEntry(i);
        if (entry != nullptr && !(entry->GetFlagsOut() & Ticked))
        {
            unticked.push_back(entry);
        }
    }
    RemoveActiveEntries(m_list, unticked);
}

/// Confirms by the stored answer, or by the dialog where the user is to be asked.
FileListOperation::Confirmation FileListOperation::Confirm()
{
    if (m_dialogPrompt == PromptAction::NoPrompt)
    {
        return ShowDialog(false);
    }

    const bool locked = m_services.IsPromptLocked(m_dialogPrompt);
    const std::uint32_t action = m_services.GetPromptAction(m_dialogPrompt);
    const bool ask = (action & PromptAction::Ask) != 0;
    std::uint32_t optionAction = 0;
    if (!ask && m_optionPrompt != PromptAction::NoPrompt)
    {
        optionAction = m_services.GetPromptAction(m_optionPrompt);
    }
    if (ask && !m_services.IsUnattended())
    {
        return ShowDialog(locked);
    }

    if (!(action & PromptAction::Answer1))
    {
        return {Cancelled, false};
    }
    m_mode = 4;
    if (optionAction == PromptAction::Answer2)
    {
        m_mode = m_params.GetOptions() & OptionKeepsCheckedOut ? 5 : m_params.GetOptions() & OptionGetsLatest ? 6 : 4;
    }
    return {Done, true};
}

FileListOperation::Confirmation FileListOperation::ShowDialog(bool locked)
{
    const std::uint32_t options = m_params.GetOptions() | DialogShown;
    m_params.SetOptions(locked ? options & ~RememberOffered : options);
    const std::int32_t result = m_services.CoreUI().ShowFileListDialog(m_dialogArgument, &m_params);

    bool run = false;
    if (result == Done)
    {
        RemoveUntickedEntries();
        if (m_operations & Notify)
        {
            Broadcast(FilesConfirmed, m_list, false);
        }
        run = m_list.NumActiveEntries() > 0;
        if (run && (m_params.GetOptions() & OptionTicked))
        {
            m_mode = m_params.GetOptions() & OptionKeepsCheckedOut ? 1
                     : m_params.GetOptions() & OptionGetsLatest    ? 2
                                                                   : m_mode;
        }
    }
    if (m_params.GetOptions() & RememberTicked)
    {
        StoreAnswers(result);
    }
    return {result, run};
}

void FileListOperation::StoreAnswers(std::int32_t result)
{
    if (m_dialogPrompt != PromptAction::NoPrompt)
    {
        m_services.SetPromptAction(m_dialogPrompt, result == Done ? PromptAction::Answer1 : PromptAction::Answer0);
    }
    if (m_optionPrompt != PromptAction::NoPrompt)
    {
        m_services.SetPromptAction(m_optionPrompt, m_params.GetOptions() & OptionTicked ? PromptAction::Answer2
                                                                                        : PromptAction::Answer3);
    }
}

void FileListOperation::CallProvider()
{
    const wchar_t* comment = m_params.GetComment();
    if (m_operations & Add)
    {
        m_provider->Add(&m_list, comment, m_mode);
    }
    if (m_operations & CheckIn)
    {
        m_provider->CheckIn(&m_list, comment, m_mode);
    }
    if (m_operations & GetLatest)
    {
        m_provider->GetLatest(&m_list, m_mode);
    }
    if (m_operations & CheckOut)
    {
        m_provider->CheckOut(&m_list, comment, m_mode);
    }
    if (m_operations & UndoCheckOut)
    {
        m_provider->UndoCheckOut(&m_list, m_mode);
    }
}

/// True when a listener vetoed.
bool FileListOperation::NotifyBefore(bool cancelled)
{
    const NotificationIds* ids = IdsFor(m_operations);
    return ids != nullptr && Broadcast(ids->before, m_list, cancelled) == Vetoed;
}

void FileListOperation::NotifyAfter()
{
    if (const NotificationIds* ids = IdsFor(m_operations))
    {
        Broadcast(ids->after, m_list, false);
    }
}
