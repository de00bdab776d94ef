#pragma once

#include "ValidationRule.h"

#include <windows.h>

#include <string>
#include <string_view>

/// The library under validation, as a rule meets it in its own process: where it lies, a scratch folder to work in, and
/// the pipe to the validating process, which learns from it what was going on when the library crashed or hung.
class ValidationSubject
{
public:
    /// `scratch` is an empty folder, `pipe` is written to and not owned.
    ValidationSubject(std::wstring library, bool isMSSCCI, const std::wstring& scratch, HANDLE pipe);

    const std::wstring& Library() const { return m_library; }
    bool IsMSSCCI() const { return m_isMSSCCI; }

    /// The folder of the project.
    const std::wstring& Project() const { return m_project; }

    /// An empty folder for everything that the project does not hold.
    const std::wstring& Outside() const { return m_outside; }

    /// Makes or replaces a file of the project. Returns its full path.
    std::wstring Write(const std::wstring& name, std::string_view text) const;

    /// Calls into the library: tells the validating process beforehand, and throws `RuleBroken` for an exception that
    /// comes out. `work` throws nothing of its own.
    template <typename Work>
    auto Call(const std::string& what, Work work)
    {
        Tell(Step, what);
        try
        {
            return work();
        }
        catch (...)
        {
            throw RuleBroken(what + " lets an exception out");
        }
    }

    /// What is worth knowing although the rule is kept.
    void Remark(const std::string& text) { Tell(Note, text); }

    // The words of the lines on the pipe. A line that starts with one of the last three is the last one.
    static constexpr std::string_view Step = "step";
    static constexpr std::string_view Note = "note";
    static constexpr std::string_view Pass = "pass";
    static constexpr std::string_view Fail = "fail";
    static constexpr std::string_view Skip = "skip";

    /// Writes a line: the word, and after a blank the text.
    void Tell(std::string_view word, const std::string& text);

private:
    std::wstring m_library;
    bool m_isMSSCCI;
    std::wstring m_project;
    std::wstring m_outside;
    HANDLE m_pipe;
};
