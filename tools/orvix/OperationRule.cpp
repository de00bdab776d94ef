#include "OperationRule.h"

#include "FileState.h"

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
        .operation = 0x4,
        .allowedBy = FileState::AllowsAdd,
        .concerns = FileState::NotControlled,
        .leadsTo = FileState::Controlled,
        .ends = FileState::CheckedOut | FileState::Modified,
        .dialogPrompt = FirstPrompt,
        .keepPrompt = FirstPrompt + 1,
    },
    {
        .command = L"checkin",
        .title = L"Check in",
        .question = L"Check these files in?",
        .operation = 0x2,
        .allowedBy = FileState::AllowsCheckIn,
        .concerns = FileState::CheckedOut,
        .leadsTo = FileState::Controlled,
        .ends = FileState::CheckedOut | FileState::Modified,
        .dialogPrompt = FirstPrompt + 2,
        .keepPrompt = FirstPrompt + 3,
    },
    {
        .command = L"checkout",
        .title = L"Check out",
        .question = L"Check these files out?",
        .operation = 0x10,
        .allowedBy = FileState::AllowsCheckOut,
        .concerns = FileState::Controlled,
        .concernsNone = FileState::CheckedOut,
        .leadsTo = FileState::CheckedOut,
        .dialogPrompt = FirstPrompt + 4,
    },
    {
        .command = L"undo",
        .title = L"Undo check-out",
        .question = L"Give these files back unchanged?",
        .operation = 0x20,
        .allowedBy = FileState::AllowsUndo,
        .concerns = FileState::CheckedOut,
        .leadsTo = FileState::Controlled,
        .ends = FileState::CheckedOut | FileState::Modified,
        .dialogPrompt = FirstPrompt + 5,
    },
    {
        .command = L"get",
        .title = L"Get latest version",
        .question = L"Get the latest versions of these files?",
        .operation = 0x8,
        .allowedBy = FileState::AllowsGet,
        .concerns = FileState::Controlled,
        .leadsTo = FileState::Controlled,
        .ends = FileState::OutOfDate,
        .endsUnheld = FileState::Modified,
        .dialogPrompt = FirstPrompt + 6,
    },
};

} // namespace

bool OperationRule::IsReached(unsigned long flags, bool kept) const
{
    const unsigned long held = flags & FileState::CheckedOut;
    const unsigned long ended = (kept ? ends & ~FileState::CheckedOut : ends) | (held != 0 ? 0 : endsUnheld);
    return (flags & leadsTo) != 0 && (flags & ended) == 0 && (!kept || held != 0);
}

const OperationRule* OperationRule::Find(const std::wstring& command)
{
    const auto* found = std::find_if(std::begin(Rules), std::end(Rules),
                                     [&](const OperationRule& rule) { return command == rule.command; });
    return found == std::end(Rules) ? nullptr : found;
}
