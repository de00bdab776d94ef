#include "ValidationProcess.h"

#include "ChildProcess.h"
#include "LibraryModule.h"
#include "ToolError.h"
#include "ValidationScratch.h"
#include "ValidationSubject.h"

#include <windows.h>

#include <memory>
#include <sstream>
#include <string_view>

namespace
{

using Verdict = ValidationResult::Verdict;

constexpr wchar_t ChildArgument[] = L"--validate-rule"; // RULE KIND LIBRARY SCRATCH
constexpr int NumChildArguments = 6;
constexpr wchar_t PluginKind[] = L"plugin";
constexpr wchar_t MSSCCIKind[] = L"msscci";

constexpr std::chrono::milliseconds Poll(50); // between two looks at the process

/// The lines that a process wrote to its pipe.
struct ProcessLines
{
    explicit ProcessLines(const std::string& text)
    {
        std::istringstream stream(text);
        for (std::string line; std::getline(stream, line);)
        {
            Add(line);
        }
    }

    void Add(const std::string& line)
    {
        const std::string word = line.substr(0, line.find(' '));
        const std::string rest = line.size() > word.size() ? line.substr(word.size() + 1) : "";
        if (word == ParentLink::Step)
        {
            step = rest;
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
    std::optional<ValidationResult> result; ///< empty when the process ended before it had one
};

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

ValidationResult ValidationProcess::Check(const ValidationRule& rule) const
{
    using Clock = std::chrono::steady_clock;

    const ValidationScratch scratch;
    const std::unique_ptr<ChildProcess> child =
        Start(std::wstring(ChildArgument) + L' ' + Wide(rule.name) + L' ' + (m_isMSSCCI ? MSSCCIKind : PluginKind) +
                  L' ' + QuotedArgument(m_library) + L' ' + QuotedArgument(scratch.Path()),
              scratch.Path());
    const auto deadline = Clock::now() + m_limit;
    bool ended = false;
    std::string text;
    do
    {
        ended = child->Wait(Poll);
        text += child->Read();
    } while (!ended && Clock::now() < deadline);
    child->End();
    const ProcessLines lines(text);
    if (lines.result)
    {
        return *lines.result;
    }
    return {Verdict::Fail, ended ? lines.step + ' ' + DescribeProcessEnd(child->ExitCode())
                                 : lines.step + " hangs: ended after " + std::to_string(m_limit.count()) + " s"};
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
    ValidationSubject subject(arguments[4], isMSSCCI, arguments[5]);
    CheckInThisProcess(*rule, subject);
    // A library that is still loaded must not run its end code: hosts unload every library before they end.
    TerminateProcess(GetCurrentProcess(), 0);
    return 0;
}
