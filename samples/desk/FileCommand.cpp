#include "FileCommand.h"

#include "OrvixDialogOption.h"
#include "OrvixFileFlags.h"
#include "OrvixOperation.h"
#include "OrvixPrompt.h"
#include "resource.h"

#include <algorithm>

namespace
{

// Asked, and yes when nobody is there. What loses changes is not done when nobody is there.
constexpr std::uint32_t YesByDefault = OrvixPromptAction::Ask | OrvixPromptAction::Yes;
constexpr std::uint32_t NoByDefault = OrvixPromptAction::Ask | OrvixPromptAction::No;

constexpr FileCommand Commands[] = {
    {ID_ADD, L"Add", L"These files will be put under source control.", OrvixOperation::Add, OrvixFilePermission::Add, 1,
     YesByDefault, OrvixDialogOption::OfferKeepCheckedOut, 11, L"keep the files checked out"},
    {ID_CHECK_OUT, L"Check out", L"These files will be checked out.", OrvixOperation::CheckOut,
     OrvixFilePermission::CheckOut, 2, YesByDefault, OrvixDialogOption::OfferGetLatest, 12, L"get the latest version"},
    {ID_CHECK_IN, L"Check in", L"These files will be checked in. Clear those that stay as they are.",
     OrvixOperation::CheckIn, OrvixFilePermission::CheckIn, 3, YesByDefault, OrvixDialogOption::OfferKeepCheckedOut, 13,
     L"keep the files checked out"},
    {ID_UNDO, L"Undo check-out", L"The changes in these files will be lost.", OrvixOperation::UndoCheckOut,
     OrvixFilePermission::UndoCheckOut, 4, NoByDefault, OrvixDialogOption::OfferGetLatest, 14,
     L"get the latest version"},
    {ID_GET_LATEST, L"Get latest", L"The latest versions of these files will be fetched.", OrvixOperation::GetLatest,
     OrvixFilePermission::GetLatest, 5, YesByDefault, 0, OrvixPromptID::Unset, L""},
};

} // namespace

std::span<const FileCommand> FileCommands()
{
    return Commands;
}

const FileCommand* FindFileCommand(int id)
{
    const auto* found =
        std::find_if(std::begin(Commands), std::end(Commands), [id](const auto& command) { return command.id == id; });
    return found != std::end(Commands) ? found : nullptr;
}
