// Runs a command line with the console of this process as its output, readable as a shell gives it, and passes the exit
// code on.

#include <windows.h>

#include <string>

int wmain(int count, wchar_t** arguments)
{
    SECURITY_ATTRIBUTES inheritable{sizeof inheritable, nullptr, TRUE};
    const HANDLE console = CreateFileW(L"CONOUT$", GENERIC_READ | GENERIC_WRITE, FILE_SHARE_READ | FILE_SHARE_WRITE,
                                       &inheritable, OPEN_EXISTING, 0, nullptr);
    STARTUPINFOW startup{};
    startup.cb = sizeof startup;
    startup.dwFlags = STARTF_USESTDHANDLES;
    startup.hStdOutput = console;
    startup.hStdError = console;
    PROCESS_INFORMATION information{};
    std::wstring commandLine = count == 2 ? arguments[1] : L"";
    DWORD code = 0xDEAD;
    if (CreateProcessW(nullptr, commandLine.data(), nullptr, nullptr, TRUE, 0, nullptr, nullptr, &startup,
                       &information))
    {
        WaitForSingleObject(information.hProcess, INFINITE);
        GetExitCodeProcess(information.hProcess, &code);
        CloseHandle(information.hThread);
        CloseHandle(information.hProcess);
    }
    CloseHandle(console);
    return static_cast<int>(code);
}
