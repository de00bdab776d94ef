// Runs a command line whose output is the console of this process, which is readable as that of a shell. Returns the
// exit code of the command.

#include "UniqueHandle.h"

#include <string>

int wmain(int count, wchar_t** arguments)
{
    SECURITY_ATTRIBUTES inheritable{sizeof inheritable, nullptr, TRUE};
    const UniqueFile console(CreateFileW(L"CONOUT$", GENERIC_READ | GENERIC_WRITE, FILE_SHARE_READ | FILE_SHARE_WRITE,
                                         &inheritable, OPEN_EXISTING, 0, nullptr));
    STARTUPINFOW startup{};
    startup.cb = sizeof startup;
    startup.dwFlags = STARTF_USESTDHANDLES;
    startup.hStdOutput = console.Get();
    startup.hStdError = console.Get();
    PROCESS_INFORMATION information{};
    std::wstring commandLine = count == 2 ? arguments[1] : L"";
    DWORD code = 0xDEAD;
    if (CreateProcessW(nullptr, commandLine.data(), nullptr, nullptr, TRUE, 0, nullptr, nullptr, &startup,
                       &information))
    {
        const UniqueKernelHandle process(information.hProcess);
        const UniqueKernelHandle thread(information.hThread);
        WaitForSingleObject(process.Get(), INFINITE);
        GetExitCodeProcess(process.Get(), &code);
    }
    return static_cast<int>(code);
}
