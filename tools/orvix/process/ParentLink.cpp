#include "ParentLink.h"

#include "Text.h"

#include <array>
#include <cstdio>
#include <cstdlib>

namespace
{

constexpr wchar_t ChildArgument[] = L"--child"; // PIPE

HANDLE parentPipe = nullptr;

void Write(const char* line, std::size_t size)
{
    DWORD written = 0;
    WriteFile(parentPipe, line, static_cast<DWORD>(size), &written, nullptr);
}

/// Sends the module, the offset in it and the exception. Takes no memory, since the heap may be damaged.
void SendCrash(const EXCEPTION_RECORD& exception)
{
    HMODULE module = nullptr;
    std::array<wchar_t, MAX_PATH> path{};
    std::array<char, 3 * MAX_PATH> name{"an unknown module"};
    if (GetModuleHandleExW(GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS | GET_MODULE_HANDLE_EX_FLAG_UNCHANGED_REFCOUNT,
                           static_cast<const wchar_t*>(exception.ExceptionAddress), &module) &&
        GetModuleFileNameW(module, path.data(), static_cast<DWORD>(path.size())) != 0)
    {
        const wchar_t* const slash = std::wcsrchr(path.data(), L'\\');
        WideCharToMultiByte(CP_UTF8, 0, slash != nullptr ? slash + 1 : path.data(), -1, name.data(),
                            static_cast<int>(name.size()), nullptr, nullptr);
    }
    const std::size_t offset =
        reinterpret_cast<std::size_t>(exception.ExceptionAddress) - reinterpret_cast<std::size_t>(module);
    std::array<char, name.size() + 64> line{};
    const int size = std::snprintf(line.data(), line.size(), "crash %s at offset 0x%llX, exception 0x%08lX\n",
                                   name.data(), static_cast<unsigned long long>(offset), exception.ExceptionCode);
    Write(line.data(), static_cast<std::size_t>(size));
}

LONG WINAPI EndAtOnce(EXCEPTION_POINTERS* exception)
{
    SendCrash(*exception->ExceptionRecord);
    TerminateProcess(GetCurrentProcess(), exception->ExceptionRecord->ExceptionCode);
    return EXCEPTION_EXECUTE_HANDLER;
}

} // namespace

std::wstring ParentLink::Arguments(HANDLE pipe)
{
    return std::wstring(ChildArgument) + L' ' + std::to_wstring(reinterpret_cast<std::uintptr_t>(pipe));
}

bool ParentLink::Attach(int& count, wchar_t**& arguments)
{
    if (count < 3 || std::wstring_view(arguments[1]) != ChildArgument)
    {
        return false;
    }
    parentPipe = ULongToHandle(std::wcstoul(arguments[2], nullptr, 10)); // handles have 32 bits
    SetHandleInformation(parentPipe, HANDLE_FLAG_INHERIT, 0);
    count -= 2;
    arguments += 2; // the second one takes the place of the program's name
    SetErrorMode(SEM_FAILCRITICALERRORS | SEM_NOGPFAULTERRORBOX | SEM_NOOPENFILEERRORBOX);
    SetUnhandledExceptionFilter(EndAtOnce);
    return true;
}

void ParentLink::Send(std::string_view word, const std::string& text)
{
    if (parentPipe != nullptr)
    {
        const std::string line = std::string(word) + (text.empty() ? "" : " ") + Printable(Wide(text)) + '\n';
        Write(line.data(), line.size());
    }
}

void ParentLink::SendAliveAt(std::size_t step)
{
    constexpr std::size_t Period = 256;

    if (step % Period == 0)
    {
        Send(Alive);
    }
}
