#pragma once

#include <cstdint>
#include <span>

/// A command that changes files: an operation of the library with its dialog and its two prompts.
struct FileCommand
{
    int id;                       ///< of the menu item
    const wchar_t* name;          ///< title of the dialog
    const wchar_t* message;       ///< above the files of the dialog
    std::uint32_t operation;      ///< bit of `OrvixOperation`
    unsigned long permission;     ///< bit of `OrvixFilePermission`: the files that fit
    std::int32_t dialogPrompt;    ///< prompt whose stored answer replaces the dialog
    std::uint32_t dialogAction;   ///< its first answer, bits of `OrvixPromptAction`
    std::uint32_t dialogOption;   ///< the option that the dialog offers, a bit of `OrvixDialogOption`; 0 for none
    std::int32_t optionPrompt;    ///< prompt that stores the option; `OrvixPromptID::Unset` for none
    const wchar_t* optionMeaning; ///< the option as a question
};

/// All commands, in the order of the menu.
std::span<const FileCommand> FileCommands();

/// The command of a menu item; null when it is of another kind.
const FileCommand* FindFileCommand(int id);

/// The prompt that asks whether the program ends with files checked out.
inline constexpr std::uint32_t ExitPrompt = 21;
