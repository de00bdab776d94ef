#include "ChildProcess.h"

#include "ModulePath.h"
#include "ParentLink.h"
#include "ToolError.h"

#include <array>

namespace
{

constexpr DWORD PipeSize = 65536; // bytes

/// Throws `ToolError` with the system's error.
[[noreturn]] void FailToStart(const wchar_t* what, DWORD error = GetLastError())
{
    throw ToolError(ExitCode::Failed,
                    std::wstring(what) + L" cannot be made: " + SystemMessage(error, ModulePath(nullptr)));
}

struct Pipe
{
    UniqueFile reader;
    UniqueFile writer; ///< inheritable
};

Pipe NewPipe()
{
    SECURITY_ATTRIBUTES inheritable{sizeof inheritable, nullptr, TRUE};
    Pipe pipe;
    if (!CreatePipe(pipe.reader.Out(), pipe.writer.Out(), &inheritable, PipeSize))
    {
        FailToStart(L"a pipe");
    }
    SetHandleInformation(pipe.reader.Get(), HANDLE_FLAG_INHERIT, 0);
    return pipe;
}

/// Whether the processes of a job end when it is closed.
bool SetEndsWithJob(HANDLE job, bool ends)
{
    JOBOBJECT_EXTENDED_LIMIT_INFORMATION limits{};
    limits.BasicLimitInformation.LimitFlags = ends ? JOB_OBJECT_LIMIT_KILL_ON_JOB_CLOSE : 0;
    return SetInformationJobObject(job, JobObjectExtendedLimitInformation, &limits, sizeof limits) != 0;
}

UniqueKernelHandle NewJob()
{
    UniqueKernelHandle job(CreateJobObjectW(nullptr, nullptr));
    if (!job || !SetEndsWithJob(job.Get(), true))
    {
        FailToStart(L"a job");
    }
    return job;
}

/// The null device, which discards what is printed.
UniqueFile OpenNullDevice()
{
    SECURITY_ATTRIBUTES inheritable{sizeof inheritable, nullptr, TRUE};
    UniqueFile file(CreateFileW(L"NUL", GENERIC_READ | GENERIC_WRITE, FILE_SHARE_READ | FILE_SHARE_WRITE, &inheritable,
                                OPEN_EXISTING, 0, nullptr));
    if (!file)
    {
        FailToStart(L"an output");
    }
    return file;
}

/// Starts this program in the job.
UniqueKernelHandle Start(std::wstring commandLine, const std::wstring& folder, ChildProcess::Streams streams,
                         HANDLE job)
{
    STARTUPINFOW startup{};
    startup.cb = sizeof startup;
    startup.dwFlags = STARTF_USESTDHANDLES;
    startup.hStdInput = GetStdHandle(STD_INPUT_HANDLE);
    startup.hStdOutput = GetStdHandle(STD_OUTPUT_HANDLE);
    startup.hStdError = GetStdHandle(STD_ERROR_HANDLE);
    UniqueFile nullDevice;
    if (streams == ChildProcess::Streams::None)
    {
        nullDevice = OpenNullDevice();
        startup.hStdInput = startup.hStdOutput = startup.hStdError = nullDevice.Get();
    }
    PROCESS_INFORMATION started{};
    if (CreateProcessW(ModulePath(nullptr).c_str(), commandLine.data(), nullptr, nullptr, TRUE, CREATE_SUSPENDED,
                       nullptr, folder.empty() ? nullptr : folder.c_str(), &startup, &started) == FALSE)
    {
        FailToStart(L"a process");
    }
    UniqueKernelHandle process(started.hProcess);
    const UniqueKernelHandle thread(started.hThread);
    if (!AssignProcessToJobObject(job, process.Get()))
    {
        const DWORD error = GetLastError();
        TerminateProcess(process.Get(), 1);
        FailToStart(L"a process in a job", error);
    }
    ResumeThread(thread.Get());
    return process;
}

} // namespace

ChildProcess::ChildProcess(const std::wstring& arguments, const std::wstring& folder, Streams streams) : m_job(NewJob())
{
    Pipe pipe = NewPipe();
    m_process =
        Start(L"orvix " + ParentLink::Arguments(pipe.writer.Get()) + L' ' + arguments, folder, streams, m_job.Get());
    m_pipe = std::move(pipe.reader);
}

ChildProcess::~ChildProcess()
{
    m_job.Reset();
    WaitForSingleObject(m_process.Get(), INFINITE); // after it its files can be deleted
}

bool ChildProcess::Wait(std::chrono::milliseconds time) const
{
    return WaitForSingleObject(m_process.Get(), static_cast<DWORD>(time.count())) == WAIT_OBJECT_0;
}

std::string ChildProcess::Read() const
{
    std::string all;
    std::array<char, 4096> part{};
    DWORD available = 0;
    DWORD size = 0;
    // A child that never stops writing does not keep this one busy for ever.
    while (all.size() < PipeSize && PeekNamedPipe(m_pipe.Get(), nullptr, 0, nullptr, &available, nullptr) &&
           available != 0 && ReadFile(m_pipe.Get(), part.data(), static_cast<DWORD>(part.size()), &size, nullptr))
    {
        all.append(part.data(), size);
    }
    return all;
}

unsigned long ChildProcess::ExitCode() const
{
    DWORD code = STILL_ACTIVE;
    GetExitCodeProcess(m_process.Get(), &code);
    return code;
}

void ChildProcess::End()
{
    TerminateJobObject(m_job.Get(), ExitCode());
    WaitForSingleObject(m_process.Get(), INFINITE);
}

void ChildProcess::LeaveDescendants()
{
    SetEndsWithJob(m_job.Get(), false);
}

bool ChildProcess::Contains(unsigned long processID) const
{
    const UniqueKernelHandle process(OpenProcess(PROCESS_QUERY_INFORMATION, FALSE, processID));
    BOOL contains = FALSE;
    return process && IsProcessInJob(process.Get(), m_job.Get(), &contains) != FALSE && contains != FALSE;
}

std::wstring QuotedArgument(std::wstring_view argument)
{
    std::wstring quoted = L"\"";
    std::size_t backslashes = 0;
    for (const wchar_t character : argument)
    {
        if (character == L'"')
        {
            quoted.append(backslashes + 1, L'\\');
        }
        backslashes = character == L'\\' ? backslashes + 1 : 0;
        quoted += character;
    }
    return quoted.append(backslashes, L'\\') + L'"';
}

std::string DescribeProcessEnd(unsigned long exitCode)
{
    constexpr unsigned long FirstException = 0x80000000;
    constexpr unsigned long AfterExceptions = 0xF0000000; // from here on: small negative exit codes
    return exitCode >= FirstException && exitCode < AfterExceptions
               ? "crashes the process with exception " + Hexadecimal(exitCode)
               : "ends the process with exit code " + std::to_string(exitCode);
}
