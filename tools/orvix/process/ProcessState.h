#pragma once

#include <windows.h>

#include <string>
#include <vector>

/// What belongs to the whole process or to this thread, and a library must leave as it was: current folder, COM
/// apartment, locale, code page of the console, floating-point control word, error mode, DLL directory and standard
/// handles.
class ProcessState
{
public:
    /// Stores the state as it is now.
    ProcessState();

    /// Names what has changed since, such as "the current folder".
    std::vector<std::string> FindChanges() const;

    /// Restores what has changed. The COM apartment becomes a single-threaded one again, provided that it was one.
    void Restore() const;

private:
    static std::wstring CurrentFolder();
    static std::wstring DllDirectory();
    static int ComApartment();

    std::wstring m_folder;
    std::wstring m_dllDirectory;
    int m_apartment;
    std::string m_locale;
    LCID m_threadLocale;
    UINT m_codePage;
    unsigned int m_floatingPoint; // control word
    UINT m_errorMode;
    HANDLE m_handles[3] = {};
};

/// Restores the state of the process at the end of a scope in which code of others runs.
class ProcessStateScope
{
public:
    ProcessStateScope() = default;
    ProcessStateScope(const ProcessStateScope&) = delete;
    ProcessStateScope& operator=(const ProcessStateScope&) = delete;
    ~ProcessStateScope() { m_state.Restore(); }

private:
    ProcessState m_state;
};
