#include "CommandProcess.h"

#include "ChildProcess.h"
#include "ParentLink.h"
#include "WindowWatch.h"

#include <windows.h>

#include <iostream>
#include <optional>

namespace
{

using Clock = std::chrono::steady_clock;
using std::chrono::milliseconds;
using std::chrono::seconds;

constexpr std::string_view Result = "result"; // word of the line with the exit code

constexpr milliseconds Poll(50);       // between two looks at the child
constexpr milliseconds EndTime(5'000); // that the child gets to end after its result

/// What the user typed after the name of the program.
std::wstring TypedArguments()
{
    const wchar_t* text = GetCommandLineW();
    for (bool quoted = false; *text != L'\0' && (quoted || (*text != L' ' && *text != L'\t')); ++text)
    {
        quoted = quoted != (*text == L'"');
    }
    return text;
}

/// The child that runs a command, as the parent sees it.
class WatchedChild
{
public:
    explicit WatchedChild(const CommandLine& commandLine)
        : m_limit(commandLine.timeout), m_isAttended(!commandLine.unattended),
          m_watchesWindows(commandLine.unattended || commandLine.watchesWindows),
          m_cancelsWindows(commandLine.cancelsWindows), m_child(TypedArguments(), L"", ChildProcess::Streams::Shared),
          m_windows(m_child)
    {
    }

    ExitCode Run()
    {
        bool ended = false;
        while (!ended && !m_result)
        {
            ended = m_child.Wait(Poll);
            TakeLines(m_child.Read());
            LookForWindows();
            const bool waitsForUser = m_isAttended && !m_isInCall; // who may look at a dialog of OrvixCore
            if (!ended && !m_result && m_limit && !waitsForUser && Clock::now() - m_lastSign > *m_limit)
            {
                EndLate();
            }
        }
        if (!m_result)
        {
            throw ToolError(ExitCode::ProviderEnded, Wide(DescribeEnd()));
        }
        if (m_child.Wait(EndTime))
        {
            m_child.LeaveDescendants();
        } // else the job ends a library that hangs while it is unloaded
        return *m_result;
    }

private:
    void TakeLines(const std::string& text)
    {
        m_text += text;
        for (std::size_t end = 0; (end = m_text.find('\n')) != std::string::npos; m_text.erase(0, end + 1))
        {
            TakeLine(m_text.substr(0, end));
        }
    }

    void TakeLine(const std::string& line)
    {
        m_lastSign = Clock::now();
        const std::string word = line.substr(0, line.find(' '));
        const std::string rest = line.size() > word.size() ? line.substr(word.size() + 1) : "";
        if (word == ParentLink::Step)
        {
            m_step = rest;
            m_isInCall = true;
        }
        else if (word == ParentLink::Return)
        {
            m_isInCall = false;
            m_step = "code that runs after " + m_step;
        }
        else if (word == ParentLink::Crash)
        {
            m_crash = rest;
        }
        else if (word == Result)
        {
            m_result = static_cast<ExitCode>(std::stoi(rest));
        }
    }

    void LookForWindows()
    {
        // The dialogs of OrvixCore are for the user.
        if (!m_watchesWindows || (m_isAttended && !m_isInCall))
        {
            return;
        }
        const std::vector<WindowWatch::Window> windows = m_windows.FindNew();
        TakeLines(m_child.Read()); // the call that shows a window announced itself before
        if (m_isAttended && !m_isInCall)
        {
            return;
        }
        for (const WindowWatch::Window& window : windows)
        {
            m_lastSign = Clock::now();
            m_window = L"\"" + window.title + L"\"";
            std::cerr << "orvix: " << m_step << " shows the window " << Printable(m_window)
                      << (window.text.empty() ? "" : ": ") << Printable(window.text)
                      << (m_cancelsWindows ? " (Cancel is pressed)" : " (--on-window cancel presses Cancel)")
                      << std::endl;
            if (m_cancelsWindows)
            {
                WindowWatch::Cancel(window);
            }
        }
    }

    [[noreturn]] void EndLate()
    {
        m_child.End();
        throw ToolError(ExitCode::TimedOut,
                        Wide(m_step) + L" has given no sign of life for " + std::to_wstring(m_limit->count()) + L" s" +
                            (m_window.empty() ? L"" : L" since it showed the window " + m_window) +
                            L" and was ended; --timeout SECONDS sets the time. It may have changed files: see "
                            L"orvix status");
    }

    std::string DescribeEnd() const
    {
        const std::string what =
            m_step + ' ' + (m_crash.empty() ? DescribeProcessEnd(m_child.ExitCode()) : "crashes in " + m_crash);
        return what + ". It may have changed files: see orvix status and orvix doctor";
    }

    std::optional<seconds> m_limit;
    bool m_isAttended;
    bool m_watchesWindows;
    bool m_cancelsWindows;
    ChildProcess m_child;
    WindowWatch m_windows;
    Clock::time_point m_lastSign = Clock::now();
    std::string m_text; // a line that has not arrived in full
    std::string m_step = "the start";
    bool m_isInCall = false; // of a provider
    std::string m_crash;
    std::wstring m_window; // the last one
    std::optional<ExitCode> m_result;
};

} // namespace

ExitCode CommandProcess::RunInChild(const CommandLine& commandLine)
{
    return WatchedChild(commandLine).Run();
}

void CommandProcess::SendResult(ExitCode code)
{
    ParentLink::Send(Result, std::to_string(static_cast<int>(code)));
}
