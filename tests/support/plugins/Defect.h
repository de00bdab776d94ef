#pragma once

#include <windows.h>

#include <cwchar>
#include <filesystem>
#include <fstream>
#include <string>

/// What is wrong with the defective plug-in and MSSCCI library. It stands in an environment variable, which the
/// processes inherit that load them; without it nothing is wrong.
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

    // Ways in which a library takes its process along.

    /// As a write through null does, also where a sanitizer would be the first to see that.
    static void Crash() { RaiseException(EXCEPTION_ACCESS_VIOLATION, EXCEPTION_NONCONTINUABLE, 0, nullptr); }
    static void Hang() { Sleep(INFINITE); }

    /// Starts this program once more with its own arguments, so that it hangs, and writes its number to the file that
    /// ORVIX_DEFECT_FILE names.
    static void StartDescendant()
    {
        SetEnvironmentVariableW(Variable, L"hang");
        std::wstring program(MAX_PATH, L'\0');
        GetModuleFileNameW(nullptr, program.data(), MAX_PATH);
        std::wstring commandLine = GetCommandLineW();
        STARTUPINFOW startup{};
        startup.cb = sizeof startup;
        PROCESS_INFORMATION started{};
        if (!CreateProcessW(program.c_str(), commandLine.data(), nullptr, nullptr, FALSE, 0, nullptr, nullptr, &startup,
                            &started))
        {
            return;
        }
        std::ofstream(File()) << started.dwProcessId;
    }

    /// Writes an operation and its options to that file, where "report-options" asks for it.
    static void Report(const char* operation, unsigned long options)
    {
        if (Is(L"report-options"))
        {
            std::ofstream(File(), std::ios::app) << operation << ' ' << options << '\n';
        }
    }

    /// Renames this program's file, so that it cannot be started once more.
    static void MoveProgram()
    {
        std::wstring program(MAX_PATH, L'\0');
        program.resize(GetModuleFileNameW(nullptr, program.data(), MAX_PATH));
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
