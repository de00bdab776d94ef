// git.exe under Wine: hands arguments, input, output, errors and exit code of each call to the machine's own Git and
// does nothing else. Wine starts a Unix program in the right folder, but passes on neither standard handles nor an exit
// code. They go through files, for which a shell script is the other half.

#include "Files.h"
#include "UniqueHandle.h"

#include <windows.h>

#include <cstdlib>
#include <filesystem>
#include <string>

namespace
{

constexpr DWORD Pause = 4; // milliseconds

struct HeapPolicy
{
    using Handle = void*;
    static Handle None() noexcept { return nullptr; }
    static void Close(Handle memory) noexcept { HeapFree(GetProcessHeap(), 0, memory); }
};

/// The path as Unix has it.
std::wstring UnixPath(const std::wstring& path)
{
    using Function = char*(__cdecl*)(const wchar_t*);
    const auto function = reinterpret_cast<Function>(
        reinterpret_cast<void*>(GetProcAddress(GetModuleHandleW(L"kernel32.dll"), "wine_get_unix_file_name")));
    const UniqueHandle<HeapPolicy> name(function(path.c_str()));
    const auto* text = static_cast<const char*>(name.Get());
    wchar_t wide[32768];
    MultiByteToWideChar(CP_UTF8, 0, text, -1, wide, static_cast<int>(std::size(wide)));
    return wide;
}

std::string Utf8(const std::wstring& text)
{
    char bytes[131072];
    const int size = WideCharToMultiByte(CP_UTF8, 0, text.c_str(), static_cast<int>(text.size()), bytes, sizeof bytes,
                                         nullptr, nullptr);
    return {bytes, static_cast<std::size_t>(size)};
}

/// Copies what there is to read; a pipe is read to its end.
void Copy(HANDLE from, HANDLE to)
{
    static char buffer[65536];
    DWORD count = 0;
    while (ReadFile(from, buffer, sizeof buffer, &count, nullptr) && count != 0)
    {
        DWORD written = 0;
        WriteFile(to, buffer, count, &written, nullptr);
    }
}

UniqueFile Open(const std::filesystem::path& file, DWORD access, DWORD disposition)
{
    return UniqueFile(CreateFileW(file.c_str(), access, FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE, nullptr,
                                  disposition, FILE_ATTRIBUTE_NORMAL, nullptr));
}

HANDLE alive = INVALID_HANDLE_VALUE;

BOOL WINAPI OnControl(DWORD)
{
    DWORD written = 0;
    WriteFile(alive, "\n", 1, &written, nullptr);
    return TRUE; // Git decides about its end
}

} // namespace

int wmain(int count, wchar_t** arguments)
{
    const std::filesystem::path call =
        std::filesystem::temp_directory_path() /
        (L"git-call-" + std::to_wstring(GetCurrentProcessId()) + L"-" + std::to_wstring(GetTickCount64()));
    std::filesystem::create_directory(call);
    std::string list;
    for (int i = 1; i < count; ++i)
    {
        list += Utf8(arguments[i]) + '\0';
    }
    WriteBytes(call / L"arguments", list);
    Copy(GetStdHandle(STD_INPUT_HANDLE), Open(call / L"input", GENERIC_WRITE, CREATE_ALWAYS).Get());
    const UniqueFile output = Open(call / L"output", GENERIC_READ | GENERIC_WRITE, CREATE_ALWAYS);
    const UniqueFile errors = Open(call / L"errors", GENERIC_READ | GENERIC_WRITE, CREATE_ALWAYS);

    SetEnvironmentVariableW(L"ORVIX_GIT_CALL", UnixPath(call.wstring()).c_str());
    STARTUPINFOW startup{};
    startup.cb = sizeof startup;
    PROCESS_INFORMATION information{};
    std::wstring line = L"git_bridge.sh";
    if (!CreateProcessW(ORVIX_GIT_BRIDGE_SCRIPT, line.data(), nullptr, nullptr, FALSE, 0, nullptr, nullptr, &startup,
                        &information))
    {
        return EXIT_FAILURE;
    }
    const UniqueKernelHandle process(information.hProcess);
    const UniqueKernelHandle thread(information.hThread);
    SetConsoleCtrlHandler(&OnControl, TRUE);

    std::string code;
    while (!code.ends_with('\n')) // a part of it may be written
    {
        if (alive == INVALID_HANDLE_VALUE)
        {
            alive = Open(call / L"alive", GENERIC_WRITE, OPEN_EXISTING).Release(); // until the process ends
        }
        code = ReadBytes(call / L"code");
        Copy(output.Get(), GetStdHandle(STD_OUTPUT_HANDLE));
        Copy(errors.Get(), GetStdHandle(STD_ERROR_HANDLE));
        if (code.empty())
        {
            Sleep(Pause);
        }
    }
    DeleteFileW((call / L"code").c_str()); // the Unix half then deletes the rest
    return std::atoi(code.c_str());
}
