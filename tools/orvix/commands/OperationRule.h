#pragma once

#include "OrvixFileFlags.h"
#include "OrvixOperation.h"
#include "OrvixPrompt.h"

#include <cstdint>

/// One command that runs through `IOrvixServices::RunFileListOperation`: what it asks, which files it concerns, and
/// which state a file must reach. States are bits of `OrvixFileState` and `OrvixFilePermission`.
struct OperationRule
{
    const wchar_t* title = nullptr;    ///< of the dialog
    const wchar_t* question = nullptr; ///< of the dialog
    std::uint32_t operation = 0;       ///< bit of `OrvixOperation`
    std::uint32_t allowedBy = 0;       ///< bit of `OrvixFilePermission`

    // Which files in a named folder the command concerns: those in the first state and in none of the others.
    unsigned long concerns = 0;
    unsigned long concernsNone = 0;

    /// States in which the command would discard work of the user: it leaves such files alone, unless it is forced.
    unsigned long protects = 0;

    // The state of a file after the command: in the first state and in none of the others.
    unsigned long leadsTo = 0;
    unsigned long ends = 0;
    unsigned long endsUnlessCheckedOut = 0; ///< a file that this user has checked out may keep these

    bool bringsBack = false; ///< the command brings files back that are missing on the disk

    std::uint32_t dialogPrompt = 0;                 ///< ID of the stored answer to the file-list dialog
    std::uint32_t keepPrompt = OrvixPromptID::None; ///< ID of the stored answer to "keep checked out", if offered

    bool CanKeep() const { return keepPrompt != OrvixPromptID::None; }

    /// Whether the command concerns a file in this state that was found in a folder.
    bool Concerns(unsigned long flags) const { return (flags & concerns) != 0 && (flags & concernsNone) == 0; }

    /// Whether the command would discard changes of the user in a file in this state, which is on the disk.
    bool Protects(unsigned long flags) const { return (flags & protects) != 0; }

    /// Whether a file in this state shows that the command was done. `kept`: it was to stay checked out.
    bool IsReached(unsigned long flags, bool kept) const;
};

/// The rules of the commands.
namespace OperationRules
{

/// Prompt IDs of this tool, different from those of other hosts that share the configuration folder.
inline constexpr std::uint32_t FirstPrompt = 0x4F525800;

inline constexpr OperationRule Add = {
    .title = L"Add",
    .question = L"Add these files?",
    .operation = OrvixOperation::Add,
    .allowedBy = OrvixFilePermission::Add,
    .concerns = OrvixFilePermission::Add, // a provider does not allow it for files of its own
    .leadsTo = OrvixFileState::Controlled,
    .ends = OrvixFileState::CheckedOut | OrvixFileState::Modified,
    .dialogPrompt = FirstPrompt,
    .keepPrompt = FirstPrompt + 1,
};

inline constexpr OperationRule CheckIn = {
    .title = L"Check in",
    .question = L"Check these files in?",
    .operation = OrvixOperation::CheckIn,
    .allowedBy = OrvixFilePermission::CheckIn,
    .concerns = OrvixFileState::CheckedOut,
    .leadsTo = OrvixFileState::Controlled,
    .ends = OrvixFileState::CheckedOut | OrvixFileState::Modified,
    .dialogPrompt = FirstPrompt + 2,
    .keepPrompt = FirstPrompt + 3,
};

inline constexpr OperationRule CheckOut = {
    .title = L"Check out",
    .question = L"Check these files out?",
    .operation = OrvixOperation::CheckOut,
    .allowedBy = OrvixFilePermission::CheckOut,
    .concerns = OrvixFileState::Controlled,
    .concernsNone = OrvixFileState::CheckedOut,
    .leadsTo = OrvixFileState::CheckedOut,
    .dialogPrompt = FirstPrompt + 4,
};

inline constexpr OperationRule UndoCheckOut = {
    .title = L"Undo check-out",
    .question = L"Discard the changes in these files?",
    .operation = OrvixOperation::UndoCheckOut,
    .allowedBy = OrvixFilePermission::UndoCheckOut,
    .concerns = OrvixFileState::CheckedOut,
    .leadsTo = OrvixFileState::Controlled,
    .ends = OrvixFileState::CheckedOut | OrvixFileState::Modified,
    .bringsBack = true,
    .dialogPrompt = FirstPrompt + 5,
};

inline constexpr OperationRule GetLatest = {
    .title = L"Get latest version",
    .question = L"Get the latest versions of these files?",
    .operation = OrvixOperation::GetLatest,
    .allowedBy = OrvixFilePermission::GetLatest,
    .concerns = OrvixFileState::Controlled,
    .protects = OrvixFileState::CheckedOut | OrvixFileState::Modified,
    .leadsTo = OrvixFileState::Controlled,
    .ends = OrvixFileState::OutOfDate,
    .endsUnlessCheckedOut = OrvixFileState::Modified,
    .bringsBack = true,
    .dialogPrompt = FirstPrompt + 6,
};

} // namespace OperationRules
