#include "OrvixTool.h"

#include "Files.h"
#include "UniqueHandle.h"

#include <windows.h>

#include <algorithm>
#include <stdexcept>

namespace
{

constexpr DWORD Milliseconds = 110'000;

UniqueFile NewFile(const std::filesystem::path& path)
{
    SECURITY_ATTRIBUTES inheritable{sizeof inheritable, nullptr, TRUE};
    UniqueFile file(CreateFileW(path.c_str(), GENERIC_WRITE, FILE_SHARE_READ | FILE_SHARE_WRITE, &inheritable,
                                CREATE_ALWAYS, FILE_ATTRIBUTE_NORMAL, nullptr));
    if (!file)
    {
        throw std::runtime_error("no file for the output");
    }
    return file;
}

/// An argument as the C run-time reads it from a command line.
std::wstring Quoted(const std::wstring& argument)
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

std::string Lines(const std::filesystem::path& path)
{
    std::string text = ReadBytes(path);
    text.erase(std::remove(text.begin(), text.end(), '\r'), text.end());
    return text;
}

} // namespace

OrvixTool::Result OrvixTool::Run(const std::filesystem::path& program, const std::filesystem::path& scratch,
                                 const std::filesystem::path& folder, const std::vector<std::wstring>& arguments)
{
    const std::filesystem::path outputFile = scratch / L"output.txt";
    const std::filesystem::path errorFile = scratch / L"errors.txt";
    std::wstring commandLine = Quoted(program.wstring());
    for (const std::wstring& argument : arguments)
    {
        commandLine += L' ' + Quoted(argument);
    }

    Result result{TimedOut, {}, {}};
    {
        const UniqueFile output = NewFile(outputFile);
        const UniqueFile errors = NewFile(errorFile);
        STARTUPINFOW startup{};
        startup.cb = sizeof startup;
        startup.dwFlags = STARTF_USESTDHANDLES;
        startup.hStdOutput = output.Get();
        startup.hStdError = errors.Get();
        PROCESS_INFORMATION information{};
        if (!CreateProcessW(nullptr, commandLine.data(), nullptr, nullptr, TRUE, CREATE_NO_WINDOW, nullptr,
                            folder.c_str(), &startup, &information))
        {
            throw std::runtime_error("the program does not start");
        }
        const UniqueKernelHandle process(information.hProcess);
        const UniqueKernelHandle thread(information.hThread);
        if (WaitForSingleObject(process.Get(), Milliseconds) != WAIT_OBJECT_0)
        {
            TerminateProcess(process.Get(), TimedOut);
            WaitForSingleObject(process.Get(), INFINITE);
        }
        GetExitCodeProcess(process.Get(), &result.code);
    }
    result.output = Lines(outputFile);
    result.errors = Lines(errorFile);
    return result;
}
