#pragma once

#include "ParentLink.h"
#include "ValidationRule.h"

#include <set>
#include <string>
#include <string_view>

/// The library under validation, in the process that checks one rule: its path and a scratch folder. Each step is sent
/// to the validating process before it is done, so that this one knows what a library was called for when it crashed or
/// hung.
class ValidationSubject
{
public:
    /// `scratch` is a folder that is empty or contains the project. `hanging`: operations that have hung in another
    /// rule; a rule that comes to one of them is skipped.
    ValidationSubject(std::wstring library, bool isMSSCCI, const std::wstring& scratch, std::set<std::string> hanging);

    /// Full path.
    const std::wstring& Library() const { return m_library; }
    bool IsMSSCCI() const { return m_isMSSCCI; }

    /// The folder of the project.
    const std::wstring& Project() const { return m_project; }

    /// An empty folder for files outside the project.
    const std::wstring& Outside() const { return m_outside; }

    /// Makes or replaces a file of the project. Returns its full path.
    std::wstring Write(const std::wstring& name, std::string_view text) const;

    /// Calls into the library and returns its result. `what` is sent to the validating process before the call. Throws
    /// `RuleBroken` for an exception of the library; `work` throws nothing of its own.
    template <typename Work>
    auto Call(const std::string& what, Work work)
    {
        SkipWhatHangs(what);
        ParentLink::Send(ParentLink::Step, what);
        try
        {
            return work();
        }
        catch (...)
        {
            throw RuleBroken(what + " throws an exception");
        }
    }

    /// Adds a remark to the result of a rule that is kept.
    void Remark(const std::string& text) { ParentLink::Send(Note, text); }

    // The words of the lines to the validating process. A line that starts with one of the last three is the last line.
    static constexpr std::string_view Note = "note";
    static constexpr std::string_view Pass = "pass";
    static constexpr std::string_view Fail = "fail";
    static constexpr std::string_view Skip = "skip";

    /// The name of the operation in the announcement of a call.
    static std::string OperationOf(const std::string& what) { return what.substr(0, what.find(' ')); }

private:
    /// Throws `RuleSkipped` for an operation that hangs.
    void SkipWhatHangs(const std::string& what) const;

    std::wstring m_library;
    bool m_isMSSCCI;
    std::wstring m_project;
    std::wstring m_outside;
    std::set<std::string> m_hanging;
};
