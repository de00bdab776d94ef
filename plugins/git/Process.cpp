#include "Process.h"

#include "CommandLine.h"
#include "GitFailure.h"
#include "GitText.h"

#include <windows.h>

#include <algorithm>
#include <array>
#include <atomic>
#include <cstdint>

namespace
{

using Clock = std::chrono::steady_clock;
using std::chrono::milliseconds;

constexpr milliseconds Patience(5000);   // for a program that was asked to end
constexpr milliseconds Stragglers(1000); // for outputs that a program left in the background holds open
constexpr DWORD FirstFailure = 500;      // milliseconds; a program that cannot start its window ends in that time
constexpr DWORD PipeBytes = 65536;

[[noreturn]] void ThrowLastError(const std::wstring& what)
{
    const DWORD error = GetLastError();
    throw GitFailure(what + L": " + GitText::SystemMessage(error));
}

/// The two ends of a pipe: ours works in the background, and the program inherits the other.
struct Pipe
{
    explicit Pipe(bool programWrites)
    {
        static std::atomic<unsigned> number;
        // The address tells the modules of a process apart that contain this code.
        const std::wstring name = L"\\\\.\\pipe\\orvix-git-" + std::to_wstring(GetCurrentProcessId()) + L"-" +
                                  std::to_wstring(reinterpret_cast<std::uintptr_t>(&number)) + L"-" +
                                  std::to_wstring(++number);
        ours = OwnFile(CreateNamedPipeW(name.c_str(),
                                        (programWrites ? PIPE_ACCESS_INBOUND : PIPE_ACCESS_OUTBOUND) |
                                            FILE_FLAG_OVERLAPPED | FILE_FLAG_FIRST_PIPE_INSTANCE,
                                        PIPE_TYPE_BYTE | PIPE_WAIT | PIPE_REJECT_REMOTE_CLIENTS, 1, PipeBytes,
                                        PipeBytes, 0, nullptr));
        SECURITY_ATTRIBUTES inherited{sizeof inherited, nullptr, TRUE};
        theirs = OwnFile(CreateFileW(name.c_str(), programWrites ? GENERIC_WRITE : GENERIC_READ, 0, &inherited,
                                     OPEN_EXISTING, 0, nullptr));
        if (!ours || !theirs)
        {
            ThrowLastError(L"A pipe cannot be made");
        }
    }

    OwnedHandle ours;
    OwnedHandle theirs;
};

/// One operation of a pipe that goes on in the background.
class Transfer
{
public:
    explicit Transfer(OwnedHandle pipe) : m_pipe(std::move(pipe)), m_event(CreateEventW(nullptr, TRUE, FALSE, nullptr))
    {
        if (!m_event)
        {
            ThrowLastError(L"An event cannot be made");
        }
    }
    Transfer(const Transfer&) = delete;
    Transfer& operator=(const Transfer&) = delete;
    ~Transfer() { Close(); }

    bool IsOpen() const { return m_pipe != nullptr; }
    HANDLE Event() const { return m_event.get(); }

    void BeginRead(void* buffer, DWORD size)
    {
        Prepare();
        Started(ReadFile(m_pipe.get(), buffer, size, nullptr, &m_overlapped));
    }
    void BeginWrite(const void* bytes, DWORD size)
    {
        Prepare();
        Started(WriteFile(m_pipe.get(), bytes, size, nullptr, &m_overlapped));
    }

    /// The number of bytes that were moved; 0 when the pipe has come to its end, which closes it.
    DWORD Finish()
    {
        DWORD count = 0;
        m_pending = false;
        if (!GetOverlappedResult(m_pipe.get(), &m_overlapped, &count, TRUE))
        {
            Close();
            return 0;
        }
        return count;
    }

    void Close()
    {
        if (m_pending)
        {
            DWORD ignored = 0;
            CancelIoEx(m_pipe.get(), &m_overlapped);
            GetOverlappedResult(m_pipe.get(), &m_overlapped, &ignored, TRUE);
            m_pending = false;
        }
        m_pipe.reset();
    }

private:
    void Prepare()
    {
        m_overlapped = {};
        m_overlapped.hEvent = m_event.get();
        m_pending = true;
    }
    void Started(BOOL done)
    {
        if (!done && GetLastError() != ERROR_IO_PENDING)
        {
            m_pending = false;
            Close();
        }
    }

    OwnedHandle m_pipe;
    OwnedHandle m_event;
    OVERLAPPED m_overlapped{};
    bool m_pending = false;
};

std::wstring FoldName(std::wstring_view variable)
{
    // A name may begin with "=".
    return GitText::Fold(variable.substr(0, variable.find(L'=', 1)));
}

/// The environment of this process with the changes, in the form that `CreateProcessW` takes.
std::vector<wchar_t> MakeEnvironment(const std::vector<ProcessCommand::Variable>& changes)
{
    std::vector<std::wstring> variables;
    const std::unique_ptr<wchar_t, decltype(&FreeEnvironmentStringsW)> own(GetEnvironmentStringsW(),
                                                                           &FreeEnvironmentStringsW);
    for (const wchar_t* variable = own.get(); variable != nullptr && *variable != 0;
         variable += variables.back().size() + 1)
    {
        variables.emplace_back(variable);
    }
    for (const auto& [name, value] : changes)
    {
        const std::wstring folded = GitText::Fold(name);
        std::erase_if(variables, [&](const std::wstring& variable) { return FoldName(variable) == folded; });
        if (value)
        {
            variables.push_back(name + L'=' + *value);
        }
    }
    std::sort(variables.begin(), variables.end(),
              [](const auto& left, const auto& right) { return FoldName(left) < FoldName(right); });
    std::vector<wchar_t> block;
    for (const std::wstring& variable : variables)
    {
        block.insert(block.end(), variable.c_str(), variable.c_str() + variable.size() + 1);
    }
    block.push_back(0);
    return block;
}

/// The handles that a new process inherits; no other one leaks into it.
class InheritedHandles
{
public:
    explicit InheritedHandles(std::array<HANDLE, 3> handles) : m_handles(handles)
    {
        SIZE_T size = 0;
        InitializeProcThreadAttributeList(nullptr, 1, 0, &size);
        m_memory.resize(size);
        if (!InitializeProcThreadAttributeList(Get(), 1, 0, &size) ||
            !UpdateProcThreadAttribute(Get(), 0, PROC_THREAD_ATTRIBUTE_HANDLE_LIST, m_handles.data(), sizeof m_handles,
                                       nullptr, nullptr))
        {
            ThrowLastError(L"The list of handles cannot be made");
        }
    }
    InheritedHandles(const InheritedHandles&) = delete;
    InheritedHandles& operator=(const InheritedHandles&) = delete;
    ~InheritedHandles() { DeleteProcThreadAttributeList(Get()); }

    LPPROC_THREAD_ATTRIBUTE_LIST Get() { return reinterpret_cast<LPPROC_THREAD_ATTRIBUTE_LIST>(m_memory.data()); }

private:
    std::array<HANDLE, 3> m_handles;
    std::vector<char> m_memory;
};

/// Presses Ctrl+C in the console of a program, which then cleans up. Only a process without a console of its own can do
/// that; in a console program nothing happens. The console is the process's: one object at a time uses it, and another
/// one does nothing.
class Interrupt
{
public:
    explicit Interrupt(DWORD processId)
    {
        if (!m_holds)
        {
            return;
        }
        std::array<HANDLE, 3> handles{};
        for (std::size_t i = 0; i < handles.size(); ++i)
        {
            handles[i] = GetStdHandle(Names[i]);
        }
        if (!AttachConsole(processId))
        {
            return;
        }
        m_ignores = SetConsoleCtrlHandler(nullptr, TRUE) != FALSE; // it reaches this process, too
        m_isSent = m_ignores && GenerateConsoleCtrlEvent(CTRL_C_EVENT, 0) != FALSE;
        FreeConsole();
        for (std::size_t i = 0; i < handles.size(); ++i)
        {
            SetStdHandle(Names[i], handles[i]);
        }
    }
    Interrupt(const Interrupt&) = delete;
    Interrupt& operator=(const Interrupt&) = delete;

    /// True when the program has been asked.
    bool IsSent() const { return m_isSent; }

    ~Interrupt()
    {
        if (m_ignores)
        {
            SetConsoleCtrlHandler(nullptr, FALSE);
        }
        if (m_holds)
        {
            s_used = false;
        }
    }

private:
    static constexpr std::array<DWORD, 3> Names{STD_INPUT_HANDLE, STD_OUTPUT_HANDLE, STD_ERROR_HANDLE};
    static inline std::atomic<bool> s_used = false;
    bool m_holds = !s_used.exchange(true);
    bool m_ignores = false;
    bool m_isSent = false;
};

} // namespace

class Process::Running
{
public:
    Running(ProcessCommand command, Listener listener);
    Running(const Running&) = delete;
    Running& operator=(const Running&) = delete;
    ~Running();

    bool Step(unsigned long timeout, HANDLE cancel);
    const ProcessResult& Result() const { return m_result; }

private:
    struct Reader
    {
        Reader(OwnedHandle pipe, Stream name, std::string& result)
            : transfer(std::move(pipe)), stream(name), text(result), buffer(PipeBytes)
        {
        }
        void Begin() { transfer.BeginRead(buffer.data(), static_cast<DWORD>(buffer.size())); }

        Transfer transfer;
        Stream stream;
        std::string& text;
        std::vector<char> buffer;
    };

    void Start(HANDLE input, HANDLE output, HANDLE errors);
    void Receive(Reader& reader);
    void WriteOn();
    void End(ProcessResult::End reason);
    bool Complete();
    Clock::time_point Deadline() const;
    void OnSign(HANDLE handle);
    void OnDeadline();

    ProcessCommand m_command;
    Listener m_listener;
    ProcessResult m_result;
    OwnedHandle m_job;
    OwnedHandle m_process;
    DWORD m_processId = 0;
    std::unique_ptr<Reader> m_output;
    std::unique_ptr<Reader> m_errors;
    std::unique_ptr<Transfer> m_input;
    std::size_t m_written = 0;
    bool m_exited = false;
    bool m_ended = false; ///< the program was asked to end
    std::unique_ptr<Interrupt> m_interrupt;
    Clock::time_point m_lastSign = Clock::now();
    Clock::time_point m_endBy; ///< a program that was asked to end is ended then
};

Process::Running::Running(ProcessCommand command, Listener listener)
    : m_command(std::move(command)), m_listener(std::move(listener)), m_job(CreateJobObjectW(nullptr, nullptr))
{
    Pipe input(false);
    Pipe output(true);
    Pipe errors(true);
    m_input = std::make_unique<Transfer>(std::move(input.ours));
    m_output = std::make_unique<Reader>(std::move(output.ours), Stream::Output, m_result.output);
    m_errors = std::make_unique<Reader>(std::move(errors.ours), Stream::Errors, m_result.errors);
    Start(input.theirs.get(), output.theirs.get(), errors.theirs.get());
    m_output->Begin();
    m_errors->Begin();
    WriteOn();
}

Process::Running::~Running()
{
    if (m_process && !m_exited)
    {
        TerminateJobObject(m_job.get(), 1);
    }
}

void Process::Running::Start(HANDLE input, HANDLE output, HANDLE errors)
{
    InheritedHandles handles({input, output, errors});
    STARTUPINFOEXW startup{};
    startup.StartupInfo.cb = sizeof startup;
    startup.StartupInfo.dwFlags = STARTF_USESTDHANDLES;
    startup.StartupInfo.hStdInput = input;
    startup.StartupInfo.hStdOutput = output;
    startup.StartupInfo.hStdError = errors;
    startup.lpAttributeList = handles.Get();
    std::wstring line = MakeCommandLine(m_command.program, m_command.arguments);
    std::vector<wchar_t> environment = MakeEnvironment(m_command.environment);
    PROCESS_INFORMATION information{};
    // It starts when it is in the job: nothing that it starts escapes.
    if (!CreateProcessW(m_command.program.c_str(), line.data(), nullptr, nullptr, TRUE,
                        CREATE_NO_WINDOW | CREATE_SUSPENDED | CREATE_UNICODE_ENVIRONMENT | EXTENDED_STARTUPINFO_PRESENT,
                        environment.data(), m_command.folder.c_str(), &startup.StartupInfo, &information))
    {
        ThrowLastError(m_command.program + L" cannot be started in " + m_command.folder);
    }
    m_process.reset(information.hProcess);
    m_processId = information.dwProcessId;
    const OwnedHandle thread(information.hThread);
    if (!AssignProcessToJobObject(m_job.get(), m_process.get()))
    {
        const DWORD error = GetLastError();
        TerminateProcess(m_process.get(), 1);
        SetLastError(error);
        ThrowLastError(m_command.program + L" cannot be put into a job");
    }
    ResumeThread(thread.get());
}

void Process::Running::WriteOn()
{
    if (m_written == m_command.input.size())
    {
        m_input->Close(); // the program reads the end
        return;
    }
    const std::size_t rest = std::min<std::size_t>(m_command.input.size() - m_written, PipeBytes);
    m_input->BeginWrite(m_command.input.data() + m_written, static_cast<DWORD>(rest));
}

void Process::Running::Receive(Reader& reader)
{
    const DWORD count = reader.transfer.Finish();
    if (!reader.transfer.IsOpen())
    {
        return;
    }
    const std::string_view bytes(reader.buffer.data(), count);
    reader.text += bytes;
    if (m_listener)
    {
        m_listener(reader.stream, bytes);
    }
    reader.Begin();
}

void Process::Running::End(ProcessResult::End reason)
{
    m_ended = true;
    m_result.end = reason;
    m_interrupt = std::make_unique<Interrupt>(m_processId);
    m_endBy = Clock::now() + (m_interrupt->IsSent() ? Patience : milliseconds(0));
}

/// True when nothing is to be expected any more.
bool Process::Running::Complete()
{
    const bool isRead = !m_output->transfer.IsOpen() && !m_errors->transfer.IsOpen();
    if (!m_exited || (!isRead && Clock::now() < m_lastSign + Stragglers))
    {
        return false;
    }
    m_output->transfer.Close();
    m_errors->transfer.Close();
    m_input->Close();
    m_interrupt.reset();
    return true;
}

/// When something is to be done although nothing happens.
Clock::time_point Process::Running::Deadline() const
{
    if (m_exited)
    {
        return m_lastSign + Stragglers;
    }
    return m_ended ? m_endBy : m_lastSign + m_command.silence;
}

bool Process::Running::Step(unsigned long timeout, HANDLE cancel)
{
    if (Complete())
    {
        return false;
    }
    const auto rest = std::chrono::ceil<milliseconds>(Deadline() - Clock::now()).count();
    const auto wait = static_cast<DWORD>(std::clamp<long long>(rest, 0, timeout));

    std::array<HANDLE, 5> handles{};
    DWORD count = 0;
    const auto add = [&](HANDLE handle) { handles[count++] = handle; };
    for (const Reader* reader : {m_output.get(), m_errors.get()})
    {
        if (reader->transfer.IsOpen())
        {
            add(reader->transfer.Event());
        }
    }
    if (m_input->IsOpen())
    {
        add(m_input->Event());
    }
    if (!m_exited)
    {
        add(m_process.get());
        if (!m_ended && cancel != nullptr)
        {
            add(cancel);
        }
    }
    const DWORD woken = WaitForMultipleObjects(count, handles.data(), FALSE, wait);
    if (woken >= WAIT_OBJECT_0 + count)
    {
        OnDeadline();
    }
    else if (HANDLE handle = handles[woken - WAIT_OBJECT_0]; handle == cancel)
    {
        End(ProcessResult::End::Cancelled);
    }
    else
    {
        OnSign(handle);
    }
    return !Complete();
}

/// Something has happened: the program has ended, or a stream goes on.
void Process::Running::OnSign(HANDLE handle)
{
    // A program that was left in the background may print for ever.
    if (!m_exited)
    {
        m_lastSign = Clock::now();
    }
    if (handle == m_process.get())
    {
        m_exited = true;
        GetExitCodeProcess(m_process.get(), &m_result.exitCode);
        if (m_ended)
        {
            TerminateJobObject(m_job.get(), 1); // with the programs that it has started
        }
    }
    else if (handle == m_input->Event())
    {
        m_written += m_input->Finish();
        if (m_input->IsOpen())
        {
            WriteOn();
        }
    }
    else
    {
        Receive(handle == m_output->transfer.Event() ? *m_output : *m_errors);
    }
}

/// Nothing has happened. Ends a program that was silent for too long, or that does not end when it is asked to.
void Process::Running::OnDeadline()
{
    if (m_exited || Clock::now() < Deadline())
    {
        return;
    }
    if (m_ended)
    {
        TerminateJobObject(m_job.get(), 1);
        m_endBy = Clock::now() + Patience;
    }
    else
    {
        End(ProcessResult::End::Silent);
    }
}

Process::Process(ProcessCommand command, Listener listener)
    : m_running(std::make_unique<Running>(std::move(command), std::move(listener)))
{
}

Process::~Process() = default;

bool Process::Step(unsigned long timeout, HANDLE cancel)
{
    return m_running->Step(timeout, cancel);
}

const ProcessResult& Process::Result() const
{
    return m_running->Result();
}

ProcessResult Process::Run(ProcessCommand command, HANDLE cancel, Listener listener)
{
    Process process(std::move(command), std::move(listener));
    while (process.Step(INFINITE, cancel))
    {
    }
    return process.Result();
}

void Process::StartAlone(const std::wstring& program, const std::vector<std::wstring>& arguments,
                         const std::wstring& folder, const std::vector<ProcessCommand::Variable>& environment)
{
    STARTUPINFOW startup{};
    startup.cb = sizeof startup;
    std::wstring line = MakeCommandLine(program, arguments);
    std::vector<wchar_t> variables = MakeEnvironment(environment);
    PROCESS_INFORMATION information{};
    if (!CreateProcessW(program.c_str(), line.data(), nullptr, nullptr, FALSE,
                        CREATE_NO_WINDOW | CREATE_UNICODE_ENVIRONMENT, variables.data(), folder.c_str(), &startup,
                        &information))
    {
        ThrowLastError(program + L" cannot be started");
    }
    const OwnedHandle process(information.hProcess);
    const OwnedHandle thread(information.hThread);
    DWORD exitCode = 0;
    if (WaitForSingleObject(process.get(), FirstFailure) == WAIT_OBJECT_0 &&
        GetExitCodeProcess(process.get(), &exitCode) && exitCode != 0)
    {
        throw GitFailure(program + L" has ended with exit code " + std::to_wstring(exitCode));
    }
}
