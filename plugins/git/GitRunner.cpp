#include "GitRunner.h"

#include "GitFailure.h"
#include "GitText.h"
#include "OrvixWaitingWindow.h"

#include <algorithm>
#include <charconv>
#include <exception>
#include <iterator>
#include <thread>

namespace
{

/// What differs from the host's environment. Git asks nothing on a terminal, uses no pager, and speaks English.
std::vector<ProcessCommand::Variable> Environment(const GitCommand& command, bool unattended)
{
    std::vector<ProcessCommand::Variable> variables{
        {L"LC_ALL", L"C"},
        {L"LANGUAGE", std::nullopt},
        {L"GIT_TERMINAL_PROMPT", L"0"},
        {L"GIT_PAGER", L"cat"},
        {L"GIT_EDITOR", L":"},
        {L"GIT_SEQUENCE_EDITOR", L":"},
        {L"GIT_MERGE_AUTOEDIT", L"no"},
        {L"GIT_OPTIONAL_LOCKS", command.isQuery ? L"0" : L"1"},
        // Never the terminal, which nobody sees.
        {L"SSH_ASKPASS_REQUIRE", L"force"},
    };
    const std::vector<ProcessCommand::Variable> removed = GitRunner::NoRepository();
    variables.insert(variables.end(), removed.begin(), removed.end());
    if (unattended)
    {
        variables.emplace_back(L"GIT_ASKPASS", std::nullopt);
        variables.emplace_back(L"SSH_ASKPASS", std::nullopt);
        variables.emplace_back(L"GCM_INTERACTIVE", L"never");
    }
    return variables;
}

std::vector<std::wstring> Arguments(const GitCommand& command, bool unattended)
{
    std::vector<std::wstring> arguments;
    for (const wchar_t* setting : {L"color.ui=false", L"core.longpaths=true", L"core.quotePath=false",
                                   L"i18n.commitEncoding=UTF-8", L"i18n.logOutputEncoding=UTF-8"})
    {
        arguments.insert(arguments.end(), {L"-c", setting});
    }
    for (const std::wstring& setting : command.settings)
    {
        arguments.insert(arguments.end(), {L"-c", setting});
    }
    if (unattended)
    {
        arguments.insert(arguments.end(), {L"-c", L"core.askPass="});
    }
    arguments.insert(arguments.end(), command.arguments.begin(), command.arguments.end());
    return arguments;
}

/// Shows how far commands are. Called on the threads that run them.
class ProgressView
{
public:
    ProgressView(OrvixWaitingWindow& window, const GitCommand& command)
        : m_window(window), m_linesToCome(command.linesToCome)
    {
    }

    void operator()(Process::Stream stream, std::string_view bytes)
    {
        if (m_linesToCome != 0)
        {
            Count(stream, bytes);
        }
        else if (stream == Process::Stream::Errors)
        {
            ShowWords(bytes);
        }
    }

private:
    void Count(Process::Stream stream, std::string_view bytes)
    {
        if (stream == Process::Stream::Output)
        {
            m_lines += static_cast<std::size_t>(std::count(bytes.begin(), bytes.end(), '\n'));
            const std::size_t shown = std::min(m_lines, m_linesToCome);
            const std::wstring text = std::to_wstring(shown) + L" of " + std::to_wstring(m_linesToCome) + L" files";
            m_window.SetProgress(text.c_str(), static_cast<int>(shown * 100 / m_linesToCome));
        }
    }

    /// The last whole line of the progress that Git prints, such as "Receiving objects:  45% (9/20)".
    void ShowWords(std::string_view bytes)
    {
        m_rest += bytes;
        const std::size_t end = m_rest.find_last_of("\r\n");
        if (end == std::string::npos)
        {
            return;
        }
        const std::size_t before = end != 0 ? m_rest.find_last_of("\r\n", end - 1) : std::string::npos;
        const std::string line = m_rest.substr(before + 1, end - before - 1); // npos + 1 is 0
        m_rest.erase(0, end + 1);
        m_window.SetProgress(GitText::FromUtf8(line).c_str(), Percent(line));
    }

    static int Percent(const std::string& line)
    {
        const std::size_t sign = line.find('%');
        if (sign == std::string::npos || sign == 0)
        {
            return -1;
        }
        const std::size_t begin = line.find_last_not_of("0123456789", sign - 1) + 1;
        int percent = -1;
        std::from_chars(line.data() + begin, line.data() + sign, percent);
        return percent;
    }

    OrvixWaitingWindow& m_window;
    std::size_t m_linesToCome;
    std::size_t m_lines = 0;
    std::string m_rest;
};

OwnedHandle MakeEvent()
{
    return OwnedHandle(CreateEventW(nullptr, TRUE, FALSE, nullptr));
}

} // namespace

void GitRunner::SetUp(std::wstring program)
{
    m_program = std::move(program);
    m_silence = DefaultSilence;
    m_folder.clear();
}

std::vector<ProcessCommand::Variable> GitRunner::NoRepository()
{
    std::vector<ProcessCommand::Variable> variables;
    for (const wchar_t* name :
         {L"GIT_DIR", L"GIT_WORK_TREE", L"GIT_INDEX_FILE", L"GIT_OBJECT_DIRECTORY", L"GIT_ALTERNATE_OBJECT_DIRECTORIES",
          L"GIT_COMMON_DIR", L"GIT_NAMESPACE", L"GIT_PREFIX", L"GIT_LITERAL_PATHSPECS", L"GIT_GLOB_PATHSPECS",
          L"GIT_NOGLOB_PATHSPECS", L"GIT_ICASE_PATHSPECS"})
    {
        variables.emplace_back(name, std::nullopt);
    }
    return variables;
}

ProcessCommand GitRunner::MakeProcess(const GitCommand& command) const
{
    ProcessCommand process;
    process.program = m_program;
    process.arguments = Arguments(command, m_unattended);
    process.folder = m_folder;
    process.environment = Environment(command, m_unattended);
    process.input = command.input;
    process.silence = m_silence;
    return process;
}

std::vector<ProcessResult> GitRunner::RunAll(std::span<const GitCommand> commands) const
{
    if (IsCancelled())
    {
        throw GitFailure(Cancelled);
    }
    const auto named =
        std::find_if(commands.begin(), commands.end(), [](const GitCommand& command) { return !command.task.empty(); });
    ShowTask(named != commands.end() ? named->task : std::wstring());
    std::vector<ProcessResult> results(commands.size());
    std::vector<std::exception_ptr> failures(commands.size());
    std::vector<OwnedHandle> ended;
    const OwnedHandle cancel = MakeEvent();
    {
        std::vector<std::jthread> threads;
        for (std::size_t i = 0; i < commands.size(); ++i)
        {
            ended.push_back(MakeEvent());
            threads.emplace_back([&, i, end = ended.back().get()] {
                try
                {
                    Process::Listener listener;
                    if (m_window != nullptr)
                    {
                        listener = ProgressView(*m_window, commands[i]);
                    }
                    results[i] = Process::Run(MakeProcess(commands[i]), cancel.get(), std::move(listener));
                }
                catch (...)
                {
                    failures[i] = std::current_exception();
                }
                SetEvent(end);
            });
        }
        for (const OwnedHandle& end : ended)
        {
            WaitFor(end.get(), cancel.get());
        }
    }
    for (std::size_t i = 0; i < commands.size(); ++i)
    {
        if (failures[i])
        {
            std::rethrow_exception(failures[i]);
        }
        RequireEnd(commands[i], results[i]);
    }
    return results;
}

void GitRunner::Work(const std::wstring& task, const std::function<void()>& work) const
{
    ShowTask(task);
    std::exception_ptr failure;
    const OwnedHandle end = MakeEvent();
    const OwnedHandle cancel = MakeEvent(); // nothing looks at it
    {
        const std::jthread thread([&] {
            try
            {
                work();
            }
            catch (...)
            {
                failure = std::current_exception();
            }
            SetEvent(end.get());
        });
        WaitFor(end.get(), cancel.get());
    }
    if (failure)
    {
        std::rethrow_exception(failure);
    }
}

/// Shows what runs.
void GitRunner::ShowTask(const std::wstring& task) const
{
    if (m_window != nullptr)
    {
        m_window->SetTask(task.c_str());
        m_window->SetProgress(L"", -1);
    }
}

/// Waits for the end of a command. Signals `cancel` when the user wants no more of it.
void GitRunner::WaitFor(HANDLE end, HANDLE cancel) const
{
    if (m_window != nullptr && m_window->Wait(end) == OrvixWaitingWindow::Result::Cancelled)
    {
        SetEvent(cancel);
        m_window->SetProgress(L"Cancelling", -1);
        m_window->Wait(end);
    }
}

/// Throws when a command was ended.
void GitRunner::RequireEnd(const GitCommand& command, const ProcessResult& result) const
{
    if (result.end == ProcessResult::End::Cancelled)
    {
        throw GitFailure(Cancelled);
    }
    if (result.end == ProcessResult::End::Silent)
    {
        const auto seconds = std::chrono::duration_cast<std::chrono::seconds>(m_silence).count();
        std::vector<std::wstring> lines = Words(result);
        lines.push_back(L"git " + command.arguments.front() + L" printed nothing for " + std::to_wstring(seconds) +
                        L" seconds and was ended");
        throw GitFailure(std::move(lines));
    }
}

bool GitRunner::IsCancelled() const
{
    return m_window != nullptr && m_window->IsCancelled();
}

ProcessResult GitRunner::Run(const GitCommand& command) const
{
    return std::move(RunAll({&command, 1}).front());
}

std::string GitRunner::RunOrThrow(const GitCommand& command) const
{
    ProcessResult result = Run(command);
    if (!result.Succeeded())
    {
        throw GitFailure(Words(result));
    }
    return std::move(result.output);
}

std::vector<std::wstring> GitRunner::Words(const ProcessResult& result)
{
    std::string errors = result.errors;
    for (std::size_t mark = 0; (mark = errors.find(LiteralPath, mark)) != std::string::npos;)
    {
        errors.erase(mark, LiteralPath.size());
    }
    std::vector<std::wstring> lines = GitText::Lines(errors);
    // What "git commit" has to say is in its output.
    if (lines.empty())
    {
        lines = GitText::Lines(result.output);
    }
    if (lines.empty() && result.end == ProcessResult::End::Exited)
    {
        lines.push_back(L"Git failed with exit code " + std::to_wstring(result.exitCode));
    }
    return lines;
}
