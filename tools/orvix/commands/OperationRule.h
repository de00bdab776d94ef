#pragma once

#include "OrvixPrompt.h"

#include <cstdint>
#include <string>

/// One command that runs through `IOrvixServices::RunFileListOperation`: what it asks for, and how to see
/// from the files' states (bits of `OrvixFileState`) that it came about.
struct OperationRule
{
    const wchar_t* command = nullptr;
    const wchar_t* title = nullptr;
    const wchar_t* question = nullptr;
    std::uint32_t operation = 0; ///< bit of the operation
    std::uint32_t allowedBy = 0; ///< state that allows it

    unsigned long concerns = 0;     ///< state that makes the command concern a file found in a folder, ...
    unsigned long concernsNone = 0; ///< ... and states in which it does not

    unsigned long leadsTo = 0;    ///< state of a file afterwards
    unsigned long ends = 0;       ///< states that it must have lost, ...
    unsigned long endsUnheld = 0; ///< ... and those that only a file checked out by this user may keep

    std::uint32_t dialogPrompt = 0; ///< ID of the stored answer to the file-list dialog
    std::uint32_t keepPrompt =
        OrvixPromptID::None; ///< ID of the stored answer to "keep checked out", where that is offered

    bool CanKeep() const { return keepPrompt != OrvixPromptID::None; }

    /// Whether a file that was found in a folder is meant by the command.
    bool Concerns(unsigned long flags) const { return (flags & concerns) != 0 && (flags & concernsNone) == 0; }

    /// Whether a file in this state shows that the command was carried out on it. `kept`: it was to stay
    /// checked out.
    bool IsReached(unsigned long flags, bool kept) const;

    /// The rule of a command; null when it is none of these.
    static const OperationRule* Find(const std::wstring& command);
};
