#pragma once

#include "OrvixExport.h"

/// The stored answers to prompts: per prompt its ID, its text, the options that go with the answer, the
/// answer (an action bit set) and whether the answer is locked.
///
/// Rows are addressed by index from 0 in the order added. IDs need not be unique. The services object owns
/// the table of a session and hands it to the user-interface library for editing; a host may also make
/// tables of its own. All operations: [library, main-thread].
class ORVIX_API OrvixPromptTable
{
public:
    /// Makes an empty table; allocates nothing.
    OrvixPromptTable();
    OrvixPromptTable(const OrvixPromptTable&) = delete;
    OrvixPromptTable& operator=(const OrvixPromptTable&) = delete;
    /// Frees the rows with their texts.
    virtual ~OrvixPromptTable();

    /// Appends a row with a copy of `text`; returns the new number of rows, or -1 with nothing changed when
    /// `text` is null or memory runs out.
    virtual int AddPrompt(int id, const wchar_t* text, unsigned long options, unsigned long prompt, bool locked);

    /// Number of rows.
    virtual int NumPrompts();

    /// Removes every row.
    virtual void RemoveAll();

    /// ID of a row; -1 for an index not below `NumPrompts()`.
    virtual int GetPromptID(unsigned int index);
    /// Sets the ID of a row; false, with nothing changed, for an index not below `NumPrompts()`, as in every setter.
    virtual bool SetPromptID(unsigned int index, int id);

    /// Text of a row, valid until it is set or removed; null for an index out of range.
    virtual const wchar_t* GetPromptText(unsigned int index);
    /// Replaces the text by a copy. A null `text`, and exhausted memory, give false and change nothing.
    virtual bool SetPromptText(unsigned int index, const wchar_t* text);

    /// Options stored with the answer; 0 for an index out of range.
    virtual unsigned long GetPromptOptions(unsigned int index);
    /// Sets the options of a row, bits of `OrvixPromptOption`; false for an index out of range.
    virtual bool SetPromptOptions(unsigned int index, unsigned long options);

    /// Stored answer, an action bit set; 0 for an index out of range.
    virtual unsigned long GetPrompt(unsigned int index);
    /// Sets the stored answer of a row, bits of `OrvixPromptAction`; false for an index out of range.
    virtual bool SetPrompt(unsigned int index, unsigned long prompt);

    /// Whether the answer is locked against `IOrvixServices::SetPromptAction`; false out of range.
    virtual bool GetLocked(unsigned int index);
    /// Locks or unlocks the answer of a row; false for an index out of range.
    virtual bool SetLocked(unsigned int index, bool locked);

private:
    friend struct PromptRows; // the library's search by ID

    // What the library alone knows; null until something is stored.
    struct State;
    State* m_state = nullptr;
};

static_assert(sizeof(OrvixPromptTable) == 16, "host and library must agree about the size of a record");
