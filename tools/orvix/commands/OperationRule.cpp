#include "OperationRule.h"

#include "OrvixFileFlags.h"
#include "OrvixOperation.h"

#include <algorithm>
#include <iterator>

namespace
{

// Prompt IDs of this tool, apart from those of other hosts that share the configuration folder.
constexpr std::uint32_t FirstPrompt = 0x4F525800;

constexpr OperationRule Rules[] = {
    {
        .command = L"add",
        .title = L"Add",
        .question = L"Add these files?",
        .operation = OrvixOperation::Add,
        .allowedBy = OrvixFilePermission::Add,
        .concerns = OrvixFileState::NotControlled,
        .leadsTo = OrvixFileState::Controlled,
        .ends = OrvixFileState::CheckedOut | OrvixFileState::Modified,
        .dialogPrompt = FirstPrompt,
        .keepPrompt = FirstPrompt + 1,
    },
    {
        .command = L"checkin",
        .title = L"Check in",
        .question = L"Check these files in?",
        .operation = OrvixOperation::CheckIn,
        .allowedBy = OrvixFilePermission::CheckIn,
        .concerns = OrvixFileState::CheckedOut,
        .leadsTo = OrvixFileState::Controlled,
        .ends = OrvixFileState::CheckedOut | OrvixFileState::Modified,
        .dialogPrompt = FirstPrompt + 2,
        .keepPrompt = FirstPrompt + 3,
    },
    {
        .command = L"checkout",
        .title = L"Check out",
        .question = L"Check these files out?",
        .operation = OrvixOperation::CheckOut,
        .allowedBy = OrvixFilePermission::CheckOut,
        .concerns = OrvixFileState::Controlled,
        .concernsNone = OrvixFileState::CheckedOut,
        .leadsTo = OrvixFileState::CheckedOut,
        .dialogPrompt = FirstPrompt + 4,
    },
    {
        .command = L"undo",
        .title = L"Undo check-out",
        .question = L"Give these files back unchanged?",
        .operation = OrvixOperation::UndoCheckOut,
        .allowedBy = OrvixFilePermission::UndoCheckOut,
        .concerns = OrvixFileState::CheckedOut,
        .leadsTo = OrvixFileState::Controlled,
        .ends = OrvixFileState::CheckedOut | OrvixFileState::Modified,
        .dialogPrompt = FirstPrompt + 5,
    },
    {
        .command = L"get",
        .title = L"Get latest version",
        .question = L"Get the latest versions of these files?",
        .operation = OrvixOperation::GetLatest,
        .allowedBy = OrvixFilePermission::GetLatest,
        .concerns = OrvixFileState::Controlled,
        .leadsTo = OrvixFileState::Controlled,
        .ends = OrvixFileState::OutOfDate,
        .endsUnheld = OrvixFileState::Modified,
        .dialogPrompt = FirstPrompt + 6,
    },
};

} // namespace

bool OperationRule::IsReached(unsigned long flags, bool kept) const
{
    const unsigned long held = flags & OrvixFileState::CheckedOut;
    const unsigned long ended = (kept ? ends & ~OrvixFileState::CheckedOut : ends) | (held != 0 ? 0 : endsUnheld);
    return (flags & leadsTo) != 0 && (flags & ended) == 0 && (!kept || held != 0);
}

const OperationRule* OperationRule::Find(const std::wstring& command)
{
    const auto* found = std::find_if(std::begin(Rules), std::end(Rules),
                                     [&](const OperationRule& rule) { return command == rule.command; });
    return found == std::end(Rules) ? nullptr : found;
}
