#pragma once

#include "OrvixProviderOption.h"
#include "ValidationProvider.h"

#include <functional>
#include <string>
#include <vector>

/// An operation of a provider on files, with its options where it has any (bits of `OrvixProviderOption`).
struct ValidationOperation
{
    const char* name;
    std::function<int(IOrvixProvider&, OrvixFileList*, const wchar_t* comment)> run;

    static ValidationOperation QueryStatus();
    static ValidationOperation Add(unsigned long options = 0);
    static ValidationOperation CheckOut(unsigned long options = 0);
    static ValidationOperation CheckIn(unsigned long options = 0);
    static ValidationOperation UndoCheckOut(unsigned long options = 0);
    static ValidationOperation GetLatest(unsigned long options = 0);
    static ValidationOperation ShowHistory();
    static ValidationOperation ShowProperties();

    /// Each operation that shows no windows, once and without options.
    static std::vector<ValidationOperation> Silent();

    /// The operations that take files through all states, with the same options each. None shows windows.
    static std::vector<ValidationOperation> Scenario(unsigned long options);

    /// The options that RunFileListOperation passes, to all operations alike.
    static constexpr unsigned long AllOptions[] = {
        0,
        OrvixProviderOption::KeepCheckedOut,
        OrvixProviderOption::GetLatest,
        OrvixProviderOption::NoDialog,
        OrvixProviderOption::NoDialog | OrvixProviderOption::KeepCheckedOut,
        OrvixProviderOption::NoDialog | OrvixProviderOption::GetLatest,
    };

    static constexpr const wchar_t* UsualComment = L"validation";

    /// Runs the operation on a list and returns its result. `on` ends its name in messages. Throws `RuleBroken` for an
    /// exception.
    int Run(ValidationSubject& subject, ValidationProvider& provider, OrvixFileList* list, const std::string& on = "",
            const wchar_t* comment = UsualComment) const;
};
