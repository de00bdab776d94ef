#pragma once

#include "BraeHeapOperators.h"
#include "OrvixExport.h"

class OrvixFileEntry;

/// The files of an operation: the entries that this list created and owns, the roots among them, and the
/// active list, the subset on which the next operation works.
///
/// Created and owned by the host. Indexes run from 0; a getter given an index out of range returns null.
/// Entries are valid until they are removed or the list is destroyed. All operations: [library, main-thread].
class ORVIX_API OrvixFileList : public BraeHeapOperators
{
public:
    OrvixFileList();
    OrvixFileList(const OrvixFileList&) = delete;
    OrvixFileList& operator=(const OrvixFileList&) = delete;

    /// Deletes every entry that the list created.
    virtual ~OrvixFileList();

    /// Two ways to append an entry that the list then owns.
    ///
    /// From `source`: copies path, flags, client value and parent link; shares the very same child objects
    /// (their parent links still name the source); copies the attachments one level deep. The copy is added
    /// to the children of the source's parent, or to the roots when there is none.
    ///
    /// From a path and values: the entry is added to the children of `parent`, which need not belong to this
    /// list, or to the roots when `parent` is null.
    ///
    /// Returns the entry; null with the list unchanged when the path is null or memory is exhausted (a
    /// parent whose `AddChild` gives 0 counts as exhausted).
    ORVIX_OVERLOADS_IN_SLOT_ORDER(virtual OrvixFileEntry* CreateEntry(OrvixFileEntry& source),
                                  virtual OrvixFileEntry* CreateEntry(const wchar_t* file, OrvixFileEntry* parent,
                                                                      unsigned long flagsIn, long long clientPtr));

    /// Removes the entry at an index, or the entry itself, from the list, the roots, the active list and the
    /// children of the entries that can be reached from the roots, and deletes it with its attachments. Its
    /// own children stay in the list as they are: no roots, and with a parent link to what was deleted; the
    /// host removes or links them itself. False when the list does not hold the entry. When memory is
    /// exhausted while a tree is searched: false, and the entry stays in the list to be removed later, though
    /// some links to it may be gone already.
    ORVIX_OVERLOADS_IN_SLOT_ORDER(virtual bool RemoveEntry(unsigned int index),
                                  virtual bool RemoveEntry(OrvixFileEntry* entry));
    virtual unsigned int NumEntries();

    /// Deletes every entry and empties roots and active list; always true.
    virtual bool RemoveAll();
    virtual OrvixFileEntry* GetFileEntry(unsigned int index);

    /// Rebuilds the active list from the entries whose FlagsIn shares a bit with `mask`: in order of creation,
    /// or with `fromRoots` the trees below the roots, children before their parents. Returns
    /// `NumActiveEntries()`. When memory is exhausted the active list is empty.
    virtual unsigned int BuildActiveList(unsigned long mask, bool fromRoots);

    /// Appends an entry, which need not belong to this list, to the active list; null is ignored. Returns
    /// `NumActiveEntries()` in every case.
    virtual unsigned int AddActiveEntry(OrvixFileEntry* entry);

    /// Removes the first occurrence of the entry from the active list; false when it is not there.
    virtual bool RemoveActiveEntry(OrvixFileEntry* entry);
    virtual unsigned int NumActiveEntries();
    virtual OrvixFileEntry* GetActiveFileEntry(unsigned int index);

    /// The entries created without a parent, in order of creation.
    virtual unsigned int NumRootEntries();
    virtual OrvixFileEntry* GetRootEntry(unsigned int index);

private:
    // What the library alone knows; null until something is stored.
    struct State;
    State* m_state = nullptr;
};

static_assert(sizeof(OrvixFileList) == 16, "host and library must agree about the size of a record");
