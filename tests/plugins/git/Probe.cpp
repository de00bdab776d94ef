// A program for the tests of child processes. Its first argument says what it does.

#include <windows.h>

#include <fcntl.h>
#include <io.h>

#include <cstdio>
#include <cstdlib>
#include <string>
#include <vector>

namespace
{

void Print(std::FILE* stream, const std::wstring& text)
{
    const int size = WideCharToMultiByte(CP_UTF8, 0, text.c_str(), -1, nullptr, 0, nullptr, nullptr);
    std::vector<char> bytes(static_cast<std::size_t>(size));
    WideCharToMultiByte(CP_UTF8, 0, text.c_str(), -1, bytes.data(), size, nullptr, nullptr);
    std::fwrite(bytes.data(), 1, bytes.size(), stream); // with the zero
}

/// A megabyte to each output in turns, then everything that comes in.
void Flood()
{
    const std::string block(1024, 'x');
    for (int i = 0; i < 1024; ++i)
    {
        std::fwrite(block.data(), 1, block.size(), stdout);
        std::fwrite(block.data(), 1, block.size(), stderr);
    }
    char buffer[4096];
    for (std::size_t count = 0; (count = std::fread(buffer, 1, sizeof buffer, stdin)) != 0;)
    {
        std::fwrite(buffer, 1, count, stdout);
    }
}

std::wstring ValueOf(const wchar_t* variable)
{
    wchar_t value[256] = L"";
    GetEnvironmentVariableW(variable, value, 256);
    return value;
}

/// Writes the value of a variable to a file.
void Save(const wchar_t* variable, const wchar_t* file)
{
    if (std::FILE* stream = _wfopen(file, L"wb"))
    {
        Print(stream, ValueOf(variable));
        std::fclose(stream);
    }
}

/// Starts this program anew and waits for it.
void Nest(const wchar_t* program)
{
    STARTUPINFOW startup{};
    startup.cb = sizeof startup;
    PROCESS_INFORMATION information{};
    std::wstring line = L"probe sleep";
    CreateProcessW(program, line.data(), nullptr, nullptr, TRUE, 0, nullptr, nullptr, &startup, &information);
    std::printf("%lu\n", information.dwProcessId);
    std::fflush(stdout);
    WaitForSingleObject(information.hProcess, INFINITE);
}

} // namespace

int wmain(int count, wchar_t** arguments)
{
    _setmode(_fileno(stdin), _O_BINARY);
    _setmode(_fileno(stdout), _O_BINARY);
    _setmode(_fileno(stderr), _O_BINARY);
    const std::wstring task = count > 1 ? arguments[1] : L"";
    if (task == L"arguments")
    {
        for (int i = 2; i < count; ++i)
        {
            Print(stdout, arguments[i]);
        }
    }
    else if (task == L"variable")
    {
        Print(stdout, ValueOf(arguments[2]));
    }
    else if (task == L"save")
    {
        Save(arguments[2], arguments[3]);
    }
    else if (task == L"flood")
    {
        Flood();
    }
    else if (task == L"sleep")
    {
        Sleep(60000);
    }
    else if (task == L"nest")
    {
        Nest(arguments[0]);
    }
    else if (task == L"talk")
    {
        for (int i = 0; i < 20; ++i)
        {
            Sleep(250);
            std::printf(".");
            std::fflush(stdout);
        }
    }
    return task == L"fail" ? 7 : 0;
}
