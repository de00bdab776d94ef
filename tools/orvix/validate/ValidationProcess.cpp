#include "ValidationProcess.h"

#include "ChildProcess.h"
#include "LibraryModule.h"
#include "ToolError.h"
#include "ValidationScratch.h"
#include "ValidationSubject.h"
#include "WindowWatch.h"

#include <windows.h>

#include <filesystem>
#include <iterator>
#include <memory>
#include <sstream>
#include <string_view>

namespace
{

using Verdict = ValidationResult::Verdict;

constexpr wchar_t ChildArgument[] = L"--validate-rule"; // RULE KIND LIBRARY SCRATCH HANGING
constexpr int NumChildArguments = 7;
constexpr wchar_t PluginKind[] = L"plugin";
constexpr wchar_t MSSCCIKind[] = L"msscci";

constexpr std::chrono::milliseconds Poll(50); // between two looks at the process

/// The lines that a process wrote to its pipe.
struct ProcessLines
{
    /// Takes what has arrived, which may end within a line. False when it holds no end of a line.
    bool Take(const std::string& text)
    {
        m_text += text;
        bool taken = false;
        for (std::size_t end = 0; (end = m_text.find('\n')) != std::string::npos; m_text.erase(0, end + 1))
        {
            Add(m_text.substr(0, end));
            taken = true;
        }
        return taken;
    }

    void Add(const std::string& line)
    {
        const std::string word = line.substr(0, line.find(' '));
        const std::string rest = line.size() > word.size() ? line.substr(word.size() + 1) : "";
        if (word == ParentLink::Step)
        {
            step = rest;
        }
        else if (word == ParentLink::Crash)
        {
            crash = rest;
        }
        else if (word == ValidationSubject::Note)
        {
            note = rest;
        }
        else if (word == ValidationSubject::Pass)
        {
            result = {Verdict::Pass, note};
        }
        else if (word == ValidationSubject::Fail)
        {
            result = {Verdict::Fail, rest};
        }
        else if (word == ValidationSubject::Skip)
        {
            result = {Verdict::Skip, rest};
        }
    }

    std::string step = "the start"; ///< the last call of the library
    std::string note;
    std::string crash;                      ///< where the process crashed
    std::optional<ValidationResult> result; ///< empty when the process ended before it had one

private:
    std::string m_text; // a line that has not arrived in full
};

/// `crash`: "MODULE at offset X, exception Y".
std::string DescribeCrash(const std::string& crash)
{
    constexpr std::string_view Separator = ", exception ";
    const std::size_t separator = crash.rfind(Separator);
    return separator == std::string::npos
               ? "crashes the process in " + crash
               : "crashes the process with exception " + crash.substr(separator + Separator.size()) + " in " +
                     crash.substr(0, separator);
}

/// Throws `ToolError` when it cannot be copied.
void CopyProject(const std::wstring& from, const std::wstring& to)
{
    std::error_code error;
    std::filesystem::copy(from, to, std::filesystem::copy_options::recursive, error);
    if (error)
    {
        throw ToolError(ExitCode::Failed, L"the project cannot be copied: " +
                                              SystemMessage(static_cast<unsigned long>(error.value()), from));
    }
}

std::unique_ptr<ChildProcess> Start(const std::wstring& arguments, const std::wstring& folder)
{
    try
    {
        return std::make_unique<ChildProcess>(arguments, folder, ChildProcess::Streams::None);
    }
    catch (const ToolError& error)
    {
        throw ToolError(error.Code(), L"no rule can be checked, " + Wide(error.what()));
    }
}

void CheckInThisProcess(const ValidationRule& rule, ValidationSubject& subject)
{
    try
    {
        rule.check(subject);
        ParentLink::Send(ValidationSubject::Pass, "");
    }
    catch (const RuleBroken& broken)
    {
        ParentLink::Send(ValidationSubject::Fail, broken.what());
    }
    catch (const RuleSkipped& skipped)
    {
        ParentLink::Send(ValidationSubject::Skip, skipped.what());
    }
    catch (const std::exception& error)
    {
        ParentLink::Send(ValidationSubject::Skip, std::string("it cannot be checked: ") + error.what());
    }
}

} // namespace

ValidationResult ValidationProcess::Check(const ValidationRule& rule)
{
    using Clock = std::chrono::steady_clock;

    for (const char* always : {"loading", "unloading"}) // what every rule does
    {
        if (m_hanging.contains(always))
        {
            return {Verdict::Skip, std::string(always) + " hangs, as another rule has found"};
        }
    }
    const ValidationScratch scratch;
    if (!m_projectTemplate.empty())
    {
        CopyProject(m_projectTemplate, scratch.Path() + L"\\project");
    }
    std::string hanging;
    for (const std::string& operation : m_hanging)
    {
        hanging += ' ' + operation;
    }
    const std::unique_ptr<ChildProcess> child = Start(
        std::wstring(ChildArgument) + L' ' + Wide(rule.name) + L' ' + (m_isMSSCCI ? MSSCCIKind : PluginKind) + L' ' +
            QuotedArgument(m_library) + L' ' + QuotedArgument(scratch.Path()) + L' ' + QuotedArgument(Wide(hanging)),
        scratch.Path());
    WindowWatch windows(*child);
    std::optional<WindowWatch::Window> window;
    ProcessLines lines;
    auto lastLine = Clock::now();
    bool ended = false;
    do
    {
        ended = child->Wait(Poll);
        if (lines.Take(child->Read()))
        {
            lastLine = Clock::now();
        }
        if (const std::vector<WindowWatch::Window> found = windows.FindNew(); !found.empty())
        {
            window = found.back();
        }
    } while (!ended && !lines.result && Clock::now() - lastLine < m_limit);
    lines.Take(child->Read());
    const bool isWaiting = window && IsWindowVisible(static_cast<HWND>(window->handle)) != FALSE;
    child->End();
    if (lines.result)
    {
        return *lines.result;
    }
    if (ended)
    {
        return {Verdict::Fail,
                lines.step + ' ' +
                    (lines.crash.empty() ? DescribeProcessEnd(child->ExitCode()) : DescribeCrash(lines.crash))};
    }
    AddHanging(ValidationSubject::OperationOf(lines.step));
    const std::string after = ": ended after " + std::to_string(m_limit.count()) + " s";
    return {Verdict::Fail, lines.step + (isWaiting ? " shows the window \"" + Printable(window->title) + "\" (" +
                                                         Printable(window->text) + ") and waits" + after
                                                   : " hangs" + after)};
}

/// An operation and the function that it calls hang together, however a rule calls them.
void ValidationProcess::AddHanging(const std::string& operation)
{
    constexpr std::pair<std::string_view, std::string_view> Same[] = {
        {"SccInitialize", "Initialize"},   {"SccUninitialize", "Uninitialize"},
        {"SccOpenProject", "OpenProject"}, {"SccCloseProject", "CloseProject"},
        {"SccQueryInfo", "QueryStatus"},   {"SccGet", "GetLatest"},
        {"SccCheckout", "CheckOut"},       {"SccUncheckout", "UndoCheckOut"},
        {"SccCheckin", "CheckIn"},         {"SccAdd", "Add"}};
    m_hanging.insert(operation);
    for (const auto& [function, name] : Same)
    {
        if (operation == function || operation == name)
        {
            m_hanging.insert({std::string(function), std::string(name)});
        }
    }
}

std::optional<int> ValidationProcess::RunAsChild(int count, wchar_t** arguments)
{
    if (count != NumChildArguments || std::wstring_view(arguments[1]) != ChildArgument)
    {
        return std::nullopt;
    }
    const bool isMSSCCI = std::wstring_view(arguments[3]) == MSSCCIKind;
    const ValidationRule* rule =
        ValidationRule::Find(Utf8(arguments[2]), isMSSCCI ? ValidationRule::MSSCCI : ValidationRule::Plugin);
    if (rule == nullptr)
    {
        return static_cast<int>(ExitCode::BadUsage);
    }
    RememberLibraryModule(GetModuleHandleW(L"OrvixCore.dll")); // the library gets the manifest of this module
    std::istringstream hanging(Utf8(arguments[6]));
    ValidationSubject subject(arguments[4], isMSSCCI, arguments[5],
                              {std::istream_iterator<std::string>(hanging), std::istream_iterator<std::string>()});
    CheckInThisProcess(*rule, subject);
    // A library that is still loaded must not run its end code: hosts unload every library before they end.
    TerminateProcess(GetCurrentProcess(), 0);
    return 0;
}
