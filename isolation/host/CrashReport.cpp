#include "CrashReport.h"

#include <algorithm>

namespace
{

Wire::CrashRecord* crashRecord = nullptr;

/// Notes where the exception happened. The stack may be almost used up, and the heap may be damaged.
void Note(const EXCEPTION_RECORD& exception)
{
    static wchar_t path[MAX_PATH];
    HMODULE module = nullptr;
    const auto* const address = static_cast<LPCWSTR>(exception.ExceptionAddress);
    if (GetModuleHandleExW(GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS | GET_MODULE_HANDLE_EX_FLAG_UNCHANGED_REFCOUNT,
                           address, &module))
    {
        const DWORD size = GetModuleFileNameW(module, path, MAX_PATH);
        const wchar_t* const end = path + size;
        const wchar_t* name = end;
        while (name != path && name[-1] != L'\\')
        {
            --name;
        }
        const auto length = std::min(static_cast<std::size_t>(end - name), crashRecord->module.size());
        std::copy_n(name, length, crashRecord->module.begin());
    }
    crashRecord->offset = reinterpret_cast<std::uintptr_t>(address) - reinterpret_cast<std::uintptr_t>(module);
    crashRecord->code = exception.ExceptionCode;
}

LONG WINAPI EndProcess(EXCEPTION_POINTERS* exception)
{
    Note(*exception->ExceptionRecord);
    TerminateProcess(GetCurrentProcess(), exception->ExceptionRecord->ExceptionCode);
    return EXCEPTION_EXECUTE_HANDLER;
}

} // namespace

void ReportCrashTo(Wire::CrashRecord& record)
{
    ULONG reserve = 64 * 1024; // bytes of stack for the handler after a stack overflow
    SetThreadStackGuarantee(&reserve);
    SetErrorMode(SEM_FAILCRITICALERRORS | SEM_NOGPFAULTERRORBOX | SEM_NOOPENFILEERRORBOX);
    crashRecord = &record;
    SetUnhandledExceptionFilter(EndProcess);
}
