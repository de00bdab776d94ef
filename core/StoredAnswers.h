#pragma once

#include "OrvixPromptTable.h"

#include <cstdint>
#include <string>

/// The stored answers of a session, by prompt ID, in the table that the host's dialogs edit.
///
/// IDs may repeat. Reading takes the first row with an ID, writing the last: with repeated IDs the two differ, as the
/// interface promises.
class StoredAnswers
{
public:
    OrvixPromptTable& Table() { return m_table; }

    /// Fills the table from a file; false, with an empty table, when the file is missing or cannot be read.
    bool Load(const wchar_t* path);

    /// Writes the table to the file. One that was not read before is kept beside it, once.
    bool Save(const wchar_t* path);

    /// The action of the first row (bits of `OrvixPromptAction`); 0 when there is none.
    std::uint32_t GetAction(std::uint32_t promptID);

    /// Whether the first row is locked; false when there is none.
    bool IsLocked(std::uint32_t promptID);

    /// Stores an action in the last row; false when there is none or it is locked.
    bool SetAction(std::uint32_t promptID, std::uint32_t action);

    /// Adds an unlocked row, or gives the last row the text and, with `overwriteSettings`, the options and the action.
    void Register(std::uint32_t promptID, const wchar_t* text, std::uint32_t action, std::uint32_t actionOpts,
                  bool overwriteSettings);

private:
    OrvixPromptTable m_table;
    std::wstring m_knownFile; ///< the file that was read, found missing or written last
};
