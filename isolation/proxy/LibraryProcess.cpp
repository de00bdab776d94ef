#include "LibraryProcess.h"

#include <array>
#include <cstdio>
#include <vector>

namespace
{

constexpr DWORD EndMilliseconds = 5000;

/// For handles that the new process inherits.
SECURITY_ATTRIBUTES Inheritable()
{
    return {sizeof(SECURITY_ATTRIBUTES), nullptr, TRUE};
}

UniqueKernelHandle MakeEvent()
{
    SECURITY_ATTRIBUTES inheritable = Inheritable();
    return UniqueKernelHandle(CreateEventW(&inheritable, FALSE, FALSE, nullptr));
}

UniqueKernelHandle MakeSection()
{
    SECURITY_ATTRIBUTES inheritable = Inheritable();
    return UniqueKernelHandle(CreateFileMappingW(INVALID_HANDLE_VALUE, &inheritable, PAGE_READWRITE, 0,
                                                 static_cast<DWORD>(Wire::TotalBytes), nullptr));
}

/// A job that ends its process when it is closed. Programs that the library starts for the user live on.
UniqueKernelHandle MakeJob()
{
    UniqueKernelHandle job(CreateJobObjectW(nullptr, nullptr));
    JOBOBJECT_EXTENDED_LIMIT_INFORMATION limits{};
    limits.BasicLimitInformation.LimitFlags = JOB_OBJECT_LIMIT_KILL_ON_JOB_CLOSE | JOB_OBJECT_LIMIT_SILENT_BREAKAWAY_OK;
    if (job && !SetInformationJobObject(job.Get(), JobObjectExtendedLimitInformation, &limits, sizeof limits))
    {
        job.Reset();
    }
    return job;
}

/// The attributes of a new process that inherits these handles and no others.
class InheritOnly
{
public:
    explicit InheritOnly(std::vector<HANDLE> handles) : m_handles(std::move(handles))
    {
        SIZE_T size = 0;
        InitializeProcThreadAttributeList(nullptr, 1, 0, &size);
        m_memory.resize(size);
        m_isReady = InitializeProcThreadAttributeList(List(), 1, 0, &size) != FALSE &&
                    UpdateProcThreadAttribute(List(), 0, PROC_THREAD_ATTRIBUTE_HANDLE_LIST, m_handles.data(),
                                              m_handles.size() * sizeof(HANDLE), nullptr, nullptr) != FALSE;
    }
    InheritOnly(const InheritOnly&) = delete;
    InheritOnly& operator=(const InheritOnly&) = delete;
    ~InheritOnly() { DeleteProcThreadAttributeList(List()); }

    explicit operator bool() const { return m_isReady; }
    LPPROC_THREAD_ATTRIBUTE_LIST List() { return reinterpret_cast<LPPROC_THREAD_ATTRIBUTE_LIST>(m_memory.data()); }

private:
    std::vector<HANDLE> m_handles;
    std::vector<std::byte> m_memory;
    bool m_isReady = false;
};

struct ExceptionName
{
    DWORD code;
    const wchar_t* name;
};

constexpr ExceptionName ExceptionNames[] = {
    {EXCEPTION_ACCESS_VIOLATION, L"access violation"},
    {EXCEPTION_STACK_OVERFLOW, L"stack overflow"},
    {EXCEPTION_INT_DIVIDE_BY_ZERO, L"division by zero"},
    {EXCEPTION_ILLEGAL_INSTRUCTION, L"illegal instruction"},
    {EXCEPTION_PRIV_INSTRUCTION, L"privileged instruction"},
    {EXCEPTION_IN_PAGE_ERROR, L"a page of memory could not be read"},
    {0xC0000374, L"damaged heap"},
    {0xC0000409, L"abort, or a failed security check"},
    {0xE06D7363, L"C++ exception"},
    {0x20474343, L"C++ exception"},
};

std::wstring Hexadecimal(std::uint64_t number)
{
    wchar_t text[24];
    std::swprintf(text, std::size(text), L"0x%llX", static_cast<unsigned long long>(number));
    return text;
}

/// An exception in words; empty for a code that is none.
std::wstring ExceptionText(DWORD code)
{
    for (const ExceptionName& exception : ExceptionNames)
    {
        if (exception.code == code)
        {
            return std::wstring(exception.name) + L" (" + Hexadecimal(code) + L')';
        }
    }
    return code >= 0xC0000000 ? L"exception " + Hexadecimal(code) : std::wstring();
}

} // namespace

LibraryProcess::LibraryProcess(UniqueKernelHandle section)
    : m_section(std::move(section)), m_memory(m_section.Get()), m_requested(MakeEvent()), m_replied(MakeEvent()),
      m_backgroundAsked(MakeEvent()), m_backgroundAnswered(MakeEvent()), m_job(MakeJob())
{
}

std::shared_ptr<LibraryProcess> LibraryProcess::Start(const std::filesystem::path& program)
{
    const std::shared_ptr<LibraryProcess> process(new LibraryProcess(MakeSection()));
    return process->Run(program) ? process : nullptr;
}

bool LibraryProcess::Run(const std::filesystem::path& program)
{
    if (!m_memory || !m_requested || !m_replied || !m_backgroundAsked || !m_backgroundAnswered || !m_job)
    {
        return false;
    }
    const std::vector<HANDLE> handles = {m_section.Get(), Requested(), Replied(), BackgroundAsked(),
                                         BackgroundAnswered()};
    std::wstring commandLine = L'"' + program.wstring() + L'"';
    for (const HANDLE handle : handles)
    {
        commandLine += L' ' + std::to_wstring(reinterpret_cast<std::uintptr_t>(handle));
    }
    InheritOnly inherit(handles);
    STARTUPINFOEXW startup{};
    startup.StartupInfo.cb = sizeof startup;
    startup.lpAttributeList = inherit.List();
    PROCESS_INFORMATION started{};
    if (!inherit || !CreateProcessW(program.c_str(), commandLine.data(), nullptr, nullptr, TRUE,
                                    CREATE_SUSPENDED | EXTENDED_STARTUPINFO_PRESENT, nullptr, nullptr,
                                    &startup.StartupInfo, &started))
    {
        return false;
    }
    m_process.Reset(started.hProcess);
    m_id = started.dwProcessId;
    const UniqueKernelHandle thread(started.hThread);
    for (const HANDLE handle : handles)
    {
        SetHandleInformation(handle, HANDLE_FLAG_INHERIT, 0); // the host may start other programs
    }
    return AssignProcessToJobObject(m_job.Get(), m_process.Get()) != FALSE &&
           ResumeThread(thread.Get()) != static_cast<DWORD>(-1);
}

void LibraryProcess::End()
{
    if (m_process && WaitForSingleObject(m_process.Get(), 0) == WAIT_TIMEOUT)
    {
        TerminateProcess(m_process.Get(), 1);
        WaitForSingleObject(m_process.Get(), EndMilliseconds);
    }
}

std::wstring LibraryProcess::WhyEnded(const std::wstring& function) const
{
    DWORD exitCode = 0;
    WaitForSingleObject(m_process.Get(), EndMilliseconds);
    GetExitCodeProcess(m_process.Get(), &exitCode);
    const Wire::CrashRecord crash = m_memory.GetState().crash;
    const std::wstring exception = ExceptionText(crash.code != 0 ? crash.code : exitCode);
    if (exception.empty())
    {
        return L"ended its process in " + function + L", with exit code " + std::to_wstring(exitCode);
    }
    std::wstring text = L"crashed in " + function + L": " + exception;
    if (crash.code != 0)
    {
        std::wstring module(crash.module.begin(), crash.module.end());
        module.resize(std::wcslen(module.c_str()));
        text += L" in " + (module.empty() ? L"unknown code" : module) + L" at offset " + Hexadecimal(crash.offset);
    }
    return text;
}

bool LibraryProcess::ShowsWindow() const
{
    const auto look = [](HWND window, LPARAM id) -> BOOL {
        DWORD owner = 0;
        GetWindowThreadProcessId(window, &owner);
        const bool isFound = owner == static_cast<DWORD>(id) && IsWindowVisible(window) != FALSE;
        return isFound ? FALSE : TRUE; // FALSE stops the search
    };
    return EnumWindows(look, static_cast<LPARAM>(m_id)) == FALSE;
}
