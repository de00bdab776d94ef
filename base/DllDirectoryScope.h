#pragma once

#include <windows.h>

#include <algorithm>
#include <string>

/// The folder that the process searches for libraries, for a scope; an empty one leaves it as it is.
class DllDirectoryScope
{
public:
    explicit DllDirectoryScope(const std::wstring& folder)
    {
        if (const DWORD size = GetDllDirectoryW(0, nullptr))
        {
            m_saved.resize(size);
            m_saved.resize(std::min(GetDllDirectoryW(size, m_saved.data()), size));
        }
        if (!folder.empty())
        {
            SetDllDirectoryW(folder.c_str());
        }
    }
    DllDirectoryScope(const DllDirectoryScope&) = delete;
    DllDirectoryScope& operator=(const DllDirectoryScope&) = delete;
    ~DllDirectoryScope()
    {
        // An empty text would take the current folder out of the search.
        SetDllDirectoryW(m_saved.empty() ? nullptr : m_saved.c_str());
    }

private:
    std::wstring m_saved;
};
