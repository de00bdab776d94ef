#include "PluginSearch.h"

#include "OrvixClientInfo.h"

#include <string_view>

PluginSearch::PluginSearch(OrvixClientInfo& client) : m_client(client)
{
    const std::wstring pattern = PathOf(L"*.dll");
    if (pattern.empty())
    {
        return;
    }
    m_state = State::FolderTooLong;
    if (pattern.size() > MaxPath)
    {
        return;
    }
    m_state = State::End;
    m_find.Reset(FindFirstFileW(pattern.c_str(), &m_found));
    if (!m_find)
    {
        return;
    }
    m_state = State::Found;
    const std::wstring_view name = m_found.cFileName;
    if (name == L"." || name == L"..")
    {
        Next();
    }
}

void PluginSearch::Next()
{
    std::wstring_view name;
    do
    {
        m_state = FindNextFileW(m_find.Get(), &m_found) ? State::Found : State::End;
        name = m_found.cFileName;
    } while (m_state == State::Found && (name == L"." || name == L".."));
}

/// No separator is put between the folder and what follows: the folder ends in one. Empty when the client names no
/// folder: the name alone would be looked for in the current folder.
std::wstring PluginSearch::PathOf(const wchar_t* name) const
{
    const wchar_t* folder = m_client.GetProviderPluginPath();
    return folder != nullptr && *folder != L'\0' ? std::wstring(folder) + name : std::wstring();
}
