#pragma once

#include <windows.h>

#include <string>

/// A variable that processes inherit, for as long as this object lives.
class Environment
{
public:
    Environment(const wchar_t* variable, const std::wstring& text) : m_variable(variable)
    {
        SetEnvironmentVariableW(m_variable, text.c_str());
    }
    Environment(const Environment&) = delete;
    Environment& operator=(const Environment&) = delete;
    ~Environment() { SetEnvironmentVariableW(m_variable, nullptr); }

private:
    const wchar_t* m_variable;
};
