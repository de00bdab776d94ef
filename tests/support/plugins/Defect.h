#pragma once

#include "ModulePath.h"
#include "UniqueHandle.h"

#include <windows.h>

#include <cwchar>
#include <filesystem>
#include <fstream>
#include <string>

/// The defects of the defective plug-in and MSSCCI library. An environment variable lists them, which the processes
/// inherit that load them; without it there is none.
class Defect
{
public:
    static constexpr const wchar_t* Variable = L"ORVIX_DEFECT";

    static bool Is(const std::wstring& name)
    {
        std::wstring text(1024, L'\0');
        text.resize(GetEnvironmentVariableW(Variable, text.data(), static_cast<DWORD>(text.size())));
        return (L' ' + text + L' ').find(L' ' + name + L' ') != std::wstring::npos;
    }

    /// Ends the process as a write through null does, but without being caught by a sanitizer first.
    static void Crash() { RaiseException(EXCEPTION_ACCESS_VIOLATION, EXCEPTION_NONCONTINUABLE, 0, nullptr); }
    static void Hang() { Sleep(INFINITE); }

    /// Starts this program again with the same arguments and the defect to hang. Writes its process ID to the file that
    /// ORVIX_DEFECT_FILE names.
    static void StartDescendant()
    {
        SetEnvironmentVariableW(Variable, L"hang");
        std::wstring commandLine = GetCommandLineW();
        STARTUPINFOW startup{};
        startup.cb = sizeof startup;
        PROCESS_INFORMATION started{};
        if (CreateProcessW(ModulePath(nullptr).c_str(), commandLine.data(), nullptr, nullptr, FALSE, 0, nullptr,
                           nullptr, &startup, &started) == FALSE)
        {
            return;
        }
        const UniqueKernelHandle thread(started.hThread);
        const UniqueKernelHandle process(started.hProcess);
        std::ofstream(File()) << started.dwProcessId;
    }

    /// Appends an operation and its options to that file when "report-options" is set.
    static void Report(const char* operation, unsigned long options)
    {
        if (Is(L"report-options"))
        {
            std::ofstream(File(), std::ios::app) << operation << ' ' << options << '\n';
        }
    }

    /// Renames the file of this program, so that it cannot be started again.
    static void MoveProgram()
    {
        const std::wstring program = ModulePath(nullptr);
        MoveFileW(program.c_str(), (program + L".moved").c_str());
    }

    /// Counts in a variable of the process, which outlives the library.
    static int Count(const wchar_t* variable)
    {
        wchar_t text[16] = L"";
        GetEnvironmentVariableW(variable, text, 16);
        const int count = static_cast<int>(wcstol(text, nullptr, 10)) + 1;
        SetEnvironmentVariableW(variable, std::to_wstring(count).c_str());
        return count;
    }

private:
    static std::filesystem::path File()
    {
        wchar_t file[MAX_PATH] = L"";
        GetEnvironmentVariableW(L"ORVIX_DEFECT_FILE", file, MAX_PATH);
        return file;
    }
};
