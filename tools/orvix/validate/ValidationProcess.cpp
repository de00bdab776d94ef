#include "ValidationProcess.h"

#include "FilePath.h"
#include "LibraryModule.h"
#include "ToolError.h"
#include "ValidationScratch.h"
#include "ValidationSubject.h"

#include <windows.h>

#include <array>
#include <memory>
#include <sstream>
#include <string_view>

namespace
{

using Verdict = ValidationResult::Verdict;

constexpr wchar_t ChildArgument[] = L"--validate-rule"; // RULE KIND LIBRARY SCRATCH PIPE
constexpr int ChildArguments = 7;
constexpr wchar_t PluginKind[] = L"plugin";
constexpr wchar_t MSSCCIKind[] = L"msscci";

constexpr DWORD PipeSize = 65536;
constexpr DWORD PollMilliseconds = 50; // between two readings of the pipe

struct CloseHandleOf
{
    using pointer = HANDLE;
    void operator()(HANDLE handle) const { CloseHandle(handle); }
};
using UniqueHandle = std::unique_ptr<HANDLE, CloseHandleOf>;

[[noreturn]] void RefuseToStart(const wchar_t* what, DWORD error = GetLastError())
{
    throw ToolError(ExitCode::Failed, L"no rule can be checked, " + std::wstring(what) + L" cannot be made: " +
                                          SystemMessage(error, ModulePath(nullptr)));
}

struct Pipe
{
    UniqueHandle read;
    UniqueHandle write; ///< inheritable
};

Pipe NewPipe()
{
    SECURITY_ATTRIBUTES inheritable{sizeof inheritable, nullptr, TRUE};
    HANDLE read = nullptr;
    HANDLE write = nullptr;
    if (!CreatePipe(&read, &write, &inheritable, PipeSize))
    {
        RefuseToStart(L"a pipe");
    }
    SetHandleInformation(read, HANDLE_FLAG_INHERIT, 0);
    return {UniqueHandle(read), UniqueHandle(write)};
}

/// A job that ends all its processes when it is closed.
UniqueHandle NewJob()
{
    UniqueHandle job(CreateJobObjectW(nullptr, nullptr));
    JOBOBJECT_EXTENDED_LIMIT_INFORMATION limits{};
    limits.BasicLimitInformation.LimitFlags = JOB_OBJECT_LIMIT_KILL_ON_JOB_CLOSE;
    if (!job || !SetInformationJobObject(job.get(), JobObjectExtendedLimitInformation, &limits, sizeof limits))
    {
        RefuseToStart(L"a job");
    }
    return job;
}

/// The file that swallows what a library prints.
UniqueHandle NewNullFile()
{
    SECURITY_ATTRIBUTES inheritable{sizeof inheritable, nullptr, TRUE};
    UniqueHandle file(CreateFileW(L"NUL", GENERIC_READ | GENERIC_WRITE, FILE_SHARE_READ | FILE_SHARE_WRITE,
                                  &inheritable, OPEN_EXISTING, 0, nullptr));
    if (file.get() == INVALID_HANDLE_VALUE)
    {
        file.release();
        RefuseToStart(L"an output");
    }
    return file;
}

/// Starts a process in the job, and in the folder.
UniqueHandle Start(const std::wstring& program, std::wstring commandLine, const std::wstring& folder, HANDLE job)
{
    const UniqueHandle nothing = NewNullFile();
    STARTUPINFOW startup{};
    startup.cb = sizeof startup;
    startup.dwFlags = STARTF_USESTDHANDLES;
    startup.hStdInput = startup.hStdOutput = startup.hStdError = nothing.get();
    PROCESS_INFORMATION started{};
    if (!CreateProcessW(program.c_str(), commandLine.data(), nullptr, nullptr, TRUE, CREATE_SUSPENDED, nullptr,
                        folder.c_str(), &startup, &started))
    {
        RefuseToStart(L"a process");
    }
    UniqueHandle process(started.hProcess);
    const UniqueHandle thread(started.hThread);
    if (!AssignProcessToJobObject(job, process.get()))
    {
        const DWORD error = GetLastError();
        TerminateProcess(process.get(), 1);
        RefuseToStart(L"a process in a job", error);
    }
    ResumeThread(thread.get());
    return process;
}

/// What can be read without waiting, a good piece of it at a time.
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

/// What a process has said on its pipe.
struct Story
{
    explicit Story(const std::string& text)
    {
        std::istringstream lines(text);
        for (std::string line; std::getline(lines, line);)
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
    }

    std::string step = "the start"; ///< what the library was called for last
    std::string note;
    std::optional<ValidationResult> result;
};

std::string HowItEnded(DWORD code)
{
    constexpr DWORD FirstException = 0x80000000;
    constexpr DWORD BehindExceptions = 0xF0000000; // small negative exit codes
    return code >= FirstException && code < BehindExceptions
               ? "crashes the process with exception " + Hexadecimal(code)
               : "ends the process with exit code " + std::to_string(code);
}

/// A crash is no box for people, and no long work of a debugger.
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
        subject.Tell(ValidationSubject::Pass, "");
    }
    catch (const RuleBroken& broken)
    {
        subject.Tell(ValidationSubject::Fail, broken.what());
    }
    catch (const RuleSkipped& skipped)
    {
        subject.Tell(ValidationSubject::Skip, skipped.what());
    }
    catch (const std::exception& error)
    {
        subject.Tell(ValidationSubject::Skip, std::string("it cannot be checked: ") + error.what());
    }
}

} // namespace

ValidationResult ValidationProcess::Check(const ValidationRule& rule) const
{
    using Clock = std::chrono::steady_clock;

    const ValidationScratch scratch;
    Pipe pipe = NewPipe();
    const std::wstring program = ModulePath(nullptr);
    const std::wstring commandLine = L"orvix " + std::wstring(ChildArgument) + L' ' + Wide(rule.name) + L' ' +
                                     (m_isMSSCCI ? MSSCCIKind : PluginKind) + L" \"" + m_library + L"\" \"" +
                                     scratch.Path() + L"\" " +
                                     std::to_wstring(reinterpret_cast<std::uintptr_t>(pipe.write.get()));
    DWORD code = STILL_ACTIVE;
    bool ended = false;
    std::string text;
    {
        const UniqueHandle job = NewJob();
        const UniqueHandle process = Start(program, commandLine, scratch.Path(), job.get());
        const auto deadline = Clock::now() + m_limit;
        do
        {
            ended = WaitForSingleObject(process.get(), PollMilliseconds) == WAIT_OBJECT_0;
            text += ReadAvailable(pipe.read.get());
        } while (!ended && Clock::now() < deadline);
        GetExitCodeProcess(process.get(), &code);
        TerminateJobObject(job.get(), code);
        WaitForSingleObject(process.get(), INFINITE); // its files can be deleted
    }
    const Story story(text);
    if (story.result)
    {
        return *story.result;
    }
    return {Verdict::Fail, ended ? story.step + ' ' + HowItEnded(code)
                                 : story.step + " hangs: ended after " + std::to_string(m_limit.count()) + " s"};
}

std::optional<int> ValidationProcess::RunAsChild(int count, wchar_t** arguments)
{
    if (count != ChildArguments || std::wstring_view(arguments[1]) != ChildArgument)
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
    RememberLibraryModule(GetModuleHandleW(L"OrvixCore.dll"));                  // its manifest holds for what is loaded
    const HANDLE pipe = ULongToHandle(std::wcstoul(arguments[6], nullptr, 10)); // handles have 32 bits
    SetHandleInformation(pipe, HANDLE_FLAG_INHERIT, 0);
    ValidationSubject subject(arguments[4], isMSSCCI, arguments[5], pipe);
    CheckInThisProcess(*rule, subject);
    // Without the end code of a library that has stayed loaded: hosts free every library before they end.
    TerminateProcess(GetCurrentProcess(), 0);
    return 0;
}
