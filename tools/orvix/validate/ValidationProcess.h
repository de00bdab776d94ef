#pragma once

#include "ValidationRule.h"

#include <chrono>
#include <optional>
#include <set>
#include <string>

/// The result of a rule.
struct ValidationResult
{
    enum class Verdict
    {
        Pass,
        Fail,
        Skip
    };

    Verdict verdict;
    std::string reason; ///< UTF-8; for a rule that passes a remark, or empty
};

/// Checks each rule in a process of its own, so that a library that crashes or hangs fails one rule and nothing more.
/// The process is this program, started again with internal arguments.
class ValidationProcess
{
public:
    /// `library` is a full path. `limit` is the time for one call of the library. `projectTemplate`: a folder that is
    /// copied as the scratch project of each rule; empty for none.
    ValidationProcess(std::wstring library, bool isMSSCCI, std::chrono::seconds limit, std::wstring projectTemplate)
        : m_library(std::move(library)), m_isMSSCCI(isMSSCCI), m_limit(limit),
          m_projectTemplate(std::move(projectTemplate))
    {
    }

    /// Checks one rule on a scratch project. The process is ended at the time limit. Afterwards the scratch project is
    /// deleted, and every process that the library started is ended. An operation that hangs is not called again in
    /// later rules. Throws `ToolError` when no process can be started.
    ValidationResult Check(const ValidationRule& rule);

    /// Called in the started process: checks the rule, writes the result to the pipe and returns the exit code. Empty
    /// when these arguments of `wmain` are not those of such a process.
    static std::optional<int> RunAsChild(int count, wchar_t** arguments);

private:
    void AddHanging(const std::string& operation);

    std::wstring m_library;
    bool m_isMSSCCI;
    std::chrono::seconds m_limit;
    std::wstring m_projectTemplate;
    std::set<std::string> m_hanging; // operations that have hung
};
