#pragma once

#include "BraeHeapOperators.h"
#include "OrvixExport.h"

class OrvixUserEntry;

/// A list of users that owns its entries.
///
/// Created and owned by the host or the user-interface library. All operations: [library, main-thread].
class ORVIX_API OrvixUserList : public BraeHeapOperators
{
public:
    OrvixUserList();
    OrvixUserList(const OrvixUserList&) = delete;
    OrvixUserList& operator=(const OrvixUserList&) = delete;

    /// Deletes every entry.
    virtual ~OrvixUserList();

    /// Two ways to append an entry that the list then owns: a copy of `source`'s four texts, or a user name
    /// alone with the other texts empty. Returns the entry, valid until it is removed; null with the list
    /// unchanged when the name is null or memory is exhausted.
    ORVIX_OVERLOADS_IN_SLOT_ORDER(virtual OrvixUserEntry* CreateEntry(OrvixUserEntry& source),
                                  virtual OrvixUserEntry* CreateEntry(const wchar_t* userName));

    /// Deletes the entry at an index, or the entry itself; false when the list does not hold it.
    ORVIX_OVERLOADS_IN_SLOT_ORDER(virtual bool RemoveEntry(unsigned int index),
                                  virtual bool RemoveEntry(OrvixUserEntry* entry));

    /// Number of entries.
    virtual unsigned int NumEntries();

    /// Deletes every entry; always true.
    virtual bool RemoveAll();

    /// The entry at `index`, owned by the list; null when `index` is not below `NumEntries()`.
    virtual OrvixUserEntry* GetUserEntry(unsigned int index);

private:
    // What the library alone knows; null until something is stored.
    struct State;
    State* m_state = nullptr;
};

static_assert(sizeof(OrvixUserList) == 16, "host and library must agree about the size of a record");
