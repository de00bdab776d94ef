#pragma once

#include "ValidationRule.h"

#include <chrono>
#include <optional>
#include <string>

/// What became of a rule.
struct ValidationResult
{
    enum class Verdict
    {
        Pass,
        Fail,
        Skip
    };

    Verdict verdict;
    std::string reason; ///< UTF-8; may be empty for a rule that is kept
};

/// Checks rules in processes of their own, so that a library that crashes or hangs is a finding and no more: this
/// program, started once more with arguments that only it knows.
class ValidationProcess
{
public:
    /// `library` is a full path.
    ValidationProcess(std::wstring library, bool isMSSCCI, std::chrono::seconds limit)
        : m_library(std::move(library)), m_isMSSCCI(isMSSCCI), m_limit(limit)
    {
    }

    /// Checks one rule on a scratch project, which is gone afterwards, as is every process that the library started. At
    /// the time limit the process is ended. Throws `ToolError` when no process can be made.
    ValidationResult Check(const ValidationRule& rule) const;

    /// The started process's side: nothing when these arguments of `wmain` are not those of such a process, otherwise
    /// its exit code, after the rule was checked and the pipe has the result.
    static std::optional<int> RunAsChild(int count, wchar_t** arguments);

private:
    std::wstring m_library;
    bool m_isMSSCCI;
    std::chrono::seconds m_limit;
};
