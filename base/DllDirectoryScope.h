#pragma once

#include <windows.h>

#include <algorithm>
#include <string>

/// Makes a folder the process's DLL directory for a scope. An empty one changes nothing, not even at the end: what a
/// host has set stays, also an empty text, which takes the current folder out of the search and which cannot be read
/// back.
class DllDirectoryScope
{
public:
    explicit DllDirectoryScope(const std::wstring& folder) : m_changed(!folder.empty())
    {
        if (!m_changed)
        {
            return;
        }
        if (const DWORD size = GetDllDirectoryW(0, nullptr))
        {
            m_saved.resize(size);
            m_saved.resize(std::min(GetDllDirectoryW(size, m_saved.data()), size));
        }
        SetDllDirectoryW(folder.c_str());
    }
    DllDirectoryScope(const DllDirectoryScope&) = delete;
    DllDirectoryScope& operator=(const DllDirectoryScope&) = delete;
    ~DllDirectoryScope()
    {
        if (m_changed)
        {
            // An empty text would take the current folder out of the search.
            SetDllDirectoryW(m_saved.empty() ? nullptr : m_saved.c_str());
        }
    }

private:
    bool m_changed;
    std::wstring m_saved;
};
