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
    /// Makes an empty list; allocates nothing.
    OrvixUserList();
    OrvixUserList(const OrvixUserList&) = delete;
    OrvixUserList& operator=(const OrvixUserList&) = delete;

    /// Deletes every entry.
    virtual ~OrvixUserList();

    ORVIX_OVERLOADS_IN_SLOT_ORDER(
        /// Appends a copy of a user's four texts; the list owns it. Returns the copy, valid until it is removed;
        /// null with the list unchanged when memory runs out.
        virtual OrvixUserEntry* CreateEntry(OrvixUserEntry& source),
        /// Appends a user with this login name and no other text; the list owns it. Returns the entry, valid until
        /// it is removed; null with the list unchanged when `userName` is null or memory runs out.
        virtual OrvixUserEntry* CreateEntry(const wchar_t* userName));

    ORVIX_OVERLOADS_IN_SLOT_ORDER(
        /// Deletes the entry at `index`; false when `index` is not below `NumEntries()`.
        virtual bool RemoveEntry(unsigned int index),
        /// Deletes the entry; false when the list does not hold it.
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
