#include "ValidationProcess.h"

#include "FilePath.h"
#include "LibraryModule.h"
#include "ModulePath.h"
#include "ToolError.h"
#include "UniqueHandle.h"
#include "ValidationScratch.h"
#include "ValidationSubject.h"

#include <windows.h>

#include <array>
#include <sstream>
#include <string_view>

namespace
{

using Verdict = ValidationResult::Verdict;

constexpr wchar_t ChildArgument[] = L"--validate-rule"; // RULE KIND LIBRARY SCRATCH PIPE
constexpr int NumChildArguments = 7;
constexpr wchar_t PluginKind[] = L"plugin";
constexpr wchar_t MSSCCIKind[] = L"msscci";

constexpr DWORD PipeSize = 65536;      // bytes
constexpr DWORD PollMilliseconds = 50; // between two reads of the pipe

/// Throws `ToolError` with the system's error.
[[noreturn]] void FailToStart(const wchar_t* what, DWORD error = GetLastError())
{
    throw ToolError(ExitCode::Failed, L"no rule can be checked, " + std::wstring(what) + L" cannot be made: " +
                                          SystemMessage(error, ModulePath(nullptr)));
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

/// A job that ends all its processes when it is closed.
UniqueKernelHandle NewJob()
{
    UniqueKernelHandle job(CreateJobObjectW(nullptr, nullptr));
    JOBOBJECT_EXTENDED_LIMIT_INFORMATION limits{};
    limits.BasicLimitInformation.LimitFlags = JOB_OBJECT_LIMIT_KILL_ON_JOB_CLOSE;
    if (!job || !SetInformationJobObject(job.Get(), JobObjectExtendedLimitInformation, &limits, sizeof limits))
    {
        FailToStart(L"a job");
    }
    return job;
}

/// The null device, which discards what a library prints.
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

/// Starts a process in the job. `folder` is its current folder.
UniqueKernelHandle Start(const std::wstring& program, std::wstring commandLine, const std::wstring& folder, HANDLE job)
{
    const UniqueFile nullDevice = OpenNullDevice();
    STARTUPINFOW startup{};
    startup.cb = sizeof startup;
    startup.dwFlags = STARTF_USESTDHANDLES;
    startup.hStdInput = startup.hStdOutput = startup.hStdError = nullDevice.Get();
    PROCESS_INFORMATION started{};
    if (!CreateProcessW(program.c_str(), commandLine.data(), nullptr, nullptr, TRUE, CREATE_SUSPENDED, nullptr,
                        folder.c_str(), &startup, &started))
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

/// Reads what the pipe holds without waiting, at most a few bytes more than `PipeSize`.
std::string ReadAvailable(HANDLE pipe)
{
    std::string all;
    std::array<char, 4096> part{};
    DWORD available = 0;
    DWORD size = 0;
    while (all.size() < PipeSize && PeekNamedPipe(pipe, nullptr, 0, nullptr, &available, nullptr) && available != 0 &&
           ReadFile(pipe, part.data(), static_cast<DWORD>(part.size()), &size, nullptr))
    {
        all.append(part.data(), size);
    }
    return all;
}

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
        if (word == ValidationSubject::Step)
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

std::string DescribeEnd(DWORD exitCode)
{
    constexpr DWORD FirstException = 0x80000000;
    constexpr DWORD AfterExceptions = 0xF0000000; // from here on: small negative exit codes
    return exitCode >= FirstException && exitCode < AfterExceptions
               ? "crashes the process with exception " + Hexadecimal(exitCode)
               : "ends the process with exit code " + std::to_string(exitCode);
}

/// Ends the process at a crash without a message box and without a debugger.
LONG WINAPI EndAtOnce(EXCEPTION_POINTERS* exception)
{
    TerminateProcess(GetCurrentProcess(), exception->ExceptionRecord->ExceptionCode);
    return EXCEPTION_EXECUTE_HANDLER;
}

void CheckInThisProcess(const ValidationRule& rule, ValidationSubject& subject)
{
    try
    {
        rule.check(subject);
        subject.Send(ValidationSubject::Pass, "");
    }
    catch (const RuleBroken& broken)
    {
        subject.Send(ValidationSubject::Fail, broken.what());
    }
    catch (const RuleSkipped& skipped)
    {
        subject.Send(ValidationSubject::Skip, skipped.what());
    }
    catch (const std::exception& error)
    {
        subject.Send(ValidationSubject::Skip, std::string("it cannot be checked: ") + error.what());
    }
}

} // namespace

ValidationResult ValidationProcess::Check(const ValidationRule& rule) const
{
    using Clock = std::chrono::steady_clock;

    const ValidationScratch scratch;
    const Pipe pipe = NewPipe();
    const std::wstring program = ModulePath(nullptr);
    const std::wstring commandLine = L"orvix " + std::wstring(ChildArgument) + L' ' + Wide(rule.name) + L' ' +
                                     (m_isMSSCCI ? MSSCCIKind : PluginKind) + L" \"" + m_library + L"\" \"" +
                                     scratch.Path() + L"\" " +
                                     std::to_wstring(reinterpret_cast<std::uintptr_t>(pipe.writer.Get()));
    DWORD exitCode = STILL_ACTIVE;
    bool ended = false;
    std::string text;
    {
        const UniqueKernelHandle job = NewJob();
        const UniqueKernelHandle process = Start(program, commandLine, scratch.Path(), job.Get());
        const auto deadline = Clock::now() + m_limit;
        do
        {
            ended = WaitForSingleObject(process.Get(), PollMilliseconds) == WAIT_OBJECT_0;
            text += ReadAvailable(pipe.reader.Get());
        } while (!ended && Clock::now() < deadline);
        GetExitCodeProcess(process.Get(), &exitCode);
        TerminateJobObject(job.Get(), exitCode);
        WaitForSingleObject(process.Get(), INFINITE); // after it its files can be deleted
    }
    const ProcessLines lines(text);
    if (lines.result)
    {
        return *lines.result;
    }
    return {Verdict::Fail, ended ? lines.step + ' ' + DescribeEnd(exitCode)
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
    SetErrorMode(SEM_FAILCRITICALERRORS | SEM_NOGPFAULTERRORBOX | SEM_NOOPENFILEERRORBOX);
    SetUnhandledExceptionFilter(EndAtOnce);
    RememberLibraryModule(GetModuleHandleW(L"OrvixCore.dll")); // the library gets the manifest of this module
    const HANDLE pipe = ULongToHandle(std::wcstoul(arguments[6], nullptr, 10)); // handles have 32 bits
    SetHandleInformation(pipe, HANDLE_FLAG_INHERIT, 0);
    ValidationSubject subject(arguments[4], isMSSCCI, arguments[5], pipe);
    CheckInThisProcess(*rule, subject);
    // A library that is still loaded must not run its end code: hosts unload every library before they end.
    TerminateProcess(GetCurrentProcess(), 0);
    return 0;
}
