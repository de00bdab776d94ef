#include "PseudoConsole.h"

#include "UniqueHandle.h"

#include <regex>
#include <stdexcept>
#include <vector>

namespace
{

constexpr DWORD Milliseconds = 60'000;
constexpr DWORD PipeSize = 1 << 20; // the console is read when the program has ended

struct PseudoConsolePolicy
{
    using Handle = HPCON;
    static Handle None() noexcept { return nullptr; }
    static void Close(Handle handle) noexcept { ClosePseudoConsole(handle); }
};
using UniquePseudoConsole = UniqueHandle<PseudoConsolePolicy>;

struct Pipe
{
    Pipe()
    {
        if (!CreatePipe(reader.Out(), writer.Out(), nullptr, PipeSize))
        {
            throw std::runtime_error("no pipe");
        }
    }

    UniqueFile reader;
    UniqueFile writer;
};

/// A process that is started with a console for its own.
DWORD RunIn(HPCON console, std::wstring& commandLine)
{
    SIZE_T size = 0;
    InitializeProcThreadAttributeList(nullptr, 1, 0, &size);
    std::vector<std::byte> memory(size);
    STARTUPINFOEXW startup{};
    startup.StartupInfo.cb = sizeof startup;
    startup.lpAttributeList = reinterpret_cast<LPPROC_THREAD_ATTRIBUTE_LIST>(memory.data());
    PROCESS_INFORMATION information{};
    if (!InitializeProcThreadAttributeList(startup.lpAttributeList, 1, 0, &size) ||
        !UpdateProcThreadAttribute(startup.lpAttributeList, 0, PROC_THREAD_ATTRIBUTE_PSEUDOCONSOLE, console,
                                   sizeof console, nullptr, nullptr) ||
        !CreateProcessW(nullptr, commandLine.data(), nullptr, nullptr, FALSE, EXTENDED_STARTUPINFO_PRESENT, nullptr,
                        nullptr, &startup.StartupInfo, &information))
    {
        throw std::runtime_error("the program does not start in a console");
    }
    DeleteProcThreadAttributeList(startup.lpAttributeList);
    const UniqueKernelHandle process(information.hProcess);
    const UniqueKernelHandle thread(information.hThread);
    DWORD code = 0;
    if (WaitForSingleObject(process.Get(), Milliseconds) != WAIT_OBJECT_0)
    {
        TerminateProcess(process.Get(), 1);
        throw std::runtime_error("the program does not end in a console");
    }
    GetExitCodeProcess(process.Get(), &code);
    return code;
}

std::string ReadAll(HANDLE pipe)
{
    std::string bytes;
    char buffer[4096];
    DWORD size = 0;
    while (ReadFile(pipe, buffer, sizeof buffer, &size, nullptr) && size > 0)
    {
        bytes.append(buffer, size);
    }
    return bytes;
}

std::string WithoutSequences(const std::string& output)
{
    // A blank may come as an erased line and a step to the right.
    std::string text = std::regex_replace(output, std::regex("(\x1b\\[K)?\x1b\\[1C"), " ");
    text = std::regex_replace(text, std::regex("\x1b\\[[?0-9;]*[A-Za-z]"), "");
    return std::regex_replace(text, std::regex("\r"), "");
}

} // namespace

PseudoConsole::Result PseudoConsole::Run(std::wstring commandLine)
{
    Result result{};
    Pipe input;
    Pipe output;
    {
        UniquePseudoConsole console;
        if (FAILED(CreatePseudoConsole({Columns, 100}, input.reader.Get(), output.writer.Get(), 0, console.Out())))
        {
            throw std::runtime_error("no pseudo console");
        }
        output.writer.Reset(); // the console has a handle of its own
        result.code = RunIn(console.Get(), commandLine);
    }
    result.output = ReadAll(output.reader.Get());
    result.text = WithoutSequences(result.output);
    return result;
}
