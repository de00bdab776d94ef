#pragma once

#include "UniqueHandle.h"

#include <string>

class OrvixClientInfo;

/// The files that may be plug-ins, in the client's plug-in folder and in the order in which the system finds them.
class PluginSearch
{
public:
    static constexpr std::size_t MaxPath = 259; // characters of a 260-character buffer before its terminator

    enum class State
    {
        Found,    ///< there is a file to look at
        NoFolder, ///< the client names none
        FolderTooLong,
        End
    };

    /// Searches for the first file. The client must outlive this object. Throws std::bad_alloc.
    explicit PluginSearch(OrvixClientInfo& client);

    State GetState() const { return m_state; }

    /// Steps to the next file.
    void Next();

    /// Path of the file found. Throws std::bad_alloc.
    std::wstring Path() const { return PathOf(m_found.cFileName); }

private:
    std::wstring PathOf(const wchar_t* name) const;

    OrvixClientInfo& m_client;
    WIN32_FIND_DATAW m_found = {};
    UniqueFind m_find;
    State m_state = State::NoFolder;
};
